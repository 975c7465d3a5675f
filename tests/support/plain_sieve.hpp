// The simplest sieves of Eratosthenes: the oracles the fast engines are checked against.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace tarn::test {

inline std::vector<bool> plainSieve(std::size_t limit) {
    std::vector<bool> prime(limit + 1, true);
    prime[0] = false;
    if (limit >= 1) prime[1] = false;
    for (std::size_t p = 2; p * p <= limit; ++p)
        if (prime[p])
            for (std::size_t m = p * p; m <= limit; m += p) prime[m] = false;
    return prime;
}

// The primes from `from` to `to`, high up: the primes up to the square root of `to` cross off
// their multiples in the interval alone.
inline std::vector<std::int64_t> plainSegment(std::int64_t from, std::int64_t to) {
    auto root = static_cast<std::int64_t>(std::sqrt(static_cast<double>(to)));
    while (root * root > to) --root;
    while ((root + 1) * (root + 1) <= to) ++root;
    const std::vector<bool> small = plainSieve(static_cast<std::size_t>(root));
    std::vector<bool> prime(static_cast<std::size_t>(to - from + 1), true);
    for (std::int64_t p = 2; p <= root; ++p) {
        if (!small[static_cast<std::size_t>(p)]) continue;
        for (std::int64_t m = std::max(p * p, (from + p - 1) / p * p); m <= to; m += p)
            prime[static_cast<std::size_t>(m - from)] = false;
    }
    std::vector<std::int64_t> primes;
    for (std::int64_t n = std::max<std::int64_t>(from, 2); n <= to; ++n)
        if (prime[static_cast<std::size_t>(n - from)]) primes.push_back(n);
    return primes;
}

}  // namespace tarn::test
