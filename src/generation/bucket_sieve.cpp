// An entry needs only a for its prime p = 30a + r, the turn of its next multiple, and the kWalk
// index, which holds r's position and the multiplier's.
#include "generation/bucket_sieve.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <exception>
#include <stdexcept>
#include <thread>
#include <utility>

#include "core/wheel.hpp"
#include "generation/config.hpp"
#include "generation/sieving_primes.hpp"
#include "generation/wheel_sieve.hpp"

namespace tarn {
namespace {

// The longest step between two multiples of p on the wheel, in turns, rounded up.
std::uint64_t longestStep(std::uint64_t p) { return (6 * p + kSievePeriod - 1) / kSievePeriod + 1; }

// The primes from kMediumPrimeBound up to `root` (at most 3.1 * 10^7), dealt in turn into
// `groups` lists, so that every group gets its share of each size; by the medium primes' own
// sieve, which covers every factor up to the square root of `root`.
std::vector<std::vector<std::uint32_t>> largePrimes(std::uint64_t root, std::size_t groups) {
    std::vector<std::vector<std::uint32_t>> dealt(groups);
    const auto count = static_cast<std::size_t>(1.3 * root / std::log(root));
    for (auto& primes : dealt) primes.reserve(count / groups + 1);
    const auto first = static_cast<std::int64_t>((kMediumPrimeBound - kSieveFirst) / kSievePeriod);
    const auto end = static_cast<std::int64_t>((root - kSieveFirst) / kSievePeriod) + 1;
    WheelSieve sieve(first, static_cast<std::int64_t>(root));
    std::vector<std::uint8_t> segment(kSegmentTurns);
    std::size_t found = 0;
    for (std::int64_t turn = first; turn < end; turn += kSegmentTurns) {
        const auto turns = static_cast<std::size_t>(std::min(kSegmentTurns, end - turn));
        std::fill_n(segment.begin(), turns, 0);
        sieve.sieveNext(segment.data(), turns);
        for (std::size_t i = 0; i < turns; ++i) {
            const auto start =
                static_cast<std::uint64_t>(turnStart(turn + static_cast<std::int64_t>(i)));
            for (unsigned bits = static_cast<std::uint8_t>(~segment[i]); bits != 0;
                 bits &= bits - 1) {
                const std::uint64_t n = start + kTurnOffsets[std::countr_zero(bits)];
                if (n >= kMediumPrimeBound && n <= root)
                    dealt[found++ % groups].push_back(static_cast<std::uint32_t>(n));
            }
        }
    }
    return dealt;
}

}  // namespace

BucketSieve::BucketSieve(std::int64_t firstTurn, std::int64_t endTurn, std::int64_t limit,
                         std::int64_t chunkTurns, int groups)
    : firstTurn_(firstTurn),
      chunkTurns_(static_cast<std::uint64_t>(chunkTurns)),
      chunksPerSpan_(std::max<std::uint64_t>(kBucketSpanTurns / chunkTurns_, 1)),
      spanTurns_(chunksPerSpan_ * chunkTurns_),
      reciprocal_((std::uint64_t{1} << 32) / spanTurns_),
      shift_(std::has_single_bit(spanTurns_) ? std::countr_zero(spanTurns_) : -1) {
    const std::uint64_t root = limit > 0 ? wholeSqrt(static_cast<std::uint64_t>(limit)) : 0;
    if (root < kMediumPrimeBound || endTurn <= firstTurn) return;
    // The turn within a span shares an entry's word with a 6-bit index.
    if (spanTurns_ > (std::uint64_t{1} << 26)) throw std::length_error("chunk too long");
    std::vector<std::vector<std::uint32_t>> dealt =
        largePrimes(root, static_cast<std::size_t>(std::max(groups, 1)));
    if (dealt[0].empty()) return;
    groups_.resize(dealt.size());
    std::uint32_t largest = 0;
    std::size_t total = 0;
    std::uint64_t spans = 0;
    for (std::size_t g = 0; g < dealt.size(); ++g) {
        total += dealt[g].size();
        if (!dealt[g].empty()) largest = std::max(largest, dealt[g].back());
        Group& group = groups_[g];
        group.pending = std::move(dealt[g]);
        group.lead = g % chunksPerSpan_;
        group.origin = firstTurn - static_cast<std::int64_t>(group.lead * chunkTurns_);
        group.spans =
            (static_cast<std::uint64_t>(endTurn - group.origin) + spanTurns_ - 1) / spanTurns_;
        spans = std::max(spans, group.spans);
    }
    // A bucket for every span a next multiple can lie in, and the span being crossed off.
    const std::uint64_t reach = (spanTurns_ + longestStep(largest)) / spanTurns_ + 1;
    const std::size_t buckets = std::bit_ceil(std::min(reach, spans) + 1);
    bucketMask_ = buckets - 1;
    // Blocks large enough to fill in long runs, small enough that the partly filled ones stay
    // a small part of the whole.
    const std::size_t perBucket = total / buckets / groups_.size();
    blockBytes_ = std::bit_ceil(sizeof(Entry) * std::clamp<std::size_t>(perBucket / 4, 32, 2048));
    // Each group fills its buckets for the first chunks on a thread of its own: at the top of the
    // range every prime's first multiple takes a division, a tenth of a second in all.
    std::vector<std::exception_ptr> failures(groups_.size());
    const auto fill = [this, buckets, &failures](std::size_t g) {
        try {
            Group& group = groups_[g];
            group.heads.assign(2 * buckets, nullptr);
            for (Entry*& head : group.heads) spill(group, head);
            activate(group, bucketMask_);
        } catch (...) {
            failures[g] = std::current_exception();
        }
    };
    std::vector<std::thread> fillers;
    const auto join = [&fillers] {
        for (std::thread& t : fillers) t.join();
    };
    try {
        for (std::size_t g = 1; g < groups_.size(); ++g) fillers.emplace_back(fill, g);
    } catch (...) {
        join();
        throw;
    }
    fill(0);
    join();
    for (const std::exception_ptr& failure : failures)
        if (failure) std::rethrow_exception(failure);
}

BucketSieve::~BucketSieve() = default;

std::uint64_t BucketSieve::bytesFor(std::int64_t limit) {
    const double root = std::sqrt(static_cast<double>(std::max<std::int64_t>(limit, 100)));
    // For each prime (pi(x) < x / ln x * (1 + 1.2762 / ln x) from x = 599 on): its entry (8 bytes),
    // up to half as much again in blocks partly filled (a bucket's block holds at most a quarter of
    // its share, whatever the count of groups), and while it waits to be put in a bucket, its
    // pending place (4 bytes).
    const double log = std::log(root);
    return static_cast<std::uint64_t>(16 * root / log * (1 + 1.2762 / log));
}

BucketSieve::Block* BucketSieve::freeBlock(Group& group) {
    if (!group.free) {
        // Blocks come in slabs, aligned by hand: no aligned allocation on every system.
        group.storage.push_back(
            std::make_unique<std::byte[]>((kBucketSlabBlocks + 1) * blockBytes_));
        auto at = reinterpret_cast<std::uintptr_t>(group.storage.back().get());
        at = (at + blockBytes_ - 1) & ~(blockBytes_ - 1);
        for (std::size_t i = 0; i < kBucketSlabBlocks; ++i) {
            auto* block = reinterpret_cast<Block*>(at + i * blockBytes_);
            block->next = group.free;
            group.free = block;
        }
    }
    Block* block = group.free;
    group.free = block->next;
    block->next = nullptr;
    return block;
}

void BucketSieve::spill(Group& group, Entry*& head) {
    Block* const fresh = freeBlock(group);
    if (head)
        fresh->next =
            reinterpret_cast<Block*>(reinterpret_cast<std::uintptr_t>(head) - blockBytes_);
    head = fresh->entries();
}

inline void BucketSieve::file(Group& group, std::uint32_t a, std::uint32_t index,
                              std::uint64_t span, std::uint64_t turn) {
    // The span of the turn by a multiplication, one short at most.
    std::uint64_t ahead = (turn * reciprocal_) >> 32;
    turn -= ahead * spanTurns_;
    if (turn >= spanTurns_) {
        turn -= spanTurns_;
        ++ahead;
    }
    span += ahead;
    if (span >= group.spans) return;  // beyond the job: this prime is done
    const std::size_t slot = (span & bucketMask_) + (once(a) ? bucketMask_ + 1 : 0);
    Entry*& head = group.heads[slot];
    *head++ = entry(a, turn, index);
    if ((reinterpret_cast<std::uintptr_t>(head) & (blockBytes_ - 1)) == 0) spill(group, head);
}

void BucketSieve::activate(Group& group, std::uint64_t horizon) {
    const auto start = static_cast<std::uint64_t>(turnStart(firstTurn_));
    while (group.nextPending < group.pending.size()) {
        const std::uint32_t p = group.pending[group.nextPending];
        std::uint32_t wheel = 0;
        const std::uint64_t m = firstMultiple(p, start, wheel);
        const std::uint64_t turn =
            (m - kSieveFirst) / kSievePeriod - static_cast<std::uint64_t>(group.origin);
        const std::uint64_t span = turn / spanTurns_;
        // Primes whose squares lie past the start begin there, so the later ones further out.
        if (std::uint64_t{p} * p >= start && span > horizon) break;
        if (std::uint64_t{p} * p >= start && span >= group.spans) {
            group.nextPending = group.pending.size();
            break;
        }
        ++group.nextPending;
        file(group, static_cast<std::uint32_t>(p / kSievePeriod), walkIndex(p, wheel), span,
             turn - span * spanTurns_);
    }
    if (group.nextPending == group.pending.size()) {
        group.pending = {};
        group.nextPending = 0;
    }
}

void BucketSieve::crossOffNext(int index, std::uint8_t* bytes, std::int64_t turns) {
    Group& group = groups_[static_cast<std::size_t>(index)];
    const std::uint64_t chunk = group.chunk++ + group.lead;
    const std::uint64_t span = chunk / chunksPerSpan_;
    const std::uint64_t at = chunk % chunksPerSpan_;
    if (chunk == group.lead || at == 0) {
        // The span's multiples all lie within its sieve, though a last span may end early.
        group.sieve.assign(spanTurns_, 0);
        if (!group.pending.empty()) activate(group, span + bucketMask_);
        std::uint8_t* const sieve = group.sieve.data();
        if (shift_ >= 0) {
            crossOff<false, true>(group, span, sieve, spanTurns_);
            crossOff<true, true>(group, span, sieve, spanTurns_);
        } else {
            crossOff<false, false>(group, span, sieve, spanTurns_);
            crossOff<true, false>(group, span, sieve, spanTurns_);
        }
    }
    const std::uint8_t* const from = group.sieve.data() + at * chunkTurns_;
    for (std::size_t i = 0; i < static_cast<std::size_t>(turns); ++i) bytes[i] |= from[i];
}

template <bool kOnce, bool kShift>
void BucketSieve::crossOff(Group& group, std::uint64_t span, std::uint8_t* bytes,
                           std::uint64_t length) {
    const std::size_t base = kOnce ? bucketMask_ + 1 : 0;
    Entry*& bucket = group.heads[base + (span & bucketMask_)];
    // The bucket starts afresh: what lands in it now belongs to a span after the job's end.
    const Entry* end = std::exchange(bucket, nullptr);
    spill(group, bucket);
    auto* block =
        reinterpret_cast<Block*>(reinterpret_cast<std::uintptr_t>(end) & ~(blockBytes_ - 1));
    // Held in locals: the byte stores below could alias any member.
    const std::uint64_t spanTurns = spanTurns_, reciprocal = reciprocal_, mask = bucketMask_;
    const auto shift = static_cast<unsigned>(shift_);
    const std::uint64_t spansLeft = group.spans - span;
    const std::uintptr_t blockBytes = blockBytes_;
    Entry** const heads = group.heads.data() + base;
    for (;;) {
        for (const Entry* at = block->entries(); at != end; ++at) {
            const Entry e = *at;
            const std::uint64_t a = e & 0xffffffff;
            std::uint64_t turn = e >> 38;
            const std::uint32_t residue = (e >> 32) & 56;
            std::uint32_t wheel = (e >> 32) & 7;
            // Filed here, the next multiple lies in this span; primes whose shortest step
            // is a span or longer have no other. The next position comes by arithmetic, not from
            // the table, so that the walk waits on no load from one multiple to the next.
            do {
                const WalkStep& walk = kWalk[residue | wheel];
                bytes[turn] |= walk.bit;
                turn += a * walk.step + walk.carry;
                wheel = (wheel + 1) & 7;
            } while (!kOnce && turn < length);
            const std::uint32_t step = residue | wheel;
            std::uint64_t ahead;
            if constexpr (kShift) {
                ahead = turn >> shift;
                turn &= spanTurns - 1;
            } else {
                // The span of the next multiple by a multiplication, one short at most.
                ahead = (turn * reciprocal) >> 32;
                turn -= ahead * spanTurns;
                if (turn >= spanTurns) {
                    turn -= spanTurns;
                    ++ahead;
                }
            }
            if (ahead >= spansLeft) continue;  // beyond the job: this prime is done
            Entry*& head = heads[(span + ahead) & mask];
            *head++ = entry(a, turn, step);
            if ((reinterpret_cast<std::uintptr_t>(head) & (blockBytes - 1)) == 0) [[unlikely]]
                spill(group, head);
        }
        Block* const more = std::exchange(block->next, group.free);
        group.free = block;
        if (!more) break;
        block = more;
        end = reinterpret_cast<const Entry*>(reinterpret_cast<std::uintptr_t>(block) + blockBytes);
    }
}

}  // namespace tarn
