// The gap check against a sieve for small numbers and against trial division at the top of the
// range, where a wrong verdict would refuse a sound file or accept a truncated one.
#include "generation/gap_primality.hpp"

#include <gtest/gtest.h>

#include "generation/results_oracle.hpp"

namespace tarn {
namespace {

bool primeByTrialDivision(std::int64_t n) {
    if (n < 2 || n % 2 == 0) return n == 2;
    for (std::int64_t d = 3; d * d <= n; d += 2)
        if (n % d == 0) return false;
    return true;
}

TEST(GapPrimality, AgreesWithTheSieveAndWithTrialDivision) {
    const auto primes = test::sievePrimes(2000000);
    std::size_t next = 0;
    for (std::int64_t n = -5; n <= 2000000; ++n) {
        const bool expected = next < primes.size() && primes[next] == n;
        next += expected;
        ASSERT_EQ(isPrimeByMillerRabin(n), expected) << n;
    }
    // Strong pseudoprimes to small bases and squares of large primes trip weaker tests.
    std::vector<std::int64_t> top{3215031751, 2152302898747, 3474749660383, 341550071728321,
                                  std::int64_t{30370009} * 30370009};
    for (std::int64_t n = 922337203685277 - 300; n <= 922337203685277; ++n) top.push_back(n);
    int topPrimes = 0;
    for (const std::int64_t n : top) {
        const bool expected = primeByTrialDivision(n);
        topPrimes += expected;
        ASSERT_EQ(isPrimeByMillerRabin(n), expected) << n;
    }
    EXPECT_GT(topPrimes, 0);
}

TEST(GapPrimality, FirstPrimeAboveLooksOnlyInsideTheWindow) {
    EXPECT_EQ(firstPrimeAbove(31, 37), 37);
    EXPECT_EQ(firstPrimeAbove(37, 37), std::nullopt);
    EXPECT_EQ(firstPrimeAbove(113, 126), std::nullopt);  // the gap 113..127
    EXPECT_EQ(firstPrimeAbove(113, 127), 127);
    EXPECT_EQ(firstPrimeAbove(-10, 2), 2);
}

}  // namespace
}  // namespace tarn
