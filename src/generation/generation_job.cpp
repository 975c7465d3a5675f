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
#include "generation/record_formatter.hpp"
#include "generation/results_change.hpp"
#include "generation/write_pipeline.hpp"

namespace tarn {
namespace {

constexpr std::int64_t kSegmentTurns = 32 * 1024;  // 32 KiB of sieve: the first-level cache
constexpr std::int64_t kSeedCount = 4;             // 2, 3, 5 and 7 come before the first turn
constexpr std::int64_t kSegmentsPerChunk = 4;      // 2 to 5 MiB of records per write, at most
// Memory for the sieve and the buffers, whatever the core count.
constexpr std::uint64_t kSieveBudget = 56u << 20;
constexpr double kChunkRecordBytes = 40;               // per turn at most, from the first turns on
constexpr std::uint64_t kSieveThreadBytes = 2u << 20;  // a wheel sieve, blocks, stack, heap

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
SievingPool sievingPool(const JobSpec& spec, std::int64_t firstCandidate, const JobHooks& hooks,
                        std::int64_t segmentTurns) {
    const int cores =
        spec.threads > 0 ? spec.threads : static_cast<int>(std::thread::hardware_concurrency());
    const std::uint64_t shared = BucketSieve::bytesFor(spec.limit);
    const double perTurn = recordBytesPerTurn(firstCandidate, spec.limit, spec.enumerated);
    SievingPool pool;
    for (std::int64_t segments = kSegmentsPerChunk;; segments /= 2) {
        pool.chunkTurns = hooks.turnsPerChunk > 0 ? hooks.turnsPerChunk : segmentTurns * segments;
        const auto buffer =
            static_cast<std::uint64_t>(static_cast<double>(pool.chunkTurns) * perTurn);
        const std::uint64_t perThread =
            buffer + static_cast<std::uint64_t>(pool.chunkTurns) + kSieveThreadBytes;
        const std::uint64_t fixed = std::min(shared + 2 * buffer, kSieveBudget);
        const auto fits = static_cast<int>((kSieveBudget - fixed) / perThread);
        pool.threads = std::clamp(cores, 1, std::max(fits, 1));
        if (fits >= cores || segments == 1 || hooks.turnsPerChunk > 0) return pool;
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

// After a failure: keeps `keep` (what is surely in the file), cuts anything after it, and writes
// the checkpoint that lets a resume continue from there. Falls back to what the last checkpoint
// during the job saw on the disk when the file cannot be cut or flushed.
JobResult recover(ResultsSink& sink, FileMark keep, FileMark durable, const JobSpec& spec,
                  const JobHooks& hooks, const PipelineFailure& failure, JobResult result) {
    const std::string checkpointPath = checkpointFilePath(spec.folder);
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
                                      ? Checkpoint{kFirstTurnStart, spec.limit, 0}
                                      : Checkpoint{keep.candidate, spec.limit, 1};
    result.candidate = checkpoint.candidate;
    result.primeCount = keep.primeCount;
    if (std::string reason = saveCheckpoint(hooks, checkpointPath, checkpoint);
        !reason.empty() && failure.kind != PipelineFailure::Kind::Checkpoint) {
        result.error.append(" ").append(fileWriteFailure(checkpointPath, reason));
    }
    return result;
}

// The file at the path is not what the job wrote. Deleted or replaced, nothing there is the job's
// to touch or to continue. Cut or grown, the whole records among the bytes the sink vouches for
// are kept, and a resume continues after them.
JobResult recoverChanged(ResultsSink& sink, FileCheck seen, const JobSpec& spec,
                         const JobHooks& hooks, JobResult result) {
    const std::uint64_t written = sink.size();
    if (const FileCheck now = sink.check(); now.change != FileCheck::Change::None) seen = now;
    result.status = JobResult::Status::Failed;
    result.error = resultsChangeMessage(result.resultsPath, seen, written);
    Checkpoint checkpoint{kFirstTurnStart, spec.limit, 0};
    if (seen.change == FileCheck::Change::Resized) {
        if (const auto kept = keptRecords(result.resultsPath, seen.trusted, spec.limit)) {
            checkpoint = kept->checkpoint;
            if (const int cut = sink.truncate(kept->bytes); cut != 0)
                result.error.append(" ").append(
                    fileWriteFailure(result.resultsPath, systemReason(cut)));
        }
    }
    sink.close();
    result.candidate = checkpoint.candidate;
    const std::string checkpointPath = checkpointFilePath(spec.folder);
    if (std::string reason = saveCheckpoint(hooks, checkpointPath, checkpoint); !reason.empty())
        result.error.append(" ").append(fileWriteFailure(checkpointPath, reason));
    return result;
}

JobResult runGuardedJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress,
                        const JobHooks& hooks, JobResult& result) {
    const std::string checkpointPath = checkpointFilePath(spec.folder);
    const std::int64_t firstTurnStart = spec.append ? spec.firstTurn : kFirstTurnStart;
    if (firstTurnStart < kFirstTurnStart ||
        (firstTurnStart - kFirstTurnStart) % kWheelPeriod != 0) {
        result.error = "The job cannot start at " + std::to_string(firstTurnStart) +
                       ", which is not the start of a wheel turn.";
        return result;
    }
    const std::int64_t first = turnIndex(firstTurnStart);
    const std::int64_t end =
        std::max(first, spec.limit >= kFirstTurnStart ? turnIndex(spec.limit) + 1 : 0);

    ChunkPlan plan;
    plan.firstTurn = first;
    plan.endTurn = end;
    plan.limit = spec.limit;
    plan.recordsBefore = spec.append ? spec.primeCountBefore : kSeedCount;
    plan.firstSequence = spec.append ? 0 : 1;
    plan.enumerated = spec.enumerated;
    plan.segmentTurns = hooks.turnsPerBatch > 0 ? hooks.turnsPerBatch : kSegmentTurns;
    const SievingPool pool = sievingPool(spec, firstTurnStart, hooks, plan.segmentTurns);
    plan.chunkTurns = pool.chunkTurns;
    const int threads = pool.threads;
    // The large primes' buckets are built before any file is touched: at the top of the range
    // they are the job's largest piece of memory.
    std::optional<BucketSieve> large;
    try {
        large.emplace(first, end, spec.limit, plan.chunkTurns, threads);
    } catch (const std::bad_alloc&) {
        result.error = "There is not enough memory to generate the primes up to " +
                       std::to_string(spec.limit) + ".";
        return result;
    }

    // Before the file is emptied, a checkpoint with no job to continue: a kill from here on must
    // not leave an old one describing records that are gone.
    if (!spec.append) {
        const Checkpoint fresh{kFirstTurnStart, spec.limit, 0};
        if (std::string reason = saveCheckpoint(hooks, checkpointPath, fresh); !reason.empty()) {
            result.error = fileWriteFailure(checkpointPath, reason);
            return result;
        }
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
    const FileMark start = spec.append ? FileMark{sink->size(), firstTurnStart - kLastToNextTurn,
                                                  spec.primeCountBefore}
                                       : FileMark{0, 0, 0};
    if (progress) {
        progress->candidate.store(firstTurnStart, std::memory_order_relaxed);
        progress->primeCount.store(start.primeCount, std::memory_order_relaxed);
    }

    FileMark written, durable;
    {
        WritePipeline pipeline(*sink, hooks, checkpointPath, spec.limit, threads + 2, start,
                               progress);
        try {
            pipeline.start();
            if (!spec.append) handSeeds(pipeline, spec.enumerated);
            ChunkProducer producer(plan, pipeline, stop, hooks, progress);
            producer.start(threads, *large);
            producer.join();
        } catch (...) {
            // What was handed over is written or not; the rest is dropped.
            pipeline.fail({PipelineFailure::Kind::Internal, 0, describeCurrentException()});
        }
        pipeline.finish();
        written = pipeline.written();
        durable = pipeline.durable();
        if (pipeline.failed()) {
            if (pipeline.failure().kind == PipelineFailure::Kind::Changed)
                return recoverChanged(*sink, pipeline.failure().check, spec, hooks, result);
            const bool trusted = pipeline.failure().kind != PipelineFailure::Kind::Sync;
            return recover(*sink, trusted ? written : durable, durable, spec, hooks,
                           pipeline.failure(), result);
        }
    }
    // The file ends after the last whole turn written; short of the end, the job was stopped.
    const bool stopped = written.candidate + kLastToNextTurn < turnStart(end);

    if (const int error = hooks.durable ? sink->sync() : 0; error != 0) {
        // The system could not confirm the records: claim none past the last flush.
        return recover(*sink, durable, durable, spec, hooks,
                       {PipelineFailure::Kind::Sync, error, {}}, result);
    }
    if (const FileCheck check = sink->check();
        check.change != FileCheck::Change::None || check.error != 0)
        return recoverChanged(*sink, check, spec, hooks, result);
    // Past a good flush every record is on the disk, so the checkpoint may say so even when
    // closing reports an error.
    const int closing = sink->close();
    result.primeCount = written.primeCount;
    result.candidate = stopped ? written.candidate : turnStart(end);
    result.status = stopped ? JobResult::Status::Stopped : JobResult::Status::Completed;
    const Checkpoint checkpoint{result.candidate, spec.limit, stopped ? 1 : 0};
    if (std::string reason = saveCheckpoint(hooks, checkpointPath, checkpoint); !reason.empty()) {
        result.status = JobResult::Status::Failed;
        result.error = fileWriteFailure(checkpointPath, reason);
    } else if (closing != 0) {
        result.status = JobResult::Status::Failed;
        result.error = fileWriteFailure(result.resultsPath, systemReason(closing));
    }
    if (progress) progress->primeCount.store(written.primeCount, std::memory_order_relaxed);
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
    result.resultsPath = resultsFilePath(spec.folder);
    result.candidate = (spec.append ? spec.firstTurn : kFirstTurnStart) - kLastToNextTurn;
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
