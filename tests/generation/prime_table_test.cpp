// PrimeTable and TestPrime: the worked cases, a differential run against a plain sieve along the
// wheel, and the growth cap at the top of the range.
#include "generation/prime_table.hpp"

#include <gtest/gtest.h>

#include "generation/results_oracle.hpp"

namespace tarn {
namespace {

TEST(PrimeTable, WorkedCasesAndAPlainSieveAlongTheWheel) {
    PrimeTable table;
    EXPECT_EQ(table.entries(), (std::vector<std::int32_t>{0, 3, 5, 7}));
    EXPECT_EQ(table.TestPrime(11), 1);
    EXPECT_EQ(table.upperBound(), 4);
    // Only new primes are appended: 13 once, and no composite.
    for (const std::int64_t n : {13, 9, 13, 49, 121, 169, 2, 4, 100}) {
        EXPECT_EQ(table.TestPrime(n), n == 13) << n;
        EXPECT_EQ(table.upperBound(), 5) << n;
    }
    EXPECT_EQ(table.TestPrime(922337203685276), 0);
    EXPECT_EQ(table.entries(), (std::vector<std::int32_t>{0, 3, 5, 7, 11, 13}));
    const std::int64_t roots[][2] = {{11, 4}, {121, 12}, {169, 14}, {922337203685277, 30370005}};
    for (const auto& [n, bound] : roots) EXPECT_EQ(PrimeTable::RootBound(n), bound) << n;

    PrimeTable wheel;
    std::vector<std::int32_t> expected{0, 3, 5, 7};
    const std::vector<bool> prime = test::plainSieve(200000);
    static constexpr int kSteps[8] = {2, 4, 2, 4, 6, 2, 6, 4};
    for (std::int32_t i = 0, candidate = 11; candidate < 200000; candidate += kSteps[i++ % 8]) {
        ASSERT_EQ(wheel.TestPrime(candidate), prime[candidate] ? 1 : 0) << candidate;
        if (prime[candidate]) expected.push_back(candidate);
    }
    EXPECT_EQ(wheel.entries(), expected);
}

TEST(PrimeTable, StopsGrowingAtTheFirstPrimeAboveTheCap) {
    PrimeTable table;
    for (const std::int64_t p : test::sievePrimes(30370100))
        if (p > 7) table.appendFound(p);
    EXPECT_EQ(table.lastEntry(), 30370013);
    EXPECT_EQ(table.upperBound(), 1879451);
    EXPECT_EQ(table.TestPrime(30370019), 1);
    // The full table serves the top of the range: a product of the two primes around the cap,
    // and the square of the last prime below it, are caught by their factors.
    EXPECT_EQ(table.TestPrime(30370013LL * 30369991LL), 0);
    EXPECT_EQ(table.TestPrime(30369991LL * 30369991LL), 0);
    EXPECT_EQ(table.lastEntry(), 30370013);
    EXPECT_EQ(table.upperBound(), 1879451);
}

}  // namespace
}  // namespace tarn
