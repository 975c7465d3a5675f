#include "generation/sieving_primes.hpp"

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

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
    // The odd primes up to the square root sieve windows of odd numbers, one byte each, small
    // enough for the cache; index i of a window from `low` stands for low + 2i.
    const auto root = static_cast<std::uint32_t>(wholeSqrt(bound));
    std::vector<std::uint8_t> small(root / 2 + 1, 0);
    std::vector<std::uint32_t> base;
    for (std::uint32_t i = 1; 2 * i + 1 <= root; ++i) {
        if (small[i]) continue;
        const std::uint32_t p = 2 * i + 1;
        base.push_back(p);
        for (std::uint64_t j = std::uint64_t{p} * p / 2; j < small.size(); j += p) small[j] = 1;
    }
    // pi(x) < 1.26 x / ln x for every x > 1, so one allocation holds them all; below 100 the
    // estimate is loose and 25 primes fit anyway.
    primes.reserve(bound < 100 ? 32 : static_cast<std::size_t>(1.3 * bound / std::log(bound)));
    constexpr std::uint64_t kWindow = 1 << 16;
    std::vector<std::uint8_t> window(kWindow);
    const std::uint64_t first = std::max<std::uint32_t>(from, 7) | 1;
    for (std::uint64_t low = first; low <= bound; low += 2 * kWindow) {
        const std::uint64_t count = std::min<std::uint64_t>(kWindow, (bound - low) / 2 + 1);
        std::fill_n(window.begin(), count, 0);
        for (const std::uint64_t p : base) {
            if (p * p > low + 2 * (count - 1)) break;
            // The first odd multiple at or above both low and p * p.
            std::uint64_t m = std::max(p * p, (low + p - 1) / p * p);
            if (m % 2 == 0) m += p;
            for (std::uint64_t j = (m - low) / 2; j < count; j += p) window[j] = 1;
        }
        for (std::uint64_t i = 0; i < count; ++i)
            if (!window[i]) primes.push_back(static_cast<std::uint32_t>(low + 2 * i));
    }
    return primes;
}

std::uint64_t firstMultiple(std::uint32_t p, std::uint64_t start, std::uint32_t& wheel) {
    // From any number, the distance to the next one prime to 30 and its position.
    static constexpr auto kAhead = [] {
        std::array<std::pair<std::uint8_t, std::uint8_t>, kSievePeriod> ahead{};
        for (std::uint32_t r = 0; r < kSievePeriod; ++r)
            for (std::uint32_t d = 0;; ++d)
                if (const auto* at = std::find(kWheelNumbers.begin(), kWheelNumbers.end(),
                                               (r + d) % kSievePeriod);
                    at != kWheelNumbers.end()) {
                    ahead[r] = {static_cast<std::uint8_t>(d),
                                static_cast<std::uint8_t>(at - kWheelNumbers.begin())};
                    break;
                }
        return ahead;
    }();
    const std::uint64_t q = std::max<std::uint64_t>(p, (start + p - 1) / p);
    const auto [distance, position] = kAhead[q % kSievePeriod];
    wheel = position;
    return p * (q + distance);
}

}  // namespace tarn
