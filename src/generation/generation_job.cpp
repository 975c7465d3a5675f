// The generation job: the calling thread sieves a segment of wheel turns and formats its primes
// into large buffers, handing full buffers over at turn boundaries to the write pipeline (a
// writer and a checkpointer thread), so that the two cores and the disk work at once.
// The stop request is looked at after every segment (well under a millisecond of work), and a
// stop leaves the job at the end of a whole turn; the first segment is a single turn, so a stop
// asked before the job began ends it after the turn 11 to 37.
// Whatever fails, the job ends with every record that is surely in the file kept, anything that
// may be torn cut off, and a checkpoint that describes the file, so that a resume continues it.
#include "generation/generation_job.hpp"

#include <algorithm>
#include <new>
#include <optional>
#include <vector>

#include "core/exception_text.hpp"
#include "core/file_messages.hpp"
#include "generation/file_names.hpp"
#include "generation/record_formatter.hpp"
#include "generation/wheel_sieve.hpp"
#include "generation/write_pipeline.hpp"

namespace tarn {
namespace {

constexpr std::int64_t kSegmentTurns = 32 * 1024;  // 32 KiB of sieve: the first-level cache
constexpr std::size_t kBufferBytes = 4u << 20;     // one write(2) each
constexpr std::size_t kSmallestBuffer = 4096;      // room for a turn of the longest records

// Sieves wheel turns and formats their primes into the pipeline's buffers, handing a buffer over
// only at a turn boundary, with the candidate and record count its end stands for.
class RecordProducer {
public:
    RecordProducer(WritePipeline& pipeline, WheelSieve& sieve, RecordFormatter& formatter,
                   std::int64_t limit, std::int64_t count, const JobHooks& hooks,
                   JobProgress* progress)
        : pipeline_(pipeline),
          sieve_(sieve),
          formatter_(formatter),
          limit_(limit),
          count_(count),
          hooks_(hooks),
          progress_(progress) {
        open(pipeline_.take());
    }

    void putSeeds() {
        for (const std::uint64_t seed : {2, 3, 5, 7}) out_ = formatter_.put(out_, seed);
        count_ = 4;
        handOver(7);
        open(pipeline_.take());
    }

    // Turns [first, end); returns the turn it stopped before.
    std::int64_t run(std::int64_t first, std::int64_t end, const StopSignal& stop, bool& stopped) {
        const std::int64_t segmentTurns =
            hooks_.turnsPerBatch > 0 ? hooks_.turnsPerBatch : kSegmentTurns;
        std::vector<std::uint8_t> segment(static_cast<std::size_t>(
            std::min(segmentTurns, std::max<std::int64_t>(end - first, 1))));
        std::int64_t turn = first;
        std::int64_t length = 1;  // the first batch is a single turn
        while (turn < end) {
            length = std::min(length, end - turn);
            if (progress_) progress_->candidate.store(turnStart(turn), std::memory_order_relaxed);
            sieve_.sieveNext(segment.data(), static_cast<std::size_t>(length));
            if (turn + length == end) {
                // Candidates above the limit in the last turn are neither tested nor written.
                const std::int64_t last = turnStart(end - 1);
                for (int b = 0; b < 8; ++b)
                    if (last + kTurnOffsets[b] > limit_)
                        segment[length - 1] |= std::uint8_t(1u << b);
            }
            format(segment.data(), turn, length);
            turn += length;
            length = segmentTurns;
            if (hooks_.afterBatch) hooks_.afterBatch(turn - first);
            if (pipeline_.failed()) break;
            if (turn < end && stop.requested()) {
                stopped = true;
                break;
            }
        }
        handOver(turnStart(turn) - 4);
        return turn;
    }

    std::int64_t count() const { return count_; }

private:
    void format(const std::uint8_t* segment, std::int64_t turn, std::int64_t length) {
        for (std::int64_t j = 0; j < length; ++j) {
            if (out_ > full_) {
                handOver(turnStart(turn + j) - 4);
                open(pipeline_.take());
            }
            unsigned primes = static_cast<std::uint8_t>(~segment[j]);
            const auto start = static_cast<std::uint64_t>(turnStart(turn + j));
            while (primes != 0) {
                out_ = formatter_.put(out_, start + kTurnOffsets[__builtin_ctz(primes)]);
                primes &= primes - 1;
                ++count_;
            }
        }
    }

    void open(RecordBuffer* buffer) {
        buffer_ = buffer;
        out_ = buffer->bytes.data();
        // Room for one whole turn of records before the buffer is handed over.
        full_ = out_ + buffer->bytes.size() - 8 * RecordFormatter::kMaxRecord;
    }

    void handOver(std::int64_t lastCandidate) {
        buffer_->size = static_cast<std::size_t>(out_ - buffer_->bytes.data());
        buffer_->lastCandidate = lastCandidate;
        buffer_->primeCount = count_;
        pipeline_.hand(buffer_);
        buffer_ = nullptr;
    }

    WritePipeline& pipeline_;
    WheelSieve& sieve_;
    RecordFormatter& formatter_;
    const std::int64_t limit_;
    std::int64_t count_;
    const JobHooks& hooks_;
    JobProgress* progress_;
    RecordBuffer* buffer_ = nullptr;
    char* out_ = nullptr;
    const char* full_ = nullptr;
};

// The whole "Info" message for the first failure.
std::string failureMessage(const PipelineFailure& failure, const std::string& resultsPath,
                           const std::string& checkpointPath) {
    switch (failure.kind) {
        case PipelineFailure::Kind::Write:
        case PipelineFailure::Kind::Sync:
            return fileWriteFailure(resultsPath, systemReason(failure.error));
        case PipelineFailure::Kind::Checkpoint:
            return fileWriteFailure(checkpointPath, failure.reason);
        case PipelineFailure::Kind::Internal:
        case PipelineFailure::Kind::None:
            break;
    }
    return unexpectedFailure(failure.reason);
}

// After a failure: keeps `keep` (what is surely in the file), cuts anything after it, and writes
// the checkpoint that lets a resume continue from there. Falls back to what the last checkpoint
// during the job saw on the disk when the file cannot be cut or flushed.
JobResult recover(ResultsSink& sink, FileMark keep, FileMark durable, const JobSpec& spec,
                  const JobHooks& hooks, const PipelineFailure& failure, JobResult result) {
    const std::string checkpointPath = spec.folder + kCheckpointFileName;
    result.status = JobResult::Status::Failed;
    result.error = failureMessage(failure, result.resultsPath, checkpointPath);
    if (const int cut = sink.truncate(keep.bytes); cut != 0) {
        keep = durable;
        result.error.append(" The file ")
            .append(result.resultsPath)
            .append(" may end with an incomplete record: ")
            .append(systemReason(cut))
            .append(".");
    } else if (keep.bytes > durable.bytes && sink.sync() != 0) {
        keep = durable;
    }
    sink.close();
    // A fresh job without even its seed records on the disk has nothing to continue.
    const Checkpoint checkpoint = !spec.append && keep.primeCount == 0
                                      ? Checkpoint{11, spec.limit, 0}
                                      : Checkpoint{keep.candidate, spec.limit, 1};
    result.candidate = checkpoint.candidate;
    result.primeCount = keep.primeCount;
    if (std::string reason = saveCheckpoint(hooks, checkpointPath, checkpoint);
        !reason.empty() && failure.kind != PipelineFailure::Kind::Checkpoint) {
        result.error.append(" ").append(fileWriteFailure(checkpointPath, reason));
    }
    return result;
}

JobResult runGuardedJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress,
                        const JobHooks& hooks, JobResult& result) {
    const std::string checkpointPath = spec.folder + kCheckpointFileName;
    const std::int64_t firstTurnStart = spec.append ? spec.firstTurn : 11;
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

    // A fresh file holds nothing yet; a continued one every prime before the first turn.
    const FileMark start = spec.append
                               ? FileMark{sink->size(), firstTurnStart - 4, spec.primeCountBefore}
                               : FileMark{0, 0, 0};
    const std::size_t bufferBytes =
        hooks.bufferBytes > 0 ? std::max(hooks.bufferBytes, kSmallestBuffer) : kBufferBytes;
    if (progress) {
        progress->candidate.store(firstTurnStart, std::memory_order_relaxed);
        progress->primeCount.store(start.primeCount, std::memory_order_relaxed);
    }

    std::int64_t count = start.primeCount;
    bool stopped = false;
    std::int64_t reached = first;
    FileMark written, durable;
    {
        WritePipeline pipeline(*sink, hooks, checkpointPath, spec.limit, bufferBytes, start,
                               progress);
        try {
            pipeline.start();
            RecordFormatter formatter(
                spec.append ? static_cast<std::uint64_t>(firstTurnStart - 4) : 0,
                static_cast<std::uint64_t>(count), spec.enumerated);
            RecordProducer producer(pipeline, *sieve, formatter, spec.limit, count, hooks,
                                    progress);
            if (!spec.append) producer.putSeeds();
            reached = producer.run(first, end, stop, stopped);
            count = producer.count();
        } catch (...) {
            // The buffer being filled is dropped; what was handed over is written or not.
            pipeline.fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
        }
        pipeline.finish();
        written = pipeline.written();
        durable = pipeline.durable();
        if (pipeline.failed()) {
            const bool trusted = pipeline.failure().kind != PipelineFailure::Kind::Sync;
            return recover(*sink, trusted ? written : durable, durable, spec, hooks,
                           pipeline.failure(), result);
        }
    }

    if (const int error = hooks.durable ? sink->sync() : 0; error != 0) {
        // The system could not confirm the records: claim none past the last flush.
        return recover(*sink, durable, durable, spec, hooks,
                       {PipelineFailure::Kind::Sync, error, {}}, result);
    }
    // Past a good flush every record is on the disk, so the checkpoint may say so even when
    // closing reports an error.
    const int closing = sink->close();
    result.primeCount = count;
    result.candidate = stopped ? turnStart(reached) - 4 : turnStart(end);
    result.status = stopped ? JobResult::Status::Stopped : JobResult::Status::Completed;
    const Checkpoint checkpoint{result.candidate, spec.limit, stopped ? 1 : 0};
    if (std::string reason = saveCheckpoint(hooks, checkpointPath, checkpoint); !reason.empty()) {
        result.status = JobResult::Status::Failed;
        result.error = fileWriteFailure(checkpointPath, reason);
    } else if (closing != 0) {
        result.status = JobResult::Status::Failed;
        result.error = fileWriteFailure(result.resultsPath, systemReason(closing));
    }
    if (progress) progress->primeCount.store(count, std::memory_order_relaxed);
    return result;
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
    result.candidate = (spec.append ? spec.firstTurn : 11) - 4;
    result.primeCount = spec.append ? spec.primeCountBefore : 0;
    try {
        return runGuardedJob(spec, stop, progress, hooks, result);
    } catch (...) {
        result.status = JobResult::Status::Failed;
        result.error = unexpectedFailure(describeCurrentException());
        return result;
    }
}

}  // namespace tarn
