// The generation job: every prime from the job's first wheel turn up to its limit, appended to
// the results file as plain ("11") or enumerated ("5;11") records ending in CR LF, then the
// checkpoint. A fresh job writes the seed records 2, 3, 5, 7 first; a resumed job continues an
// existing file from a later turn with the serial numbers running on.
#pragma once

#include <atomic>
#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

#include "core/stop_signal.hpp"
#include "generation/checkpoint_file.hpp"
#include "generation/results_sink.hpp"

namespace tarn {

// What a running job shows; the window reads it a few times a second.
struct JobProgress {
    std::atomic<std::int64_t> candidate{0};   // start of the wheel turn in progress
    std::atomic<std::int64_t> primeCount{0};  // records written so far
};

struct JobSpec {
    std::string folder;        // with one trailing separator
    std::int64_t limit = 100;  // at least 100 for a fresh job
    bool enumerated = false;
    // Resume: append to the existing results file, starting with the turn at firstTurn
    // (a number 30k + 11), with primeCountBefore records already in the file.
    bool append = false;
    std::int64_t firstTurn = 11;
    std::int64_t primeCountBefore = 0;
    int threads = 0;  // sieving threads; 0: one per core
};

struct JobResult {
    enum class Status { Completed, Stopped, Failed };
    Status status = Status::Failed;
    // As written to the checkpoint: the next turn's start after a complete run, the last
    // candidate of the last complete turn (30k + 7) after a stop.
    std::int64_t candidate = 0;
    std::int64_t limit = 0;
    std::int64_t primeCount = 0;
    std::string resultsPath;
    std::string error;  // for Failed: the whole "Info" message, naming the file and the reason
};

JobResult runJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress = nullptr);

// Seams of the job for tests and measurements; the defaults are the real job.
struct JobHooks {
    // Opens the results file in place of openResultsFile (tests fail it at a chosen byte).
    std::function<std::unique_ptr<ResultsSink>(const std::string& path, bool append, int& error)>
        openResults;
    // Runs on a sieving thread after each batch of wheel turns, before the stop check, with the
    // count of turns from the job's first turn to the batch's end. The first batch is one turn.
    // Several threads may call it at once.
    std::function<void(std::int64_t turnsDone)> afterBatch;
    // Runs after each checkpoint rewritten during the job, with the results bytes it covers
    // (all of them flushed to the disk before the checkpoint was written).
    std::function<void(const Checkpoint& checkpoint, std::uint64_t durableBytes)> afterCheckpoint;
    // Writes the checkpoint in place of writeCheckpoint (tests fail it); same contract.
    std::function<std::string(const std::string& path, const Checkpoint& checkpoint)>
        writeCheckpoint;
    std::chrono::milliseconds checkpointInterval{2000};
    std::int64_t turnsPerBatch = 0;  // 0: sized for the first-level cache
    std::int64_t turnsPerChunk = 0;  // 0: eight batches; each chunk is one write
    // false: no flush to the disk and no checkpoint during the job (measures their cost).
    bool durable = true;
};

JobResult runJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress,
                 const JobHooks& hooks);

// "Done!!! The results were saved in the file <path>. 25 primes found up to number 100...
// Save the file to other location."
std::string completionReport(const JobResult& result);
// "INFO: 25 primes found up to number 100..."
std::string completionInfoLine(const JobResult& result);

}  // namespace tarn
