// The Test command's fixed answer for 2; every other verdict comes from testVerdictMessage
// (verdicts.hpp). The window and the command line both show it.
#pragma once

#include <string_view>

namespace tarn {

inline constexpr std::string_view kTwoIsPrimeMessage = "Number 2 is prime.";

}  // namespace tarn
