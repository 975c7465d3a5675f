// The odd primes below kTrialLimit with what a divisibility test by multiplication needs:
// for odd p, n is a multiple of p exactly when n * p^-1 (mod 2^64) <= (2^64 - 1) / p.
// That replaces the divider by one multiply and one compare; the table is built at compile time.
#pragma once

#include <array>
#include <cstdint>

#include "core/montgomery.hpp"

namespace tarn {

// Division by these primes is cheaper than a rho walk for the small factors that most numbers
// have; what is left has no factor below 2048, so a cofactor below 2048^2 is prime outright.
inline constexpr std::uint32_t kTrialLimit = 2048;

struct TrialPrime {
    std::uint64_t prime;
    std::uint64_t inverse;  // prime^-1 mod 2^64
    std::uint64_t limit;    // (2^64 - 1) / prime
};

namespace detail {

// Which numbers below kTrialLimit are composite, by a sieve of Eratosthenes.
constexpr std::array<bool, kTrialLimit> compositesBelowTrialLimit() {
    std::array<bool, kTrialLimit> composite{};
    for (std::uint32_t p = 2; p * p < kTrialLimit; ++p) {
        if (composite[p]) continue;
        for (std::uint32_t m = p * p; m < kTrialLimit; m += p) composite[m] = true;
    }
    return composite;
}
inline constexpr auto kCompositeBelowTrialLimit = compositesBelowTrialLimit();

constexpr std::size_t countOddPrimes() {
    std::size_t count = 0;
    for (std::uint32_t n = 3; n < kTrialLimit; n += 2)
        count += kCompositeBelowTrialLimit[n] ? 0 : 1;
    return count;
}

constexpr auto makeTrialPrimes() {
    std::array<TrialPrime, countOddPrimes()> table{};
    std::size_t i = 0;
    for (std::uint32_t n = 3; n < kTrialLimit; n += 2) {
        if (kCompositeBelowTrialLimit[n]) continue;
        table[i++] = {n, inverseMod2_64(n), ~std::uint64_t{0} / n};
    }
    return table;
}

}  // namespace detail

inline constexpr auto kTrialPrimes = detail::makeTrialPrimes();

inline bool dividesExactly(std::uint64_t n, const TrialPrime& p) {
    return n * p.inverse <= p.limit;
}

}  // namespace tarn
