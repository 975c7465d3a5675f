// The back half of the generation job: a writer thread that writes each full buffer of records
// with one write(2) and starts its writeback, and a checkpointer thread that every interval
// flushes the results file with fdatasync and only then rewrites the checkpoint (Interrupted 1,
// the last candidate of the last turn whose records are all on the disk). The producer sieves
// and formats into the free buffers meanwhile, so the cores and the disk work at once.
//
// Byte marks are offsets in the results file as the sink counts them, so a job that continues a
// file knows exactly what lies on the disk before and after its own records. Nothing here
// throws to the producer: a failure on either thread, an exception included, is kept and raises
// failed(), after which the writer drops every further buffer.
#pragma once

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "generation/generation_job.hpp"

namespace tarn {

// Records formatted by the producer, ending at a turn boundary.
struct RecordBuffer {
    std::vector<char> bytes;
    std::size_t size = 0;
    std::int64_t lastCandidate = 0;  // last candidate of the last whole turn in the buffer
    std::int64_t primeCount = 0;     // records in the file once the buffer is written
};

// How far the records reach: in the file, or on the disk.
struct FileMark {
    std::uint64_t bytes = 0;
    std::int64_t candidate = 0;
    std::int64_t primeCount = 0;
};

// What went wrong first, for the failure path and its message.
struct PipelineFailure {
    enum class Kind { None, Write, Sync, Checkpoint, Internal };
    Kind kind = Kind::None;
    int error = 0;       // Write, Sync: the system's error number
    std::string reason;  // Checkpoint: the system's reason; Internal: what was thrown
};

// Rewrites the checkpoint through the job's hook, or for real.
std::string saveCheckpoint(const JobHooks& hooks, const std::string& path,
                           const Checkpoint& checkpoint);

class WritePipeline {
public:
    static constexpr int kBufferCount = 4;

    WritePipeline(ResultsSink& sink, const JobHooks& hooks, std::string checkpointPath,
                  std::int64_t limit, std::size_t bufferBytes, FileMark start,
                  JobProgress* progress);
    ~WritePipeline();  // finishes first when the producer left by an exception
    WritePipeline(const WritePipeline&) = delete;
    WritePipeline& operator=(const WritePipeline&) = delete;

    void start();
    RecordBuffer* take();  // waits for a free buffer
    void hand(RecordBuffer* buffer);
    // No more buffers; waits until every one is written and both threads have left.
    void finish();
    // The producer failed: record why, so the failure path runs.
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
    void release(RecordBuffer* buffer);

    ResultsSink& sink_;
    const JobHooks& hooks_;
    const std::string checkpointPath_;
    const std::int64_t limit_;
    JobProgress* progress_;

    std::mutex mutex_;
    std::condition_variable changed_;
    RecordBuffer buffers_[kBufferCount];
    std::deque<RecordBuffer*> free_;
    std::deque<RecordBuffer*> full_;
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
