// The window's status lines of the "Test Prime or Factorize" panel and the titles of its messages.
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

}  // namespace tarn::ui
