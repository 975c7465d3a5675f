// Every text of the windows that the designed forms do not hold: the status lines of the "Test
// Prime or Factorize" panel, the titles of the message boxes, the refusals of a second command,
// and the captions the code sets.
#pragma once

#include <string_view>

namespace tarn::ui {

inline constexpr std::string_view kStatusIdle = "Press Test or Factorize to Calculate...";
inline constexpr std::string_view kStatusWorking = "Working...";
inline constexpr std::string_view kStatusDone = "Done...";
inline constexpr std::string_view kStatusTestStopped = "Test stopped...";
inline constexpr std::string_view kStatusCalculationsStopped = "Calculations stopped...";

inline constexpr std::string_view kResultsTitle = "Results";
inline constexpr std::string_view kCommandTitle = "Command";
inline constexpr std::string_view kInfoTitle = "Info";

inline constexpr std::string_view kNumberCommandBusy =
    "A test or factorization is still running. Wait for its result, or stop it with "
    "\"Cancel all calculations\".";
inline constexpr std::string_view kJobBusy =
    "A calculation is already running. Stop it with \"Cancel all calculations\" first.";
inline constexpr std::string_view kSplitAlreadyRunningMessage =
    "A split is already running. Wait until it has finished, or press Cancel.";

inline constexpr std::string_view kMakerWebAddress = "https://brindle.example";
inline constexpr std::string_view kWebLinkCaption = "Click here: Visit Brindle at ";
// "Elapsed Time: 1:01:45", hours without a bound.
inline constexpr const char* kElapsedTimeFormat = "Elapsed Time: %lld:%02lld:%02lld";
inline constexpr std::string_view kSplitCancelCaption = "Cancel";
inline constexpr std::string_view kSplitCloseCaption = "Close";

}  // namespace tarn::ui
