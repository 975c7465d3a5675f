// The verdict message of the Test command: "Number" and the signed text of the number (which
// begins with a blank), then " is prime." or " is not prime.".
#pragma once

#include <cstdint>
#include <string>

namespace tarn {

// testVerdictMessage(7, true) is "Number 7 is prime.".
std::string testVerdictMessage(std::int64_t n, bool prime);

}  // namespace tarn
