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
    constexpr std::int64_t kSegment = 1 << 15;
    const auto first = static_cast<std::int64_t>((kMediumPrimeBound - kSieveFirst) / kSievePeriod);
    const auto end = static_cast<std::int64_t>((root - kSieveFirst) / kSievePeriod) + 1;
    WheelSieve sieve(first, static_cast<std::int64_t>(root));
    std::vector<std::uint8_t> segment(kSegment);
    std::size_t found = 0;
    for (std::int64_t turn = first; turn < end; turn += kSegment) {
        const auto turns = static_cast<std::size_t>(std::min(kSegment, end - turn));
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
      reciprocal_((std::uint64_t{1} << 32) / chunkTurns_),
      chunkCount_(static_cast<std::uint64_t>(std::max<std::int64_t>(endTurn - firstTurn, 0) +
                                             chunkTurns - 1) /
                  chunkTurns_),
      shift_(std::has_single_bit(chunkTurns_) ? std::countr_zero(chunkTurns_) : -1) {
    const std::uint64_t root = limit > 0 ? wholeSqrt(static_cast<std::uint64_t>(limit)) : 0;
    if (root < kMediumPrimeBound || chunkCount_ == 0) return;
    // The turn within a chunk shares an entry's word with a 6-bit index.
    if (chunkTurns_ > (std::uint64_t{1} << 26)) throw std::length_error("chunk too long");
    std::vector<std::vector<std::uint32_t>> dealt =
        largePrimes(root, static_cast<std::size_t>(std::max(groups, 1)));
    if (dealt[0].empty()) return;
    groups_.resize(dealt.size());
    std::uint32_t largest = 0;
    std::size_t total = 0;
    for (std::size_t g = 0; g < dealt.size(); ++g) {
        total += dealt[g].size();
        if (!dealt[g].empty()) largest = std::max(largest, dealt[g].back());
        groups_[g].pending = std::move(dealt[g]);
    }
    // A bucket for every chunk a next multiple can lie in, and the chunk being crossed off.
    const std::uint64_t reach = (chunkTurns_ + longestStep(largest)) / chunkTurns_ + 1;
    const std::size_t buckets = std::bit_ceil(std::min(reach, chunkCount_) + 1);
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
        constexpr std::size_t kSlab = 32;
        group.storage.push_back(std::make_unique<std::byte[]>((kSlab + 1) * blockBytes_));
        auto at = reinterpret_cast<std::uintptr_t>(group.storage.back().get());
        at = (at + blockBytes_ - 1) & ~(blockBytes_ - 1);
        for (std::size_t i = 0; i < kSlab; ++i) {
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
                              std::uint64_t chunk, std::uint64_t turn) {
    // The chunk of the turn by a multiplication, one short at most.
    std::uint64_t ahead = (turn * reciprocal_) >> 32;
    turn -= ahead * chunkTurns_;
    if (turn >= chunkTurns_) {
        turn -= chunkTurns_;
        ++ahead;
    }
    chunk += ahead;
    if (chunk >= chunkCount_) return;  // beyond the job: this prime is done
    const std::size_t slot = (chunk & bucketMask_) + (once(a) ? bucketMask_ + 1 : 0);
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
            (m - kSieveFirst) / kSievePeriod - static_cast<std::uint64_t>(firstTurn_);
        const std::uint64_t chunk = turn / chunkTurns_;
        // Primes whose squares lie past the start begin there, so the later ones further out.
        if (std::uint64_t{p} * p >= start && chunk > horizon) break;
        if (std::uint64_t{p} * p >= start && chunk >= chunkCount_) {
            group.nextPending = group.pending.size();
            break;
        }
        ++group.nextPending;
        file(group, static_cast<std::uint32_t>(p / kSievePeriod), walkIndex(p, wheel), chunk,
             turn - chunk * chunkTurns_);
    }
    if (group.nextPending == group.pending.size()) {
        group.pending = {};
        group.nextPending = 0;
    }
}

void BucketSieve::crossOffNext(int index, std::uint8_t* bytes, std::int64_t turns) {
    Group& group = groups_[static_cast<std::size_t>(index)];
    const std::uint64_t chunk = group.chunk++;
    if (!group.pending.empty()) activate(group, chunk + bucketMask_);
    const auto length = static_cast<std::uint64_t>(turns);
    if (shift_ >= 0) {
        crossOff<false, true>(group, chunk, bytes, length);
        crossOff<true, true>(group, chunk, bytes, length);
    } else {
        crossOff<false, false>(group, chunk, bytes, length);
        crossOff<true, false>(group, chunk, bytes, length);
    }
}

template <bool kOnce, bool kShift>
void BucketSieve::crossOff(Group& group, std::uint64_t chunk, std::uint8_t* bytes,
                           std::uint64_t length) {
    const std::size_t base = kOnce ? bucketMask_ + 1 : 0;
    Entry*& bucket = group.heads[base + (chunk & bucketMask_)];
    // The bucket starts afresh: what lands in it now belongs to a chunk after the job's end.
    const Entry* end = std::exchange(bucket, nullptr);
    spill(group, bucket);
    auto* block =
        reinterpret_cast<Block*>(reinterpret_cast<std::uintptr_t>(end) & ~(blockBytes_ - 1));
    // Held in locals: the byte stores below could alias any member.
    const std::uint64_t chunkTurns = chunkTurns_, reciprocal = reciprocal_, mask = bucketMask_;
    const auto shift = static_cast<unsigned>(shift_);
    const std::uint64_t chunksLeft = chunkCount_ - chunk;
    const std::uintptr_t blockBytes = blockBytes_;
    Entry** const heads = group.heads.data() + base;
    for (;;) {
        for (const Entry* at = block->entries(); at != end; ++at) {
            const Entry e = *at;
            const std::uint64_t a = e & 0xffffffff;
            std::uint64_t turn = e >> 38;
            const std::uint32_t residue = (e >> 32) & 56;
            std::uint32_t wheel = (e >> 32) & 7;
            // Filed here, the next multiple lies in this chunk; primes whose shortest step
            // spans a chunk have no other. The next position comes by arithmetic, not from the
            // table, so that the walk waits on no load from one multiple to the next.
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
                turn &= chunkTurns - 1;
            } else {
                // The chunk of the next multiple by a multiplication, one short at most.
                ahead = (turn * reciprocal) >> 32;
                turn -= ahead * chunkTurns;
                if (turn >= chunkTurns) {
                    turn -= chunkTurns;
                    ++ahead;
                }
            }
            if (ahead >= chunksLeft) continue;  // beyond the job: this prime is done
            Entry*& head = heads[(chunk + ahead) & mask];
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
