// The resume of a stopped or killed generation job. It reads the checkpoint, checks the results
// file against it, cuts off whatever lies beyond the checkpoint, and hands over to the generation
// job in append mode, so that the records, serial numbers, progress, stop path, checkpoints and
// completion report are exactly those of a generation job. After any sequence of stops, kills
// and resumes the results file is byte for byte that of one uninterrupted job.
#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "core/stop_signal.hpp"
#include "generation/generation_job.hpp"

namespace tarn {

struct ResumeStart {
    std::int64_t limit;        // the checkpoint's limit, the job's limit
    std::int64_t resumePoint;  // the checkpoint's candidate; the first turn starts 4 above it
    std::int64_t primeCount;   // records kept in the results file
    bool enumerated;           // the form of those records
};

struct ResumeEvents {
    std::function<void()> onGathering;                     // the results file is being read
    std::function<void(const ResumeStart&)> onContinuing;  // the files agree; generation starts
};

struct ResumeResult {
    enum class Status { NothingToResume, Refused, Completed, Stopped, Failed };
    Status status = Status::NothingToResume;
    std::string message;  // Refused / Failed: the whole text of the "Info" message
    JobResult job;        // Completed / Stopped / Failed from the engine
};

// Called on a worker thread; the events are called from that thread. The caller clears `stop`
// before; a stop while the results file is read ends with Stopped and changes no file.
ResumeResult runResume(const std::string& folder, const StopSignal& stop, JobProgress* progress,
                       const ResumeEvents& events, const JobOptions& options = {});

}  // namespace tarn
