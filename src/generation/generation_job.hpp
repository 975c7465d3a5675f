// The generation job: every prime from the job's first wheel turn up to its limit, appended to
// the results file as plain ("11") or enumerated ("5;11") records ending in CR LF, then the
// checkpoint. A fresh job writes the seed records 2, 3, 5, 7 first; a resumed job continues an
// existing file from a later turn with the serial numbers running on.
#pragma once

#include <chrono>
#include <cstdint>
#include <string>

#include "core/stop_signal.hpp"
#include "generation/config.hpp"
#include "generation/job_files.hpp"
#include "generation/job_progress.hpp"

namespace tarn {

struct JobSpec {
    std::string folder;        // with one trailing separator
    std::int64_t limit = 100;  // at least 100 for a fresh job
    bool enumerated = false;
    // Resume: append to the existing results file, starting with the turn at firstTurn
    // (a number 30k + 11), with primeCountBefore records already in the file.
    bool append = false;
    std::int64_t firstTurn = 11;
    std::int64_t primeCountBefore = 0;
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

// How a job runs; the defaults are the real job's. Tests make the pieces small, so that stops and
// failures land among many of them, and stand in for the files.
struct JobOptions {
    int threads = 0;  // sieving threads; 0: one per core
    std::chrono::milliseconds checkpointInterval = kCheckpointInterval;
    std::int64_t turnsPerBatch = 0;  // 0: kSegmentTurns; the job's first batch is one turn
    std::int64_t turnsPerChunk = 0;  // 0: kSegmentsPerChunk batches; each chunk is one write
    JobFiles* files = nullptr;       // nullptr: the real results and checkpoint files
};

JobResult runJob(const JobSpec& spec, const StopSignal& stop, JobProgress* progress = nullptr,
                 const JobOptions& options = {});

}  // namespace tarn
