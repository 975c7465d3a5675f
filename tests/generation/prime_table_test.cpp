// PrimeTable and TestPrime: the worked cases, a differential run against trial division by
// every odd number, and the growth cap at the top of the range.
#include "generation/prime_table.hpp"

#include <gtest/gtest.h>

#include "generation/prime_oracle.hpp"

using namespace tarn;

namespace {

bool naivePrime(std::int64_t n) {
    if (n < 2) return false;
    for (std::int64_t d = 2; d * d <= n; ++d)
        if (n % d == 0) return false;
    return true;
}

}  // namespace

TEST(PrimeTable, StartsWithTheSeedEntries) {
    const PrimeTable table;
    EXPECT_EQ(table.entries(), (std::vector<std::int32_t>{0, 3, 5, 7}));
    EXPECT_EQ(table.upperBound(), 3);
}

TEST(PrimeTable, WorkedCasesAppendOnlyNewPrimes) {
    PrimeTable table;
    EXPECT_EQ(table.TestPrime(11), 1);
    EXPECT_EQ(table.lastEntry(), 11);
    EXPECT_EQ(table.TestPrime(13), 1);
    EXPECT_EQ(table.upperBound(), 5);
    EXPECT_EQ(table.TestPrime(9), 0);
    EXPECT_EQ(table.TestPrime(13), 1);  // already there: not appended twice
    EXPECT_EQ(table.upperBound(), 5);
    EXPECT_EQ(table.TestPrime(49), 0);
    EXPECT_EQ(table.TestPrime(121), 0);
    EXPECT_EQ(table.TestPrime(169), 0);
    for (const std::int64_t even : {2LL, 4LL, 100LL, 922337203685276LL}) {
        EXPECT_EQ(table.TestPrime(even), 0) << even;
    }
    EXPECT_EQ(table.upperBound(), 5);
}

TEST(PrimeTable, RootBoundIsTheWholeRootPlusOne) {
    EXPECT_EQ(PrimeTable::RootBound(11), 4);
    EXPECT_EQ(PrimeTable::RootBound(121), 12);
    EXPECT_EQ(PrimeTable::RootBound(169), 14);
    EXPECT_EQ(PrimeTable::RootBound(922337203685277), PrimeTable::TableCap);
}

TEST(PrimeTable, AgreesWithTrialDivisionAlongTheWheel) {
    PrimeTable table;
    std::vector<std::int32_t> expected{0, 3, 5, 7};
    static constexpr int kSteps[8] = {2, 4, 2, 4, 6, 2, 6, 4};
    std::int64_t candidate = 11;
    for (int i = 0; candidate < 200000; ++i) {
        const bool prime = naivePrime(candidate);
        ASSERT_EQ(table.TestPrime(candidate), prime ? 1 : 0) << candidate;
        if (prime) expected.push_back(static_cast<std::int32_t>(candidate));
        candidate += kSteps[i % 8];
    }
    EXPECT_EQ(table.entries(), expected);
}

TEST(PrimeTable, StopsGrowingAtTheFirstPrimeAboveTheCap) {
    PrimeTable table;
    for (const std::int64_t p : test::primesUpTo(30370100)) {
        if (p > 7) table.appendFound(p);
    }
    EXPECT_EQ(table.lastEntry(), 30370013);
    EXPECT_EQ(table.upperBound(), 1879451);
    EXPECT_EQ(table.TestPrime(30370019), 1);
    EXPECT_EQ(table.lastEntry(), 30370013);
    EXPECT_EQ(table.upperBound(), 1879451);
    // The full table serves the top of the range: a product of the two primes around the cap,
    // and the square of the last prime below it, are caught by their factors.
    EXPECT_EQ(table.TestPrime(30370013LL * 30369991LL), 0);
    EXPECT_EQ(table.TestPrime(30369991LL * 30369991LL), 0);
    EXPECT_EQ(table.upperBound(), 1879451);
}
