// Wording of the resume's refusals; kept apart so that the window, the command line and the
// tests all show the same text.
#include "generation/resume_texts.hpp"

namespace tarn {
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

}  // namespace tarn
