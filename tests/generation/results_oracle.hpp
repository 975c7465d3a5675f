// An independent picture of what a generation job leaves behind: a plain sieve of Eratosthenes,
// the results file of every prime up to a bound in either form, and the checkpoint line spelled
// out by hand. Tests craft stopped jobs with it and compare finished files byte for byte.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <string>

#include "support/plain_sieve.hpp"

namespace tarn::test {

inline std::int64_t primeCount(std::int64_t upTo) {
    return static_cast<std::int64_t>(plainSegment(0, upTo).size());
}

// The records of a job that has written every prime up to `upTo` (its limit, or its stop).
inline std::string oracleResults(std::int64_t upTo, bool enumerated) {
    std::string text;
    std::int64_t serial = 0;
    for (const std::int64_t p : plainSegment(0, upTo)) {
        if (enumerated) text += std::to_string(++serial) + ";";
        text += std::to_string(p) + "\r\n";
    }
    return text;
}

// For non-negative fields only; tests spell out other lines in full.
inline std::string oracleCheckpoint(std::int64_t candidate, std::int64_t limit, int interrupted) {
    std::string line;
    for (const std::int64_t field : {candidate, limit, std::int64_t{interrupted}})
        line.append(" ").append(std::to_string(field)).append(" ");
    return line + "\r\n";
}

// A job that ran to its end leaves as candidate the first turn start (30k + 11) above its limit.
inline std::string completeCheckpoint(std::int64_t limit) {
    return oracleCheckpoint(limit - (limit - 11) % 30 + 30, limit, 0);
}

// Equal texts, or a short account of where they part: gtest's own line diff of two files this
// large would take memory quadratic in their line counts.
inline testing::AssertionResult sameText(const std::string& got, const std::string& expected) {
    if (got == expected) return testing::AssertionSuccess();
    return testing::AssertionFailure()
           << got.size() << " bytes instead of " << expected.size() << ", parting at byte "
           << std::mismatch(got.begin(), got.end(), expected.begin(), expected.end()).first -
                  got.begin();
}

}  // namespace tarn::test
