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
    // Index i stands for 2i + 1.
    std::vector<std::uint8_t> composite(bound / 2 + 1, 0);
    for (std::uint64_t i = 1; (2 * i + 1) * (2 * i + 1) <= bound; ++i) {
        if (composite[i]) continue;
        const std::uint64_t p = 2 * i + 1;
        for (std::uint64_t j = p * p / 2; j < composite.size(); j += p) composite[j] = 1;
    }
    for (std::uint64_t i = std::max<std::uint32_t>(from, 7) / 2; 2 * i + 1 <= bound; ++i)
        if (!composite[i] && 2 * i + 1 >= from)
            primes.push_back(static_cast<std::uint32_t>(2 * i + 1));
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
