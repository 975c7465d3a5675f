// What the read-back of a results file found, shared by the scan and its two checks.
#pragma once

#include <cstdint>
#include <string>

namespace tarn {

struct ResultsScan {
    enum class Outcome { Sound, Stopped, Unreadable, Damaged };
    Outcome outcome = Outcome::Unreadable;
    // Unreadable: the system's reason; Damaged: what is wrong, completing
    // "the results file <path> ..." (for instance "holds no records").
    std::string problem;
    std::int64_t records = 0;    // complete records at or below the candidate
    std::int64_t lastPrime = 0;  // the last of them
    bool enumerated = false;
    std::uint64_t keptBytes = 0;  // where those records end
    std::uint64_t fileBytes = 0;
};

}  // namespace tarn
