// The front half of the generation job: a pool of sieving threads. The turns to generate are cut
// into chunks; each thread claims the next chunk, has each group of the shared bucket sieve cross
// off its large primes in it (every group takes the chunks in claim order, so while one thread
// works with one group another works with the next), sieves it segment by segment with the
// medium primes of a wheel sieve of its own (moved on past the chunks that other threads took),
// counts its primes, and formats them into a buffer of the write pipeline, which writes the
// buffers in chunk order.
// Serial numbers of enumerated records run on across chunks: a chunk learns how many records
// come before it from the chunk before, which is known as soon as that one is sieved, so the
// formatting of all chunks goes on at once.
//
// Stops land on whole turns: every thread looks at the stop request after each segment and
// ends its chunk there; the writer writes up to the first chunk that ended early and drops the
// ones after it. The very first segment of a job is a single turn.
#pragma once

#include <condition_variable>
#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <thread>
#include <vector>

#include "core/stop_signal.hpp"
#include "core/wheel.hpp"
#include "generation/bucket_sieve.hpp"
#include "generation/job_progress.hpp"
#include "generation/wheel_sieve.hpp"
#include "generation/write_pipeline.hpp"

namespace tarn {

struct ChunkPlan {
    std::int64_t firstTurn = 0;  // the job's first turn
    std::int64_t endTurn = 0;    // one past its last
    std::int64_t limit = 0;
    std::int64_t recordsBefore = 0;   // records in the file before the first turn
    std::uint64_t firstSequence = 0;  // the pipeline sequence number of the first chunk
    bool enumerated = false;
    std::int64_t chunkTurns = 0;
    std::int64_t segmentTurns = 0;
};

class ChunkProducer {
public:
    ChunkProducer(const ChunkPlan& plan, WritePipeline& pipeline, const StopSignal& stop,
                  JobProgress* progress);
    ~ChunkProducer();  // joins the threads
    ChunkProducer(const ChunkProducer&) = delete;
    ChunkProducer& operator=(const ChunkProducer&) = delete;

    // Starts `threads` sieving threads (at least one) and returns at once; they share `large`,
    // made for the plan's chunks, which must outlive them.
    void start(int threads, BucketSieve& large);
    // Waits until every thread has left.
    void join();

private:
    struct Claim {
        std::int64_t index = -1;  // -1: nothing left to do
        std::int64_t firstTurn = 0;
        std::int64_t endTurn = 0;
    };

    void work();
    Claim claim();
    // Sieves the chunk into `sieved` and returns the turn it ended before (early on a stop).
    std::int64_t sieveChunk(WheelSieve& sieve, const Claim& chunk,
                            std::vector<std::uint8_t>& sieved);
    std::int64_t countPrimes(const std::vector<std::uint8_t>& sieved, std::int64_t turns) const;
    // The records before chunk `index`, once the chunk before it has said how many it holds;
    // -1 when a failure ended the job first.
    std::int64_t recordsBefore(std::int64_t index);
    void close(bool failed);
    void publish(std::int64_t index, std::int64_t recordsAfter);
    void format(const Claim& chunk, std::int64_t reached, const std::vector<std::uint8_t>& sieved,
                std::int64_t before, std::int64_t count, RecordBuffer& buffer) const;

    const ChunkPlan plan_;
    WritePipeline& pipeline_;
    const StopSignal& stop_;
    JobProgress* progress_;

    // Waits for the group's turn on the chunk, crosses off, and hands the group on; false when
    // a failure ended the job first.
    bool crossOff(int group, std::int64_t index, std::uint8_t* bytes, std::int64_t turns);

    BucketSieve* large_ = nullptr;
    std::mutex mutex_;
    std::condition_variable published_;     // a chunk's count, a group's next chunk, or a failure
    std::vector<std::int64_t> groupChunk_;  // the next chunk of each group of large primes
    std::int64_t nextChunk_ = 0;
    bool closed_ = false;  // a stop or a failure: no further chunk is claimed
    bool failed_ = false;  // a thread failed: nobody waits for a chunk count any more
    std::map<std::int64_t, std::int64_t> recordsAfter_;  // by chunk index
    std::vector<std::thread> threads_;
};

}  // namespace tarn
