// The texts of the Test, Factorize and stop commands: status lines, messages and their titles.
// The window and the command line both show them, so they live in one place.
#pragma once

#include <string_view>

namespace tarn {

// Status line of the "Test Prime or Factorize" panel.
inline constexpr std::string_view kStatusIdle = "Press Test or Factorize to Calculate...";
inline constexpr std::string_view kStatusWorking = "Working...";
inline constexpr std::string_view kStatusDone = "Done...";
inline constexpr std::string_view kStatusTestStopped = "Test stopped...";
inline constexpr std::string_view kStatusCalculationsStopped = "Calculations stopped...";

// Messages and their titles.
inline constexpr std::string_view kTwoIsPrimeMessage = "Number 2 is prime.";
inline constexpr std::string_view kAllStoppedMessage = "All calculations were stopped!";
inline constexpr std::string_view kResultsTitle = "Results";
inline constexpr std::string_view kCommandTitle = "Command";
inline constexpr std::string_view kInfoTitle = "Info";

}  // namespace tarn
