// The large primes of the generation sieve, from kMediumPrimeBound up to the square root of the
// limit: up to 1.9 million of them, most of which have no multiple at all in a chunk of turns.
// Each waits in the bucket of the chunk that holds its next multiple, so a chunk costs the
// multiples that fall in it, not the count of primes. One instance serves every sieving thread.
// The primes are dealt into groups; each group crosses off the chunks one after the other, in
// the order the threads claim them, so different groups can work on different chunks at once.
// A prime is put in a bucket only once its first multiple comes within reach of the buckets.
#pragma once

#include <cstdint>
#include <memory>
#include <vector>

namespace tarn {

class BucketSieve {
public:
    // For the chunks of `chunkTurns` turns from `firstTurn` up to `endTurn` (the last one may be
    // shorter), for numbers up to `limit`, with the primes dealt into `groups` groups.
    BucketSieve(std::int64_t firstTurn, std::int64_t endTurn, std::int64_t limit,
                std::int64_t chunkTurns, int groups);
    ~BucketSieve();
    BucketSieve(const BucketSieve&) = delete;
    BucketSieve& operator=(const BucketSieve&) = delete;

    // None when no prime reaches kMediumPrimeBound.
    int groups() const { return static_cast<int>(groups_.size()); }

    // Marks the multiples of the primes of `group` in that group's next chunk, whose `turns`
    // bytes are `bytes` (bit set = composite); other bits are left as they are. Calls for
    // different groups may run at once.
    void crossOffNext(int group, std::uint8_t* bytes, std::int64_t turns);

    // About the bytes it takes for a limit, for the thread pool's memory budget.
    static std::uint64_t bytesFor(std::int64_t limit);

private:
    struct Entry {
        std::uint32_t prime;  // p / 30 << 3 | the position of p mod 30 on the wheel
        std::uint32_t place;  // turn of the next multiple within its chunk << 3 | wheel position
    };
    struct Block {
        Block* next;
        std::uint32_t count;
        Entry* entries() { return reinterpret_cast<Entry*>(this + 1); }
    };
    struct Group {
        std::uint64_t chunk = 0;             // the next chunk to cross off
        std::vector<std::uint32_t> pending;  // primes not yet in a bucket, ascending
        std::size_t nextPending = 0;
        // By chunk modulo their count, then the same for the primes that hit a chunk once at
        // most; the head block is filling.
        std::vector<Block*> buckets;
        Block* free = nullptr;
        std::vector<std::unique_ptr<std::byte[]>> storage;
    };

    // A prime whose shortest step (2p / 30 turns) spans a chunk.
    bool once(std::uint32_t prime) const { return 2 * std::uint64_t{prime >> 3} >= chunkTurns_; }
    void activate(Group& group, std::uint64_t horizon) const;
    template <bool kOnce>
    void crossOff(Group& group, std::uint64_t chunk, std::uint8_t* bytes, std::uint64_t length);
    // Files an entry whose next multiple is `turn` (below 2^32) turns after the start of
    // chunk `chunk`.
    void file(Group& group, std::uint32_t prime, std::uint64_t chunk, std::uint64_t turn,
              std::uint32_t wheel) const;
    Block* freeBlock(Group& group) const;

    const std::int64_t firstTurn_;
    const std::uint64_t chunkTurns_;
    const std::uint64_t reciprocal_;  // 2^32 / chunkTurns, for the chunk of a turn
    const std::uint64_t chunkCount_;
    std::uint64_t bucketMask_ = 0;
    std::uint32_t blockEntries_ = 0;
    std::vector<Group> groups_;
};

}  // namespace tarn
