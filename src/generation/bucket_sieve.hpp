// The large primes of the generation sieve, from kMediumPrimeBound up to the square root of the
// limit: up to 1.9 million of them, most of which have no multiple at all in a chunk of turns.
// Each waits in the bucket of the span that holds its next multiple, so a span costs the
// multiples that fall in it, not the count of primes. One instance serves every sieving thread.
// The primes are dealt into groups; each group crosses off the chunks one after the other, in
// the order the threads claim them, so different groups can work on different chunks at once.
// A prime is put in a bucket only once its first multiple comes within reach of the buckets.
// The buckets are kept by spans of several chunks, about kBucketSpanTurns, crossed off into a span
// of sieve of each group's own and copied out chunk by chunk: a prime below the span's length
// is then visited once a span rather than once a chunk. The groups' spans are staggered by a
// chunk each, so that different groups cross off their spans on different chunks and the threads
// stay evenly loaded.
#pragma once

#include <cstdint>
#include <memory>
#include <vector>

namespace tarn {

class BucketSieve {
public:
    // For the chunks of `chunkTurns` turns from `firstTurn` up to `endTurn` (the last one may be
    // shorter), for numbers up to `limit`, with the primes dealt into `groups` groups; fills the
    // buckets for the first chunks, a thread for each group.
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

    // About the bytes it takes for a limit, whatever the count of groups, for the thread pool's
    // memory budget.
    static std::uint64_t bytesFor(std::int64_t limit);

private:
    // p / 30 for the prime p | (the turn of its next multiple within its span << 6 | the kWalk
    // index) << 32: one load and one store a multiple.
    using Entry = std::uint64_t;
    static constexpr Entry entry(std::uint64_t a, std::uint64_t turn, std::uint32_t index) {
        return a | (turn << 6 | index) << 32;
    }
    // Blocks are aligned to their size, so a bucket's write pointer tells by its address when
    // its block is full; the entries follow the header up to the block's end.
    struct Block {
        Block* next;  // the bucket's block filled before this one
        std::uint64_t unused;
        Entry* entries() { return reinterpret_cast<Entry*>(this + 1); }
    };
    struct Group {
        std::int64_t origin = 0;             // the first turn of its span 0, at or before the job's
        std::uint64_t spans = 0;             // its spans up to the end of the job
        std::uint64_t chunk = 0;             // the next chunk to cross off
        std::uint64_t lead = 0;              // the chunks of span 0 before the job's first
        std::vector<std::uint8_t> sieve;     // the span crossed off last
        std::vector<std::uint32_t> pending;  // primes not yet in a bucket, ascending
        std::size_t nextPending = 0;
        // By span modulo their count, then the same for the primes that hit a span once at
        // most: where the next entry goes, never at a block's end.
        std::vector<Entry*> heads;
        Block* free = nullptr;
        std::vector<std::unique_ptr<std::byte[]>> storage;
    };

    // A prime whose shortest step (2p / 30 turns) is a span or longer.
    bool once(std::uint32_t a) const { return 2 * std::uint64_t{a} >= spanTurns_; }
    void activate(Group& group, std::uint64_t horizon);
    template <bool kOnce, bool kShift>
    void crossOff(Group& group, std::uint64_t span, std::uint8_t* bytes, std::uint64_t length);
    // Files an entry whose next multiple is `turn` (below 2^32) turns after the start of
    // span `span`.
    void file(Group& group, std::uint32_t a, std::uint32_t index, std::uint64_t span,
              std::uint64_t turn);
    Block* freeBlock(Group& group);
    // The bucket whose block ends at `head` (or has none) gets a fresh one.
    void spill(Group& group, Entry*& head);

    const std::int64_t firstTurn_;
    const std::uint64_t chunkTurns_;
    const std::uint64_t chunksPerSpan_;
    const std::uint64_t spanTurns_;
    const std::uint64_t reciprocal_;  // 2^32 / spanTurns, for the span of a turn
    const int shift_;                 // log2 of spanTurns when that is a power of two, else -1
    std::uint64_t bucketMask_ = 0;
    std::uintptr_t blockBytes_ = 0;
    std::vector<Group> groups_;
};

}  // namespace tarn
