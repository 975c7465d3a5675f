// PrimeTable: the growing table of odd primes found so far, and TestPrime, the trial division of
// one candidate by the primes of the table. The table starts as 0, 3, 5, 7, grows by one entry at
// a time and never shrinks; it stops growing for good once its last entry has reached TableCap,
// when it holds every divisor that any number of the allowed range can need.
// TestPrime stops at the first prime above the candidate's root, so it costs about pi(sqrt n)
// integer remainders and allocates only when it appends.
#pragma once

#include <cstdint>
#include <vector>

namespace tarn {

class PrimeTable {
public:
    // The root bound of the largest allowed number, 922 337 203 685 277: the table grows only
    // while its last entry is below it, so its final entry is 30 370 013.
    static constexpr std::int32_t TableCap = 30370005;

    PrimeTable();

    // 1 when the candidate is prime, 0 when not. Callers pass odd candidates from 11 upward in
    // increasing order, so that the table holds every prime up to the candidate's root bound.
    // A prime above the last entry is appended while the last entry is below TableCap.
    int TestPrime(std::int64_t candidate);

    // Appends a prime by the same rule as TestPrime (above the last entry, last entry below
    // TableCap); used when the table is rebuilt from a results file. True when appended.
    bool appendFound(std::int64_t prime);

    // Index of the last entry (3 for a fresh table).
    std::int64_t upperBound() const { return static_cast<std::int64_t>(entries_.size()) - 1; }
    std::int32_t lastEntry() const { return entries_.back(); }
    const std::vector<std::int32_t>& entries() const { return entries_; }

    // The divisor bound of one test: the whole part of the double square root, plus one.
    static std::int64_t RootBound(std::int64_t candidate);

private:
    std::vector<std::int32_t> entries_;
};

}  // namespace tarn
