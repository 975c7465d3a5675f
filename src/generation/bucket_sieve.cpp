// A prime p = 30a + r steps from the multiple p * q to p * (q + s), s the wheel step after q:
// a * s turns plus a carry that depends only on r and the position of q on the wheel, and the
// multiple's bit in its turn depends on the same two. So an entry needs only the prime, the turn
// of its next multiple and the wheel position.
#include "generation/bucket_sieve.hpp"

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

#include "core/wheel.hpp"
#include "generation/sieving_primes.hpp"
#include "generation/wheel_sieve.hpp"

namespace tarn {
namespace {

struct Crossing {
    std::array<std::array<std::uint8_t, 8>, 8> bit{};    // by residue and wheel position
    std::array<std::array<std::uint8_t, 8>, 8> carry{};  // turns beyond a * s
    std::array<std::uint8_t, kSievePeriod> residue{};    // position of p mod 30 on the wheel
};

constexpr Crossing kCrossing = [] {
    Crossing c;
    for (std::uint32_t i = 0; i < 8; ++i) {
        const std::uint32_t r = kWheelNumbers[i];
        c.residue[r] = static_cast<std::uint8_t>(i);
        for (std::uint32_t w = 0; w < 8; ++w) {
            const std::uint32_t offset = (r * kWheelNumbers[w] + kSievePeriod - kSieveFirst) % 30;
            c.bit[i][w] = kBitOfOffset[offset];
            c.carry[i][w] = static_cast<std::uint8_t>((offset + r * kWheelSteps[w]) / 30);
        }
    }
    return c;
}();

// The longest step between two multiples of p on the wheel, in turns, rounded up.
std::uint64_t longestStep(std::uint64_t p) { return (6 * p + kSievePeriod - 1) / kSievePeriod + 1; }

}  // namespace

BucketSieve::BucketSieve(std::int64_t firstTurn, std::int64_t endTurn, std::int64_t limit,
                         std::int64_t chunkTurns)
    : firstTurn_(firstTurn),
      chunkTurns_(static_cast<std::uint64_t>(chunkTurns)),
      reciprocal_((std::uint64_t{1} << 32) / chunkTurns_),
      chunkCount_(static_cast<std::uint64_t>(std::max<std::int64_t>(endTurn - firstTurn, 0) +
                                             chunkTurns - 1) /
                  chunkTurns_) {
    const std::uint64_t root = limit > 0 ? wholeSqrt(static_cast<std::uint64_t>(limit)) : 0;
    if (root < kMediumPrimeBound || chunkCount_ == 0) return;
    pending_ = sievingPrimes(kMediumPrimeBound, static_cast<std::uint32_t>(root));
    if (pending_.empty()) return;
    // A bucket for every chunk a next multiple can lie in, and the chunk being crossed off.
    const std::uint64_t reach = (chunkTurns_ + longestStep(pending_.back())) / chunkTurns_ + 1;
    buckets_.assign(static_cast<std::size_t>(std::min(reach, chunkCount_) + 1), nullptr);
    // Blocks large enough to fill in long runs, small enough that the partly filled ones stay
    // a small part of the whole.
    const std::size_t perBucket = pending_.size() / buckets_.size();
    blockEntries_ = static_cast<std::uint32_t>(std::clamp<std::size_t>(perBucket / 4, 16, 2048));
    activate(buckets_.size() - 1);
}

BucketSieve::~BucketSieve() = default;

std::uint64_t BucketSieve::bytesFor(std::int64_t limit) {
    const double root = std::sqrt(static_cast<double>(std::max<std::int64_t>(limit, 100)));
    // A pending prime (4 bytes) and its entry (8 bytes) for each, pi(x) < 1.26 x / ln x.
    return static_cast<std::uint64_t>(12 * 1.26 * root / std::log(root));
}

BucketSieve::Block* BucketSieve::freeBlock() {
    if (!free_) {
        storage_.push_back(
            std::make_unique<std::byte[]>(sizeof(Block) + blockEntries_ * sizeof(Entry)));
        auto* block = reinterpret_cast<Block*>(storage_.back().get());
        block->next = nullptr;
        free_ = block;
    }
    Block* block = free_;
    free_ = block->next;
    block->next = nullptr;
    block->count = 0;
    return block;
}

void BucketSieve::file(std::uint32_t prime, std::uint64_t chunk, std::uint64_t turn,
                       std::uint32_t wheel) {
    // The chunk of the turn (below 2^32) by a multiplication, one short at most.
    std::uint64_t ahead = (turn * reciprocal_) >> 32;
    turn -= ahead * chunkTurns_;
    if (turn >= chunkTurns_) {
        turn -= chunkTurns_;
        ++ahead;
    }
    chunk += ahead;
    if (chunk >= chunkCount_) return;  // beyond the job: this prime is done
    Block*& head = buckets_[chunk % buckets_.size()];
    if (!head || head->count == blockEntries_) {
        Block* block = freeBlock();
        block->next = head;
        head = block;
    }
    head->entries()[head->count++] = Entry{prime, static_cast<std::uint32_t>(turn << 3) | wheel};
}

void BucketSieve::activate(std::uint64_t horizon) {
    const auto start = static_cast<std::uint64_t>(turnStart(firstTurn_));
    while (nextPending_ < pending_.size()) {
        const std::uint32_t p = pending_[nextPending_];
        std::uint32_t wheel = 0;
        const std::uint64_t m = firstMultiple(p, start, wheel);
        const std::uint64_t turn =
            (m - kSieveFirst) / kSievePeriod - static_cast<std::uint64_t>(firstTurn_);
        const std::uint64_t chunk = turn / chunkTurns_;
        // Primes whose squares lie past the start begin there, so the later ones further out.
        if (std::uint64_t{p} * p >= start && chunk > horizon) break;
        if (std::uint64_t{p} * p >= start && chunk >= chunkCount_) {
            nextPending_ = pending_.size();
            break;
        }
        ++nextPending_;
        file(p, chunk, turn - chunk * chunkTurns_, wheel);
    }
    if (nextPending_ == pending_.size()) {
        pending_.clear();
        pending_.shrink_to_fit();
        nextPending_ = 0;
    }
}

void BucketSieve::crossOffNext(std::uint8_t* bytes, std::int64_t turns) {
    const std::uint64_t chunk = chunk_++;
    if (buckets_.empty()) return;
    if (!pending_.empty()) activate(chunk + buckets_.size() - 1);
    Block* block = std::exchange(buckets_[chunk % buckets_.size()], nullptr);
    const auto length = static_cast<std::uint64_t>(turns);
    while (block) {
        const Entry* entry = block->entries();
        const Entry* const end = entry + block->count;
        for (; entry != end; ++entry) {
            const std::uint32_t p = entry->prime;
            const std::uint64_t a = p / kSievePeriod;
            const auto& bit = kCrossing.bit[kCrossing.residue[p % kSievePeriod]];
            const auto& carry = kCrossing.carry[kCrossing.residue[p % kSievePeriod]];
            std::uint64_t turn = entry->place >> 3;
            std::uint32_t wheel = entry->place & 7;
            while (turn < length) {
                bytes[turn] |= bit[wheel];
                turn += a * kWheelSteps[wheel] + carry[wheel];
                wheel = (wheel + 1) & 7;
            }
            file(p, chunk, turn, wheel);
        }
        Block* const next = block->next;
        block->next = free_;
        free_ = block;
        block = next;
    }
}

}  // namespace tarn
