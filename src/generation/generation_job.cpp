// The generation job wires the sieving threads (chunk_producer) to the write pipeline (a writer
// and a checkpointer thread) over the results file, so that every core and the disk work at
// once. The stop request is looked at after every segment (well under a millisecond of work),
// and a stop leaves the job at the end of a whole turn; the first segment is a single turn, so a
// stop asked before the job began ends it after the turn 11 to 37.
// Whatever fails, the job ends with every record that is surely in the file kept, anything that
// may be torn cut off, and a checkpoint that describes the file, so that a resume continues it.
#include "generation/generation_job.hpp"

#include <algorithm>
#include <cmath>
#include <new>
#include <optional>
#include <thread>
#include <vector>

#include "core/exception_text.hpp"
#include "core/file_names.hpp"
#include "core/texts.hpp"
#include "core/wheel.hpp"
#include "generation/bucket_sieve.hpp"
#include "generation/chunk_producer.hpp"
#include "generation/config.hpp"
#include "generation/record_formatter.hpp"
#include "generation/results_change.hpp"
#include "generation/texts.hpp"
#include "generation/write_pipeline.hpp"

namespace tarn {
namespace {

constexpr std::int64_t kSeedCount = 4;  // 2, 3, 5 and 7 come before the first turn

// At most the record bytes a turn of the job takes: its first turns are the densest, and the
// count of primes in a chunk strays from the estimate by far less than the margin.
double recordBytesPerTurn(std::int64_t firstCandidate, std::int64_t limit, bool enumerated) {
    if (firstCandidate < 100'000'000) return kChunkRecordBytes;
    const double primesPerTurn =
        1.15 * kWheelPeriod / std::log(static_cast<double>(firstCandidate));
    const auto digits = static_cast<double>(std::to_string(limit).size());
    return primesPerTurn * (digits + 2 + (enumerated ? digits + 1 : 0));
}

struct SievingPool {
    int threads = 1;
    std::int64_t chunkTurns = 0;
};

// One sieving thread per core. The large primes' buckets are shared (about 30 MB at the top of
// the range); each thread fills a chunk buffer (two buffers more keep the writer busy) and keeps
// a chunk of sieve, its share of the buckets' partly filled blocks and a wheel sieve. Where the
// memory budget holds fewer threads than cores, chunks of fewer segments make the buffers
// smaller, down to one segment; past that, fewer threads.
SievingPool sievingPool(const JobSpec& spec, const JobOptions& options, std::int64_t firstCandidate,
                        std::int64_t segmentTurns) {
    const int cores = options.threads > 0 ? options.threads
                                          : static_cast<int>(std::thread::hardware_concurrency());
    const std::uint64_t shared = BucketSieve::bytesFor(spec.limit);
    const double perTurn = recordBytesPerTurn(firstCandidate, spec.limit, spec.enumerated);
    SievingPool pool;
    for (std::int64_t segments = kSegmentsPerChunk;; segments /= 2) {
        pool.chunkTurns =
            options.turnsPerChunk > 0 ? options.turnsPerChunk : segmentTurns * segments;
        const auto buffer =
            static_cast<std::uint64_t>(static_cast<double>(pool.chunkTurns) * perTurn);
        const std::uint64_t perThread =
            buffer + static_cast<std::uint64_t>(pool.chunkTurns) + kSieveThreadBytes;
        const std::uint64_t fixed = std::min(shared + 2 * buffer, kSieveBudget);
        const auto fits = static_cast<int>((kSieveBudget - fixed) / perThread);
        pool.threads = std::clamp(cores, 1, std::max(fits, 1));
        if (fits >= cores || segments == 1 || options.turnsPerChunk > 0) return pool;
    }
}

// A fresh file starts with the records of 2, 3, 5 and 7, which no turn holds.
void handSeeds(WritePipeline& pipeline, bool enumerated) {
    RecordBuffer* seeds = pipeline.take();
    if (!seeds) return;
    char* out = seeds->reserve(kSeedCount * RecordFormatter::kMaxRecord);
    RecordFormatter formatter(0, 0, enumerated);
    for (const std::uint64_t seed : {2, 3, 5, 7}) out = formatter.put(out, seed);
    seeds->size = static_cast<std::size_t>(out - seeds->data.get());
    seeds->sequence = 0;
    seeds->lastCandidate = 7;
    seeds->primeCount = kSeedCount;
    pipeline.hand(seeds);
}

// The whole "Info" message for the first failure.
std::string failureMessage(const PipelineFailure& failure, const std::string& resultsPath,
                           const std::string& checkpointPath) {
    switch (failure.kind) {
        case PipelineFailure::Kind::Write:
        case PipelineFailure::Kind::Sync:
            return fileWriteFailure(resultsPath, systemReason(failure.error));
        case PipelineFailure::Kind::Checkpoint:
            return fileWriteFailure(checkpointPath, failure.reason);
        case PipelineFailure::Kind::Changed:
        case PipelineFailure::Kind::Internal:
        case PipelineFailure::Kind::None:
            break;
    }
    return unexpectedFailure(failure.reason);
}

JobFiles& realFiles() {
    static JobFiles files;
    return files;
}

// One run of the job: prepare (the plan, the memory, the checkpoint before the file is touched,
// the file), run (the sieving threads and the write pipeline), finish (the last flush, the
// checkpoint and the outcome), or a recovery after a failure.
class JobRun {
public:
    JobRun(const JobSpec& spec, const JobOptions& options, JobResult& result)
        : spec_(spec),
          options_(options),
          files_(options.files ? *options.files : realFiles()),
          checkpointPath_(checkpointFilePath(spec.folder)),
          result_(result) {}

    void run(const StopSignal& stop, JobProgress* progress) {
        if (!prepare()) return;
        // A fresh file holds nothing yet; a continued one every prime before the first turn.
        const FileMark start =
            spec_.append
                ? FileMark{sink_->size(), spec_.firstTurn - kLastToNextTurn, spec_.primeCountBefore}
                : FileMark{0, 0, 0};
        if (progress) {
            progress->candidate.store(turnStart(plan_.firstTurn), std::memory_order_relaxed);
            progress->primeCount.store(start.primeCount, std::memory_order_relaxed);
        }
        FileMark written, durable;
        {
            WritePipeline pipeline(*sink_, files_,
                                   {checkpointPath_, spec_.limit, options_.checkpointInterval},
                                   threads_ + 2, start, progress);
            try {
                pipeline.start();
                if (!spec_.append) handSeeds(pipeline, spec_.enumerated);
                ChunkProducer producer(plan_, pipeline, stop, progress);
                producer.start(threads_, *large_);
                producer.join();
            } catch (...) {
                // What was handed over is written or not; the rest is dropped.
                pipeline.fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
            }
            pipeline.finish();
            written = pipeline.written();
            durable = pipeline.durable();
            if (pipeline.failed()) {
                const PipelineFailure& failure = pipeline.failure();
                if (failure.kind == PipelineFailure::Kind::Changed)
                    return recoverChanged(failure.check);
                const bool trusted = failure.kind != PipelineFailure::Kind::Sync;
                return recover(trusted ? written : durable, durable, failure);
            }
        }
        if (finish(written, durable) && progress)
            progress->primeCount.store(written.primeCount, std::memory_order_relaxed);
    }

private:
    // Plans the turns and threads, makes the large primes' buckets and opens the file; false
    // with the error in the result when the job cannot start.
    bool prepare() {
        const std::int64_t firstTurnStart = spec_.append ? spec_.firstTurn : kFirstTurnStart;
        if (firstTurnStart < kFirstTurnStart ||
            (firstTurnStart - kFirstTurnStart) % kWheelPeriod != 0) {
            result_.error = misplacedStartFailure(firstTurnStart);
            return false;
        }
        plan_.firstTurn = turnIndex(firstTurnStart);
        plan_.endTurn = std::max(plan_.firstTurn,
                                 spec_.limit >= kFirstTurnStart ? turnIndex(spec_.limit) + 1 : 0);
        plan_.limit = spec_.limit;
        plan_.recordsBefore = spec_.append ? spec_.primeCountBefore : kSeedCount;
        plan_.firstSequence = spec_.append ? 0 : 1;
        plan_.enumerated = spec_.enumerated;
        plan_.segmentTurns = options_.turnsPerBatch > 0 ? options_.turnsPerBatch : kSegmentTurns;
        const SievingPool pool = sievingPool(spec_, options_, firstTurnStart, plan_.segmentTurns);
        plan_.chunkTurns = pool.chunkTurns;
        threads_ = pool.threads;
        // The large primes' buckets are built before any file is touched: at the top of the
        // range they are the job's largest piece of memory.
        try {
            large_.emplace(plan_.firstTurn, plan_.endTurn, spec_.limit, plan_.chunkTurns, threads_);
        } catch (const std::bad_alloc&) {
            result_.error = memoryFailure(spec_.limit);
            return false;
        }
        // Before the file is emptied, a checkpoint with no job to continue: a kill from here on
        // must not leave an old one describing records that are gone.
        if (!spec_.append) {
            const Checkpoint fresh{kFirstTurnStart, spec_.limit, 0};
            if (std::string reason = files_.saveCheckpoint(checkpointPath_, fresh);
                !reason.empty()) {
                result_.error = fileWriteFailure(checkpointPath_, reason);
                return false;
            }
        }
        int openError = 0;
        sink_ = files_.openResults(result_.resultsPath, spec_.append, openError);
        // Nothing was touched: the checkpoint still describes the files as they are.
        if (!sink_) result_.error = fileCreateFailure(result_.resultsPath, systemReason(openError));
        return sink_ != nullptr;
    }

    // The last flush, the look at the file and the checkpoint of the outcome; false when the
    // file failed the job and a recovery ran instead.
    bool finish(FileMark written, FileMark durable) {
        // The file ends after the last whole turn written; short of the end, the job was stopped.
        const bool stopped = written.candidate + kLastToNextTurn < turnStart(plan_.endTurn);
        if (const int error = sink_->sync(); error != 0) {
            // The system could not confirm the records: claim none past the last flush.
            recover(durable, durable, {PipelineFailure::Kind::Sync, error, {}});
            return false;
        }
        if (const FileCheck check = sink_->check();
            check.change != FileCheck::Change::None || check.error != 0) {
            recoverChanged(check);
            return false;
        }
        // Past a good flush every record is on the disk, so the checkpoint may say so even when
        // closing reports an error.
        const int closing = sink_->close();
        result_.primeCount = written.primeCount;
        result_.candidate = stopped ? written.candidate : turnStart(plan_.endTurn);
        result_.status = stopped ? JobResult::Status::Stopped : JobResult::Status::Completed;
        const Checkpoint checkpoint{result_.candidate, spec_.limit, stopped ? 1 : 0};
        if (std::string reason = files_.saveCheckpoint(checkpointPath_, checkpoint);
            !reason.empty()) {
            result_.status = JobResult::Status::Failed;
            result_.error = fileWriteFailure(checkpointPath_, reason);
        } else if (closing != 0) {
            result_.status = JobResult::Status::Failed;
            result_.error = fileWriteFailure(result_.resultsPath, systemReason(closing));
        }
        return true;
    }

    // After a failure: keeps `keep` (what is surely in the file), cuts anything after it, and
    // writes the checkpoint that lets a resume continue from there. Falls back to what the last
    // checkpoint during the job saw on the disk when the file cannot be cut or flushed.
    void recover(FileMark keep, FileMark durable, const PipelineFailure& failure) {
        result_.status = JobResult::Status::Failed;
        result_.error = failureMessage(failure, result_.resultsPath, checkpointPath_);
        if (const int cut = sink_->truncate(keep.bytes); cut != 0) {
            keep = durable;
            result_.error.append(" The file ")
                .append(result_.resultsPath)
                .append(" may end with an incomplete record: ")
                .append(systemReason(cut))
                .append(".");
        } else if (keep.bytes > durable.bytes && sink_->sync() != 0) {
            keep = durable;
        }
        sink_->close();
        // A fresh job without even its seed records on the disk has nothing to continue.
        const Checkpoint checkpoint = !spec_.append && keep.primeCount == 0
                                          ? Checkpoint{kFirstTurnStart, spec_.limit, 0}
                                          : Checkpoint{keep.candidate, spec_.limit, 1};
        result_.candidate = checkpoint.candidate;
        result_.primeCount = keep.primeCount;
        if (std::string reason = files_.saveCheckpoint(checkpointPath_, checkpoint);
            !reason.empty() && failure.kind != PipelineFailure::Kind::Checkpoint) {
            result_.error.append(" ").append(fileWriteFailure(checkpointPath_, reason));
        }
    }

    // The file at the path is not what the job wrote. Deleted or replaced, nothing there is the
    // job's to touch or to continue. Cut or grown, the whole records among the bytes the sink
    // vouches for are kept, and a resume continues after them.
    void recoverChanged(FileCheck seen) {
        const std::uint64_t written = sink_->size();
        if (const FileCheck now = sink_->check(); now.change != FileCheck::Change::None) seen = now;
        result_.status = JobResult::Status::Failed;
        result_.error = resultsChangeMessage(result_.resultsPath, seen, written);
        Checkpoint checkpoint{kFirstTurnStart, spec_.limit, 0};
        if (seen.change == FileCheck::Change::Resized) {
            if (const auto kept = keptRecords(result_.resultsPath, seen.trusted, spec_.limit)) {
                checkpoint = kept->checkpoint;
                if (const int cut = sink_->truncate(kept->bytes); cut != 0)
                    result_.error.append(" ").append(
                        fileWriteFailure(result_.resultsPath, systemReason(cut)));
            }
        }
        sink_->close();
        result_.candidate = checkpoint.candidate;
        if (std::string reason = files_.saveCheckpoint(checkpointPath_, checkpoint);
            !reason.empty())
            result_.error.append(" ").append(fileWriteFailure(checkpointPath_, reason));
    }

    const JobSpec& spec_;
    const JobOptions& options_;
    JobFiles& files_;
    const std::string checkpointPath_;
    JobResult& result_;
    ChunkPlan plan_;
    int threads_ = 1;
    std::optional<BucketSieve> large_;
    std::unique_ptr<ResultsSink> sink_;
};

}  // namespace

JobResult runJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress,
                 const JobOptions& options) {
    JobResult result;
    result.limit = spec.limit;
    result.resultsPath = resultsFilePath(spec.folder);
    result.candidate = (spec.append ? spec.firstTurn : kFirstTurnStart) - kLastToNextTurn;
    result.primeCount = spec.append ? spec.primeCountBefore : 0;
    try {
        JobRun(spec, options, result).run(stop, progress);
    } catch (...) {
        result.status = JobResult::Status::Failed;
        result.error = unexpectedFailure(describeCurrentException());
    }
    return result;
}

}  // namespace tarn
