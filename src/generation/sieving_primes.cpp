#include "generation/sieving_primes.hpp"

#include <algorithm>
#include <cmath>

namespace tarn {

std::uint64_t wholeSqrt(std::uint64_t n) {
    auto r = static_cast<std::uint64_t>(std::sqrt(static_cast<double>(n)));
    while (r * r > n) --r;
    while ((r + 1) * (r + 1) <= n) ++r;
    return r;
}

std::vector<std::uint32_t> sievingPrimes(std::uint32_t from, std::uint32_t bound) {
    std::vector<std::uint32_t> primes;
    if (bound < 7) return primes;
    // Index i stands for 2i + 1; one bit each keeps this under 2 MB at the top of the range.
    std::vector<bool> composite(bound / 2 + 1, false);
    for (std::uint64_t i = 1; (2 * i + 1) * (2 * i + 1) <= bound; ++i) {
        if (composite[i]) continue;
        const std::uint64_t p = 2 * i + 1;
        for (std::uint64_t j = p * p / 2; j < composite.size(); j += p) composite[j] = true;
    }
    // pi(x) < 1.26 x / ln x for every x > 1, so one allocation holds them all; below 100 the
    // estimate is loose and 25 primes fit anyway.
    primes.reserve(bound < 100 ? 32 : static_cast<std::size_t>(1.3 * bound / std::log(bound)));
    for (std::uint64_t i = std::max<std::uint64_t>(3, from / 2); 2 * i + 1 <= bound; ++i)
        if (!composite[i] && 2 * i + 1 >= from)
            primes.push_back(static_cast<std::uint32_t>(2 * i + 1));
    return primes;
}

std::uint64_t firstMultiple(std::uint32_t p, std::uint64_t start, std::uint32_t& wheel) {
    std::uint64_t q = std::max<std::uint64_t>(p, (start + p - 1) / p);
    for (;; ++q) {
        const auto r = static_cast<std::uint32_t>(q % kSievePeriod);
        for (std::uint32_t i = 0; i < 8; ++i) {
            if (kWheelNumbers[i] == r) {
                wheel = i;
                return p * q;
            }
        }
    }
}

}  // namespace tarn
