#include "generation/texts.hpp"

#include <algorithm>

#include "core/texts.hpp"
#include "generation/generation_job.hpp"

namespace tarn {

namespace {
// After a complete run the candidate stands above the limit; the report names the limit.
std::int64_t reportedBound(const JobResult& r) { return std::min(r.candidate, r.limit); }
}  // namespace

std::string completionReport(const JobResult& r) {
    return "Done!!! The results were saved in the file " + r.resultsPath + ". " +
           std::to_string(r.primeCount) + " primes found up to number " +
           std::to_string(reportedBound(r)) + "... Save the file to other location.";
}

std::string completionInfoLine(const JobResult& r) {
    return "INFO: " + std::to_string(r.primeCount) + " primes found up to number " +
           std::to_string(reportedBound(r)) + "...";
}

std::string misplacedStartFailure(std::int64_t firstTurnStart) {
    return "The job cannot start at " + std::to_string(firstTurnStart) +
           ", which is not the start of a wheel turn.";
}

std::string memoryFailure(std::int64_t limit) {
    return "There is not enough memory to generate the primes up to " + std::to_string(limit) + ".";
}
namespace {
constexpr std::string_view kNothingChanged = " Nothing was changed.";
}

std::string unreadableCheckpointRefusal(const std::string& path) {
    return "Impossible to resume: the checkpoint file " + path +
           " does not hold three readable numbers." + std::string(kNothingChanged);
}

std::string checkpointReadRefusal(const std::string& path, const std::string& reason) {
    return "Impossible to resume: the checkpoint file " + path + " cannot be read (" + reason +
           ")." + std::string(kNothingChanged);
}

std::string misalignedCheckpointRefusal(const std::string& path, std::int64_t resumePoint) {
    return "Impossible to resume: the checkpoint file " + path + " names " +
           std::to_string(resumePoint) +
           " as the last candidate of a wheel turn, but that is not a number of the form "
           "30k + 7." +
           std::string(kNothingChanged);
}

std::string limitOutOfRangeRefusal(const std::string& path, std::int64_t limit) {
    return "Impossible to resume: the checkpoint file " + path + " holds the limit " +
           std::to_string(limit) + ", which is above 922337203685277." +
           std::string(kNothingChanged);
}

std::string unreadableResultsRefusal(const std::string& path, const std::string& reason) {
    return "Impossible to resume: the results file " + path + " cannot be read (" + reason + ")." +
           std::string(kNothingChanged);
}

std::string damagedResultsRefusal(const std::string& path, const std::string& problem) {
    return "Impossible to resume: the results file " + path + " " + problem + "." +
           std::string(kNothingChanged);
}

std::string truncationFailure(const std::string& path, const std::string& reason) {
    return "Impossible to resume: the results file " + path +
           " cannot be cut back to its last complete record (" + reason + ").";
}

std::string resultsChangeMessage(const std::string& path, const FileCheck& check,
                                 std::uint64_t written) {
    const std::string file = "The file " + path;
    switch (check.change) {
        case FileCheck::Change::Gone:
            return file + " was deleted while the job was writing it. The job stopped; generate " +
                   "the primes again.";
        case FileCheck::Change::Replaced:
            return file + " was replaced by another file while the job was writing it. The job " +
                   "stopped; generate the primes again.";
        case FileCheck::Change::Resized:
            return file + " holds " + std::to_string(check.bytes) + " bytes, but the job had " +
                   "written " + std::to_string(written) + ": it was cut or changed while the " +
                   "job was writing it. The job stopped and kept the records it could vouch for.";
        case FileCheck::Change::None:
            break;
    }
    return fileReadFailure(path, systemReason(check.error));
}

}  // namespace tarn
