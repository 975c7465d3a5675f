// An independent oracle for the generation tests: a plain byte-per-number sieve, and the results
// file such a job must leave, built record by record with ordinary string formatting.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace tarn::test {

inline std::vector<std::int64_t> primesUpTo(std::int64_t n) {
    std::vector<char> composite(static_cast<std::size_t>(n + 1), 0);
    std::vector<std::int64_t> primes;
    for (std::int64_t i = 2; i <= n; ++i) {
        if (composite[i]) continue;
        primes.push_back(i);
        for (std::int64_t j = i * i; j <= n; j += i) composite[j] = 1;
    }
    return primes;
}

// The records of every prime up to `upTo`, in the plain or the enumerated form.
inline std::string expectedResults(const std::vector<std::int64_t>& primes, std::int64_t upTo,
                                   bool enumerated) {
    std::string text;
    std::int64_t serial = 0;
    for (const std::int64_t p : primes) {
        if (p > upTo) break;
        ++serial;
        if (enumerated) text += std::to_string(serial) + ";";
        text += std::to_string(p) + "\r\n";
    }
    return text;
}

inline std::int64_t countUpTo(const std::vector<std::int64_t>& primes, std::int64_t upTo) {
    std::int64_t n = 0;
    for (const std::int64_t p : primes) n += p <= upTo;
    return n;
}

// The start of the first wheel turn above the limit: the checkpoint of a complete run.
inline std::int64_t nextTurnAbove(std::int64_t limit) {
    std::int64_t start = 11;
    while (start <= limit) start += 30;
    return start;
}

}  // namespace tarn::test
