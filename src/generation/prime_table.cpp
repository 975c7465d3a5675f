#include "generation/prime_table.hpp"

#include <cmath>

namespace tarn {

PrimeTable::PrimeTable() : entries_{0, 3, 5, 7} {}

std::int64_t PrimeTable::RootBound(std::int64_t candidate) {
    return static_cast<std::int64_t>(std::sqrt(static_cast<double>(candidate))) + 1;
}

bool PrimeTable::appendFound(std::int64_t prime) {
    if (prime <= entries_.back() || entries_.back() >= TableCap) return false;
    entries_.push_back(static_cast<std::int32_t>(prime));
    return true;
}

int PrimeTable::TestPrime(std::int64_t candidate) {
    // Every candidate lies below 2^50, where the double quotient test of the original rule is
    // exactly integer divisibility; the integer remainder gives the same verdicts faster.
    int verdict = 1;
    if (candidate % 2 == 0) {
        verdict = 0;
    } else {
        const std::int64_t bound = RootBound(candidate);
        const std::size_t count = entries_.size();
        for (std::size_t i = 1; i < count; ++i) {
            const std::int64_t p = entries_[i];
            if (p > bound) break;
            if (candidate % p == 0) {
                verdict = 0;
                break;
            }
        }
    }
    if (verdict == 1) appendFound(candidate);
    return verdict;
}

}  // namespace tarn
