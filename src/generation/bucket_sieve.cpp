// An entry needs only a and r's position for its prime p = 30a + r (kCrossing), the turn of its
// next multiple and the wheel position.
#include "generation/bucket_sieve.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
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
                  chunkTurns_) {
    const std::uint64_t root = limit > 0 ? wholeSqrt(static_cast<std::uint64_t>(limit)) : 0;
    if (root < kMediumPrimeBound || chunkCount_ == 0) return;
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
    blockEntries_ = static_cast<std::uint32_t>(std::clamp<std::size_t>(perBucket / 4, 16, 2048));
    // Each group fills its buckets as it crosses off its first chunk, on a sieving thread.
    for (Group& group : groups_) group.buckets.assign(2 * buckets, nullptr);
}

BucketSieve::~BucketSieve() = default;

std::uint64_t BucketSieve::bytesFor(std::int64_t limit) {
    const double root = std::sqrt(static_cast<double>(std::max<std::int64_t>(limit, 100)));
    // A pending prime (4 bytes) and its entry (8 bytes) for each, pi(x) < 1.26 x / ln x.
    return static_cast<std::uint64_t>(12 * 1.26 * root / std::log(root));
}

BucketSieve::Block* BucketSieve::freeBlock(Group& group) const {
    if (!group.free) {
        group.storage.push_back(
            std::make_unique<std::byte[]>(sizeof(Block) + blockEntries_ * sizeof(Entry)));
        auto* block = reinterpret_cast<Block*>(group.storage.back().get());
        block->next = nullptr;
        group.free = block;
    }
    Block* block = group.free;
    group.free = block->next;
    block->next = nullptr;
    block->count = 0;
    return block;
}

inline void BucketSieve::file(Group& group, std::uint32_t prime, std::uint64_t chunk,
                              std::uint64_t turn, std::uint32_t wheel) const {
    // The chunk of the turn by a multiplication, one short at most.
    std::uint64_t ahead = (turn * reciprocal_) >> 32;
    turn -= ahead * chunkTurns_;
    if (turn >= chunkTurns_) {
        turn -= chunkTurns_;
        ++ahead;
    }
    chunk += ahead;
    if (chunk >= chunkCount_) return;  // beyond the job: this prime is done
    Block*& head = group.buckets[(chunk & bucketMask_) + (once(prime) ? bucketMask_ + 1 : 0)];
    if (!head || head->count == blockEntries_) [[unlikely]] {
        Block* block = freeBlock(group);
        block->next = head;
        head = block;
    }
    head->entries()[head->count++] = Entry{prime, static_cast<std::uint32_t>(turn << 3) | wheel};
}

void BucketSieve::activate(Group& group, std::uint64_t horizon) const {
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
        file(group, packPrime(p), chunk, turn - chunk * chunkTurns_, wheel);
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
    crossOff<false>(group, chunk, bytes, static_cast<std::uint64_t>(turns));
    crossOff<true>(group, chunk, bytes, static_cast<std::uint64_t>(turns));
}

template <bool kOnce>
void BucketSieve::crossOff(Group& group, std::uint64_t chunk, std::uint8_t* bytes,
                           std::uint64_t length) {
    // Held in locals: the byte stores below could alias any member.
    const std::uint64_t chunkTurns = chunkTurns_, reciprocal = reciprocal_, mask = bucketMask_;
    const std::uint64_t chunksLeft = chunkCount_ - chunk;
    const std::uint32_t blockEntries = blockEntries_;
    Block** const buckets = group.buckets.data() + (kOnce ? mask + 1 : 0);
    Block* block = std::exchange(buckets[chunk & mask], nullptr);
    while (block) {
        const Entry* entry = block->entries();
        const Entry* const end = entry + block->count;
        for (; entry != end; ++entry) {
            const std::uint32_t prime = entry->prime;
            const std::uint64_t a = prime >> 3;
            const auto& bit = kCrossing.bit[prime & 7];
            const auto& carry = kCrossing.carry[prime & 7];
            std::uint64_t turn = entry->place >> 3;
            std::uint32_t wheel = entry->place & 7;
            // Filed here, the next multiple lies in this chunk; primes whose shortest step
            // spans a chunk have no other.
            do {
                bytes[turn] |= bit[wheel];
                turn += a * kWheelSteps[wheel] + carry[wheel];
                wheel = (wheel + 1) & 7;
            } while (!kOnce && turn < length);
            // The chunk of the next multiple by a multiplication, one short at most.
            std::uint64_t ahead = (turn * reciprocal) >> 32;
            turn -= ahead * chunkTurns;
            if (turn >= chunkTurns) {
                turn -= chunkTurns;
                ++ahead;
            }
            if (ahead >= chunksLeft) continue;  // beyond the job: this prime is done
            Block*& head = buckets[(chunk + ahead) & mask];
            if (!head || head->count == blockEntries) [[unlikely]] {
                Block* const fresh = freeBlock(group);
                fresh->next = head;
                head = fresh;
            }
            head->entries()[head->count++] =
                Entry{prime, static_cast<std::uint32_t>(turn << 3) | wheel};
        }
        Block* const next = block->next;
        block->next = group.free;
        group.free = block;
        block = next;
    }
}

}  // namespace tarn
