// Every text the generation layer shows, word for word: the job's lower bound, its reports and
// failures, the resume's notes and refusals. Kept in one place so that the window, the command
// line and the tests show the same words.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "generation/results_sink.hpp"

namespace tarn {

inline constexpr std::int64_t kGenerationMinimum = 100;
inline constexpr std::string_view kMinimumMessage = "Minimum value is 100";
// Told when the user stops a job (or the Test command, which shares the window's stop).
inline constexpr std::string_view kAllStoppedMessage = "All calculations were stopped!";

struct JobResult;
// "Done!!! The results were saved in the file <path>. 25 primes found up to number 100...
// Save the file to other location."
std::string completionReport(const JobResult& result);
// "INFO: 25 primes found up to number 100..."
std::string completionInfoLine(const JobResult& result);
// A job that cannot begin: its first turn is misplaced, or its sieve does not fit in memory.
std::string misplacedStartFailure(std::int64_t firstTurnStart);
std::string memoryFailure(std::int64_t limit);
// "The file <path> was deleted while the job was writing it. ..." and the like; `written` is
// what the job had written when it looked.
std::string resultsChangeMessage(const std::string& path, const FileCheck& check,
                                 std::uint64_t written);

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
