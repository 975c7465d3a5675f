// The generation job as a three-stage pipeline, so that the two cores and the disk work at once:
// - the calling thread sieves a segment of wheel turns and formats its primes into a large
//   buffer, handing full buffers over at turn boundaries;
// - a writer thread writes each buffer with one write(2) and starts its writeback to the disk;
// - a checkpointer thread, every two seconds (and at once after the seed records), flushes the
//   results file with fdatasync and only then rewrites the checkpoint with Interrupted 1 and the
//   last candidate of the last turn whose records are all on the disk.
// The stop request is looked at after every segment (well under a millisecond of work), and a
// stop leaves the job at the end of a whole turn; the first segment is a single turn, so a stop
// asked before the job began ends it after the turn 11 to 37.
#include "generation/generation_job.hpp"

#include <algorithm>
#include <condition_variable>
#include <cstring>
#include <deque>
#include <mutex>
#include <new>
#include <optional>
#include <thread>
#include <vector>

#include "core/file_messages.hpp"
#include "generation/file_names.hpp"
#include "generation/job_texts.hpp"
#include "generation/record_formatter.hpp"
#include "generation/wheel_sieve.hpp"

namespace tarn {
namespace {

constexpr std::int64_t kSegmentTurns = 32 * 1024;
constexpr std::size_t kBufferBytes = 4u << 20;
constexpr int kBufferCount = 4;

struct Buffer {
    std::vector<char> bytes;
    std::size_t size = 0;
    std::int64_t lastCandidate = 0;  // last candidate of the last whole turn in the buffer
    std::int64_t primeCount = 0;     // records in the file once the buffer is written
};

// What has reached the file, or the disk.
struct Mark {
    std::uint64_t bytes = 0;
    std::int64_t candidate = 0;
    std::int64_t primeCount = 0;
};

class Pipeline {
public:
    Pipeline(ResultsSink& sink, const JobHooks& hooks, std::string checkpointPath,
             std::int64_t limit, std::size_t bufferBytes, Mark start, JobProgress* progress)
        : sink_(sink),
          hooks_(hooks),
          checkpointPath_(std::move(checkpointPath)),
          limit_(limit),
          progress_(progress),
          written_(start),
          durable_(start) {
        for (Buffer& b : buffers_) {
            b.bytes.resize(bufferBytes);
            free_.push_back(&b);
        }
    }

    void start() {
        writer_ = std::thread([this] { writeLoop(); });
        if (hooks_.durable) checkpointer_ = std::thread([this] { checkpointLoop(); });
    }

    // Waits for a free buffer.
    Buffer* take() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [this] { return !free_.empty(); });
        Buffer* b = free_.front();
        free_.pop_front();
        return b;
    }

    void hand(Buffer* b) {
        {
            std::lock_guard lock(mutex_);
            full_.push_back(b);
        }
        changed_.notify_all();
    }

    // No more buffers; waits until every one is written and the checkpointer has left.
    void finish() {
        {
            std::lock_guard lock(mutex_);
            producerDone_ = true;
        }
        changed_.notify_all();
        if (writer_.joinable()) writer_.join();
        if (checkpointer_.joinable()) checkpointer_.join();
    }

    bool failed() const { return failed_.load(std::memory_order_relaxed); }
    int writeError() const { return writeError_; }
    int syncError() const { return syncError_; }
    const std::string& checkpointError() const { return checkpointError_; }
    Mark written() const { return written_; }
    Mark durable() const { return durable_; }

private:
    void writeLoop() {
        for (;;) {
            Buffer* b = nullptr;
            {
                std::unique_lock lock(mutex_);
                changed_.wait(lock, [this] { return !full_.empty() || producerDone_; });
                if (full_.empty()) break;
                b = full_.front();
                full_.pop_front();
            }
            if (!failed() && b->size != 0) {
                std::size_t reached = 0;
                const int error = sink_.write(b->bytes.data(), b->size, reached);
                std::uint64_t offset = 0;
                {
                    std::lock_guard lock(mutex_);
                    if (error != 0) {
                        writeError_ = error;
                        failed_.store(true, std::memory_order_relaxed);
                    } else {
                        offset = written_.bytes;
                        written_ = {written_.bytes + b->size, b->lastCandidate, b->primeCount};
                    }
                }
                if (error == 0 && hooks_.durable) sink_.startWriteback(offset, b->size);
            } else if (!failed()) {
                std::lock_guard lock(mutex_);
                written_.candidate = b->lastCandidate;
                written_.primeCount = b->primeCount;
            }
            if (progress_ && !failed())
                progress_->primeCount.store(b->primeCount, std::memory_order_relaxed);
            {
                std::lock_guard lock(mutex_);
                free_.push_back(b);
            }
            changed_.notify_all();
        }
        {
            std::lock_guard lock(mutex_);
            writerDone_ = true;
        }
        changed_.notify_all();
    }

    void checkpointLoop() {
        // The first flush comes as soon as there is something written: the seed records.
        auto lastFlush = std::chrono::steady_clock::now() - hooks_.checkpointInterval;
        for (;;) {
            Mark mark;
            {
                std::unique_lock lock(mutex_);
                for (;;) {
                    if (writerDone_ || failed()) return;
                    const bool news = written_.bytes > durable_.bytes;
                    const auto due = lastFlush + hooks_.checkpointInterval;
                    if (news && std::chrono::steady_clock::now() >= due) break;
                    if (news)
                        changed_.wait_until(lock, due);
                    else
                        changed_.wait(lock);
                }
                mark = written_;
            }
            lastFlush = std::chrono::steady_clock::now();
            if (const int error = sink_.sync(); error != 0) {
                syncError_ = error;
                failed_.store(true, std::memory_order_relaxed);
                return;
            }
            const Checkpoint checkpoint{mark.candidate, limit_, 1};
            if (std::string reason = writeCheckpoint(checkpointPath_, checkpoint);
                !reason.empty()) {
                checkpointError_ = std::move(reason);
                failed_.store(true, std::memory_order_relaxed);
                return;
            }
            {
                std::lock_guard lock(mutex_);
                durable_ = mark;
            }
            if (hooks_.afterCheckpoint) hooks_.afterCheckpoint(checkpoint, mark.bytes);
        }
    }

    ResultsSink& sink_;
    const JobHooks& hooks_;
    const std::string checkpointPath_;
    const std::int64_t limit_;
    JobProgress* progress_;

    std::mutex mutex_;
    std::condition_variable changed_;
    Buffer buffers_[kBufferCount];
    std::deque<Buffer*> free_;
    std::deque<Buffer*> full_;
    bool producerDone_ = false;
    bool writerDone_ = false;
    std::atomic<bool> failed_{false};
    int writeError_ = 0;
    int syncError_ = 0;
    std::string checkpointError_;
    Mark written_;
    Mark durable_;
    std::thread writer_;
    std::thread checkpointer_;
};

// Sieves and formats turns [first, end) into the pipeline; returns the turn it stopped before.
std::int64_t produce(Pipeline& pipeline, WheelSieve& sieve, RecordFormatter& formatter,
                     std::int64_t& count, std::int64_t first, std::int64_t end, std::int64_t limit,
                     const StopSignal& stop, const JobHooks& hooks, JobProgress* progress,
                     Buffer* buffer, bool& stopped) {
    const std::int64_t segmentTurns = hooks.turnsPerBatch > 0 ? hooks.turnsPerBatch : kSegmentTurns;
    std::vector<std::uint8_t> segment(
        static_cast<std::size_t>(std::min(segmentTurns, std::max<std::int64_t>(end - first, 1))));
    char* const data = buffer->bytes.data();
    char* out = data + buffer->size;
    // Room for one whole turn of records before a buffer is handed over.
    const char* handOver = data + buffer->bytes.size() - 8 * RecordFormatter::kMaxRecord;
    char* base = data;
    std::int64_t turn = first;
    std::int64_t length = 1;  // the first batch is a single turn
    while (turn < end) {
        length = std::min(length, end - turn);
        if (progress) progress->candidate.store(turnStart(turn), std::memory_order_relaxed);
        sieve.sieveNext(segment.data(), static_cast<std::size_t>(length));
        if (turn + length == end) {
            // Candidates above the limit in the last turn are neither tested nor written.
            const std::int64_t last = turnStart(end - 1);
            for (int b = 0; b < 8; ++b)
                if (last + kTurnOffsets[b] > limit) segment[length - 1] |= std::uint8_t(1u << b);
        }
        for (std::int64_t j = 0; j < length; ++j) {
            if (out > handOver) {
                buffer->size = static_cast<std::size_t>(out - base);
                buffer->lastCandidate = turnStart(turn + j) - 4;
                buffer->primeCount = count;
                pipeline.hand(buffer);
                buffer = pipeline.take();
                base = out = buffer->bytes.data();
                handOver = base + buffer->bytes.size() - 8 * RecordFormatter::kMaxRecord;
            }
            unsigned primes = static_cast<std::uint8_t>(~segment[j]);
            const auto start = static_cast<std::uint64_t>(turnStart(turn + j));
            while (primes != 0) {
                out = formatter.put(out, start + kTurnOffsets[__builtin_ctz(primes)]);
                primes &= primes - 1;
                ++count;
            }
        }
        turn += length;
        length = segmentTurns;
        if (hooks.afterBatch) hooks.afterBatch(turn - first);
        if (pipeline.failed()) break;
        if (turn < end && stop.requested()) {
            stopped = true;
            break;
        }
    }
    buffer->size = static_cast<std::size_t>(out - base);
    buffer->lastCandidate = turnStart(turn) - 4;
    buffer->primeCount = count;
    pipeline.hand(buffer);
    return turn;
}

}  // namespace

JobResult runJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress) {
    return runJob(spec, stop, progress, JobHooks{});
}

JobResult runJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress,
                 const JobHooks& hooks) {
    JobResult result;
    result.limit = spec.limit;
    result.resultsPath = spec.folder + kResultsFileName;
    const std::string checkpointPath = spec.folder + kCheckpointFileName;
    const std::int64_t firstTurnStart = spec.append ? spec.firstTurn : 11;
    result.candidate = firstTurnStart - 4;
    result.primeCount = spec.append ? spec.primeCountBefore : 0;
    if (firstTurnStart < 11 || (firstTurnStart - 11) % 30 != 0) {
        result.error = "The job cannot start at " + std::to_string(firstTurnStart) +
                       ", which is not the start of a wheel turn.";
        return result;
    }
    const std::int64_t first = turnIndex(firstTurnStart);
    const std::int64_t end = std::max(first, spec.limit >= 11 ? turnIndex(spec.limit) + 1 : 0);

    std::optional<WheelSieve> sieve;
    try {
        sieve.emplace(first, spec.limit);
    } catch (const std::bad_alloc&) {
        result.error = "There is not enough memory to generate the primes up to " +
                       std::to_string(spec.limit) + ".";
        return result;
    }

    int openError = 0;
    std::unique_ptr<ResultsSink> sink =
        hooks.openResults ? hooks.openResults(result.resultsPath, spec.append, openError)
                          : openResultsFile(result.resultsPath, spec.append, openError);
    if (!sink) {
        // Nothing was touched: the checkpoint still describes the files as they are.
        result.error = fileCreateFailure(result.resultsPath, systemReason(openError));
        return result;
    }

    // A fresh file holds nothing yet; a continued one holds every prime before the first turn.
    const Mark start =
        spec.append ? Mark{0, firstTurnStart - 4, spec.primeCountBefore} : Mark{0, 0, 0};
    const std::size_t bufferBytes =
        hooks.bufferBytes > 0 ? std::max<std::size_t>(hooks.bufferBytes, 4096) : kBufferBytes;
    if (progress) {
        progress->candidate.store(firstTurnStart, std::memory_order_relaxed);
        progress->primeCount.store(start.primeCount, std::memory_order_relaxed);
    }

    std::int64_t count = start.primeCount;
    bool stopped = false;
    std::int64_t reached = first;
    {
        Pipeline pipeline(sink.operator*(), hooks, checkpointPath, spec.limit, bufferBytes, start,
                          progress);
        pipeline.start();
        Buffer* buffer = pipeline.take();
        RecordFormatter formatter(spec.append ? static_cast<std::uint64_t>(firstTurnStart - 4) : 0,
                                  static_cast<std::uint64_t>(count), spec.enumerated);
        if (!spec.append) {
            char* out = buffer->bytes.data();
            for (const std::uint64_t seed : {2, 3, 5, 7}) out = formatter.put(out, seed);
            count = 4;
            buffer->size = static_cast<std::size_t>(out - buffer->bytes.data());
            buffer->lastCandidate = 7;
            buffer->primeCount = count;
            pipeline.hand(buffer);
            buffer = pipeline.take();
        }
        buffer->size = 0;
        reached = produce(pipeline, *sieve, formatter, count, first, end, spec.limit, stop, hooks,
                          progress, buffer, stopped);
        pipeline.finish();

        const int failure =
            pipeline.writeError() != 0 ? pipeline.writeError() : pipeline.syncError();
        if (pipeline.failed()) {
            result.status = JobResult::Status::Failed;
            if (failure != 0) {
                result.error = fileWriteFailure(result.resultsPath, systemReason(failure));
            } else {
                result.error = fileWriteFailure(checkpointPath, pipeline.checkpointError());
            }
            // Drop a torn record so that the file holds whole turns only, then say where it ends.
            Mark onDisk = pipeline.written();
            if (const int cut = sink->truncate(onDisk.bytes); cut != 0) {
                onDisk = pipeline.durable();
                result.error.append(" The file ")
                    .append(result.resultsPath)
                    .append(" may end with an incomplete record: ")
                    .append(systemReason(cut))
                    .append(".");
            }
            sink->sync();
            sink->close();
            Checkpoint checkpoint{onDisk.candidate, spec.limit, 1};
            if (!spec.append && onDisk.bytes == 0) {
                // Not even the seed records are there: nothing can be continued.
                checkpoint = Checkpoint{11, spec.limit, 0};
            }
            result.candidate = checkpoint.candidate;
            result.primeCount = onDisk.primeCount;
            if (std::string reason = writeCheckpoint(checkpointPath, checkpoint);
                !reason.empty() && failure != 0) {
                result.error.append(" ").append(fileWriteFailure(checkpointPath, reason));
            }
            return result;
        }
    }

    result.primeCount = count;
    result.candidate = stopped ? turnStart(reached) - 4 : turnStart(end);
    result.status = stopped ? JobResult::Status::Stopped : JobResult::Status::Completed;
    int error = hooks.durable ? sink->sync() : 0;
    if (const int closing = sink->close(); error == 0) error = closing;
    if (error != 0) {
        // The system could not confirm the records: claim none past the last flush.
        result.status = JobResult::Status::Failed;
        result.error = fileWriteFailure(result.resultsPath, systemReason(error));
        return result;
    }
    const Checkpoint checkpoint{result.candidate, spec.limit, stopped ? 1 : 0};
    if (std::string reason = writeCheckpoint(checkpointPath, checkpoint); !reason.empty()) {
        result.status = JobResult::Status::Failed;
        result.error = fileWriteFailure(checkpointPath, reason);
    }
    if (progress) progress->primeCount.store(count, std::memory_order_relaxed);
    return result;
}

}  // namespace tarn
