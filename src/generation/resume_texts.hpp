// The texts that the resume and the start-up check show. The first two are the program's own
// fixed messages; the refusals name the file and what is wrong with it, so that the user can
// tell a damaged results file from a checkpoint that belongs to another job.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace tarn {

// Shown when the checkpoint's candidate lies above its limit (a job stopped in its last turn).
inline constexpr std::string_view kImpossibleToResumeMessage =
    "Impossible to resume! Some error must have ocuured. To Resume you must Cancel the "
    "Calculations.";

// Shown at start-up when the checkpoint records a job stopped below its limit.
inline constexpr std::string_view kInterruptedPrompt =
    "You've interrupted the calculations the last time you used the program. If you wish, you "
    "can continue by pressing Resume.";

// The information line while the resume reads the results file, then while it generates.
inline constexpr std::string_view kGatheringInfoLine = "INFO: Gathering information...";
inline constexpr std::string_view kDoingResumeInfoLine = "INFO: Doing resume...";

// Command-line notes.
inline constexpr std::string_view kNothingToResumeNote = "Nothing to resume.";

// Refusals of files that cannot be continued. Every one ends by saying that nothing changed.
// A checkpoint without its three numbers, then one that could not be read at all.
std::string unreadableCheckpointRefusal(const std::string& path);
std::string checkpointReadRefusal(const std::string& path, const std::string& reason);
std::string misalignedCheckpointRefusal(const std::string& path, std::int64_t resumePoint);
std::string limitOutOfRangeRefusal(const std::string& path, std::int64_t limit);
std::string unreadableResultsRefusal(const std::string& path, const std::string& reason);
// `problem` completes "the results file <path> ..." (for instance "holds no records").
std::string damagedResultsRefusal(const std::string& path, const std::string& problem);
std::string truncationFailure(const std::string& path, const std::string& reason);

}  // namespace tarn
