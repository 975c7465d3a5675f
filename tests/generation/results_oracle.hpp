// An independent picture of what a generation job leaves behind: a plain sieve of Eratosthenes,
// the records of every prime up to a bound in either form, and checkpoint lines spelled out by
// hand. Tests craft stopped jobs with it and compare finished files byte for byte.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace tarn::test {

inline std::vector<std::int64_t> sievePrimes(std::int64_t upTo) {
    std::vector<bool> composite(static_cast<std::size_t>(upTo + 1), false);
    std::vector<std::int64_t> primes;
    for (std::int64_t n = 2; n <= upTo; ++n) {
        if (composite[n]) continue;
        primes.push_back(n);
        for (std::int64_t m = n * n; m <= upTo; m += n) composite[m] = true;
    }
    return primes;
}

// The results file of a job that has written every prime up to `upTo`.
inline std::string oracleResults(std::int64_t upTo, bool enumerated) {
    std::string text;
    std::int64_t serial = 0;
    for (const std::int64_t p : sievePrimes(upTo)) {
        ++serial;
        if (enumerated) text += std::to_string(serial) + ";";
        text += std::to_string(p) + "\r\n";
    }
    return text;
}

inline std::string oracleCheckpoint(std::int64_t candidate, std::int64_t limit, int interrupted) {
    std::string line;
    for (const std::int64_t v : {candidate, limit, std::int64_t{interrupted}}) {
        if (v >= 0) line += ' ';
        line += std::to_string(v);
        line += ' ';
    }
    line += "\r\n";
    return line;
}

// Where a job that ran to its end leaves its candidate: the first turn start above the limit.
inline std::int64_t nextTurnAbove(std::int64_t limit) {
    std::int64_t s = 11;
    while (s <= limit) s += 30;
    return s;
}

}  // namespace tarn::test
