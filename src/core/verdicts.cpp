#include "core/verdicts.hpp"

#include "core/number.hpp"

namespace tarn {

std::string testVerdictMessage(std::int64_t n, bool prime) {
    return "Number" + signedText(Number::fromWhole(n)) + (prime ? " is prime." : " is not prime.");
}

}  // namespace tarn
