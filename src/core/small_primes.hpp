// The odd primes below kTrialLimit with what a divisibility test by multiplication needs:
// for odd p, n is a multiple of p exactly when n * p^-1 (mod 2^64) <= (2^64 - 1) / p.
// That replaces the divider by one multiply and one compare; the table is built at compile time.
#pragma once

#include <array>
#include <cstdint>

namespace tarn {

inline constexpr std::uint32_t kTrialLimit = 2048;

struct TrialPrime {
    std::uint64_t prime;
    std::uint64_t inverse;  // prime^-1 mod 2^64
    std::uint64_t limit;    // (2^64 - 1) / prime
};

namespace detail {

constexpr bool isSmallPrime(std::uint32_t n) {
    if (n < 2) return false;
    for (std::uint32_t d = 2; d * d <= n; ++d) {
        if (n % d == 0) return false;
    }
    return true;
}

constexpr std::size_t countOddPrimes() {
    std::size_t count = 0;
    for (std::uint32_t n = 3; n < kTrialLimit; n += 2) count += isSmallPrime(n) ? 1 : 0;
    return count;
}

constexpr auto makeTrialPrimes() {
    std::array<TrialPrime, countOddPrimes()> table{};
    std::size_t i = 0;
    for (std::uint32_t n = 3; n < kTrialLimit; n += 2) {
        if (!isSmallPrime(n)) continue;
        std::uint64_t inv = n;
        for (int k = 0; k < 5; ++k) inv *= 2 - n * inv;
        table[i++] = {n, inv, ~std::uint64_t{0} / n};
    }
    return table;
}

}  // namespace detail

inline constexpr auto kTrialPrimes = detail::makeTrialPrimes();

inline bool dividesExactly(std::uint64_t n, const TrialPrime& p) {
    return n * p.inverse <= p.limit;
}

}  // namespace tarn
