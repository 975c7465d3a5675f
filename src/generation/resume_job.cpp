// The resume itself only reads and checks; the generation job does the work. Nothing is written
// until every check has passed, so a refusal leaves both files as they were.
#include "generation/resume_job.hpp"

#include "core/entry.hpp"
#include "core/exception_text.hpp"
#include "core/file_names.hpp"
#include "core/texts.hpp"
#include "core/wheel.hpp"
#include "generation/checkpoint_file.hpp"
#include "generation/scan/results_scan.hpp"
#include "generation/texts.hpp"
#include "platform/files.hpp"

namespace tarn {
namespace {

ResumeResult refused(std::string message) {
    ResumeResult result;
    result.status = ResumeResult::Status::Refused;
    result.message = std::move(message);
    return result;
}

// A failure of the resume itself, before the job ran; `message` is the whole "Info" text.
ResumeResult failed(std::string message, const std::string& resultsPath) {
    ResumeResult result;
    result.status = ResumeResult::Status::Failed;
    result.message = std::move(message);
    result.job.status = JobResult::Status::Failed;
    result.job.error = result.message;
    result.job.resultsPath = resultsPath;
    return result;
}

// The files are as they were; the checkpoint still says where the job stands.
ResumeResult stoppedWhileGathering(const std::string& resultsPath, std::int64_t resumePoint,
                                   std::int64_t limit) {
    ResumeResult result;
    result.status = ResumeResult::Status::Stopped;
    result.job.status = JobResult::Status::Stopped;
    result.job.candidate = resumePoint;
    result.job.limit = limit;
    result.job.resultsPath = resultsPath;
    return result;
}

ResumeResult resume(const std::string& folder, const StopSignal& stop, JobProgress* progress,
                    const ResumeEvents& events, const JobOptions& options);

}  // namespace

ResumeResult runResume(const std::string& folder, const StopSignal& stop, JobProgress* progress,
                       const ResumeEvents& events, const JobOptions& options) {
    try {
        return resume(folder, stop, progress, events, options);
    } catch (...) {
        // Reading and checking change no file, and the job guards its own writes.
        return failed(unexpectedFailure(describeCurrentException()), resultsFilePath(folder));
    }
}

namespace {

ResumeResult resume(const std::string& folder, const StopSignal& stop, JobProgress* progress,
                    const ResumeEvents& events, const JobOptions& options) {
    const std::string checkpointPath = checkpointFilePath(folder);
    const std::string resultsPath = resultsFilePath(folder);

    const CheckpointRead read = readCheckpoint(checkpointPath);
    if (read.status == CheckpointRead::Status::Missing) return {};
    if (read.status == CheckpointRead::Status::Unreadable)
        return refused(checkpointReadRefusal(checkpointPath, systemReason(read.error)));
    const auto& checkpoint = read.checkpoint;
    if (!checkpoint) return refused(unreadableCheckpointRefusal(checkpointPath));
    if (checkpoint->interrupted != 1) return {};
    const std::int64_t resumePoint = checkpoint->candidate;
    const std::int64_t limit = checkpoint->limit;
    if (resumePoint > limit) return refused(std::string(kImpossibleToResumeMessage));
    // Stopped jobs leave the last candidate of a complete turn, 30k + 7 with k >= 0.
    if (resumePoint < kTurnEndResidue || resumePoint % kWheelPeriod != kTurnEndResidue)
        return refused(misalignedCheckpointRefusal(checkpointPath, resumePoint));
    if (limit > kUpperEntryWhole) return refused(limitOutOfRangeRefusal(checkpointPath, limit));

    if (events.onGathering) events.onGathering();
    const ResultsScan scan = scanResults(resultsPath, resumePoint, stop);
    switch (scan.outcome) {
        case ResultsScan::Outcome::Unreadable:
            return refused(unreadableResultsRefusal(resultsPath, scan.problem));
        case ResultsScan::Outcome::Damaged:
            return refused(damagedResultsRefusal(resultsPath, scan.problem));
        case ResultsScan::Outcome::Stopped:
            return stoppedWhileGathering(resultsPath, resumePoint, limit);
        case ResultsScan::Outcome::Sound:
            break;
    }
    // The last block may have been read after the stop: leave before anything is written.
    if (stop.requested()) return stoppedWhileGathering(resultsPath, resumePoint, limit);

    // Records past the checkpoint and a torn last line were written after the last checkpoint
    // of a killed job; the turns that wrote them run again.
    if (scan.keptBytes < scan.fileBytes) {
        if (const int error = platform::truncateFile(resultsPath, scan.keptBytes); error != 0)
            return failed(truncationFailure(resultsPath, systemReason(error)), resultsPath);
    }

    const ResumeStart start{limit, resumePoint, scan.records, scan.enumerated};
    if (events.onContinuing) events.onContinuing(start);

    JobSpec spec;
    spec.folder = folder;
    spec.limit = limit;
    spec.enumerated = scan.enumerated;
    spec.append = true;
    spec.firstTurn = resumePoint + kLastToNextTurn;
    spec.primeCountBefore = scan.records;

    ResumeResult result;
    result.job = runJob(spec, stop, progress, options);
    switch (result.job.status) {
        case JobResult::Status::Completed:
            result.status = ResumeResult::Status::Completed;
            break;
        case JobResult::Status::Stopped:
            result.status = ResumeResult::Status::Stopped;
            break;
        case JobResult::Status::Failed:
            result.status = ResumeResult::Status::Failed;
            result.message = result.job.error;
            break;
    }
    return result;
}

}  // namespace

}  // namespace tarn
