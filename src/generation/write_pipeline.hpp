// The back half of the generation job: a writer thread that writes the producers' buffers to the
// results file strictly in their order, one write(2) each, starting their writeback at once; and
// a checkpointer thread that every interval flushes the results file with fdatasync and only
// then rewrites the checkpoint (Interrupted 1, the last candidate of the last turn whose records
// are all on the disk). The producers fill the free buffers meanwhile, so every core and the
// disk work at once, and the fixed count of buffers bounds the memory.
//
// Byte marks are offsets in the results file as the sink counts them, so a job that continues a
// file knows exactly what lies on the disk before and after its own records. Nothing here
// throws to the producers: a failure on either thread, an exception included, is kept and raises
// failed(), after which the writer drops every further buffer.
#pragma once

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "generation/job_files.hpp"
#include "generation/job_progress.hpp"

namespace tarn {

// Records of consecutive whole turns, ready for the file.
struct RecordBuffer {
    std::unique_ptr<char[]> data;
    std::size_t capacity = 0;
    std::size_t size = 0;
    std::uint64_t sequence = 0;      // its place in the file among the job's buffers
    std::int64_t lastCandidate = 0;  // last candidate of the last turn in the buffer
    std::int64_t primeCount = 0;     // records in the file once the buffer is written
    bool endsJob = false;            // the producers stopped here: nothing after it is written

    // Room for `bytes`; keeps the storage when it is large enough and never clears it.
    char* reserve(std::size_t bytes);
};

// How far the records reach: in the file, or on the disk.
struct FileMark {
    std::uint64_t bytes = 0;
    std::int64_t candidate = 0;
    std::int64_t primeCount = 0;
};

// What went wrong first, for the failure path and its message.
struct PipelineFailure {
    enum class Kind { None, Write, Sync, Checkpoint, Changed, Internal };
    Kind kind = Kind::None;
    int error = 0;       // Write, Sync: the system's error number
    std::string reason;  // Checkpoint: the system's reason; Internal: what was thrown
    FileCheck check{};   // Changed: what became of the file
};

// Where and how often the checkpoints during the job go.
struct CheckpointPlan {
    std::string path;
    std::int64_t limit = 0;
    std::chrono::milliseconds interval{};
};

class WritePipeline {
public:
    WritePipeline(ResultsSink& sink, JobFiles& files, CheckpointPlan checkpoints, int bufferCount,
                  FileMark start, JobProgress* progress);
    ~WritePipeline();  // finishes first when a producer left by an exception
    WritePipeline(const WritePipeline&) = delete;
    WritePipeline& operator=(const WritePipeline&) = delete;

    void start();
    RecordBuffer* take();  // waits for a free buffer; nothing once the pipeline has failed
    // Queues a buffer for writing in the order of its sequence number.
    void hand(RecordBuffer* buffer);
    // Gives back a buffer that will not be handed over.
    void release(RecordBuffer* buffer);
    // No more buffers; writes what continues the file without a gap, then waits for both
    // threads to leave.
    void finish();
    // A producer failed: record why, so the failure path runs.
    void fail(PipelineFailure failure);

    bool failed() const { return failed_.load(std::memory_order_acquire); }
    // After finish() only.
    const PipelineFailure& failure() const { return failure_; }
    FileMark written() const { return written_; }
    FileMark durable() const { return durable_; }

private:
    void writeLoop();
    void writeOne(RecordBuffer& buffer);
    void checkpointLoop();
    bool checkpointOnce(std::chrono::steady_clock::time_point& lastFlush);

    ResultsSink& sink_;
    JobFiles& files_;
    const CheckpointPlan checkpoints_;
    JobProgress* progress_;

    std::mutex mutex_;
    std::condition_variable changed_;
    std::vector<RecordBuffer> buffers_;
    std::vector<RecordBuffer*> free_;
    std::map<std::uint64_t, RecordBuffer*> ready_;  // by sequence
    std::uint64_t nextSequence_ = 0;
    bool producerDone_ = false;
    bool writerDone_ = false;
    std::atomic<bool> failed_{false};
    PipelineFailure failure_;
    FileMark written_;
    FileMark durable_;
    std::thread writer_;
    std::thread checkpointer_;
};

}  // namespace tarn
