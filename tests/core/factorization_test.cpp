// FactorizeNumber against naive trial division, on random numbers over the whole range and on
// the hard kinds (prime squares and cubes, balanced semiprimes, powers of 2, the top of the
// range); the result lines character for character; stop requests.
#include "core/factorization.hpp"

#include <gtest/gtest.h>

#include <random>

#include "core/miller_rabin.hpp"

using namespace tarn;

namespace {

constexpr std::int64_t kUpper = 922337203685277;

FactorList naiveFactors(std::uint64_t n) {
    FactorList out;
    for (std::uint64_t d = 2; d * d <= n; ++d) {
        unsigned e = 0;
        while (n % d == 0) n /= d, ++e;
        if (e > 0) out.push_back({d, e});
    }
    if (n > 1) out.push_back({n, 1});
    return out;
}

FactorList factors(std::int64_t n) {
    StopSignal stop;
    const auto result = FactorizeNumber(n, stop);
    EXPECT_TRUE(result.has_value()) << n;
    return result.value_or(FactorList{});
}

// The list is a factorization of n: ascending primes, each once, multiplying back to n.
void expectSound(std::int64_t n) {
    std::uint64_t product = 1, previous = 1;
    for (const auto& [prime, exponent] : factors(n)) {
        ASSERT_TRUE(prime > previous && isPrime(prime) && exponent >= 1) << n;
        for (unsigned i = 0; i < exponent; ++i) product *= prime;
        previous = prime;
    }
    EXPECT_EQ(product, static_cast<std::uint64_t>(n));
}

std::vector<std::int64_t> primesFrom(std::int64_t start, int count) {
    std::vector<std::int64_t> out;
    for (std::int64_t p = start; static_cast<int>(out.size()) < count; ++p)
        if (isPrime(static_cast<std::uint64_t>(p))) out.push_back(p);
    return out;
}

}  // namespace

TEST(FactorizeNumber, AgreesWithNaiveTrialDivisionForSmallNumbers) {
    for (std::int64_t n = 2; n < 200000; ++n) {
        ASSERT_EQ(factors(n), naiveFactors(static_cast<std::uint64_t>(n))) << n;
    }
}

TEST(FactorizeNumber, RandomNumbersAcrossTheRange) {
    std::mt19937_64 random(11);
    std::uniform_int_distribution<std::int64_t> pick(2, kUpper);
    for (int i = 0; i < 3000; ++i) expectSound(pick(random));
}

TEST(FactorizeNumber, HardCases) {
    // A sound factorization is the only one. Squares of the largest primes whose square fits, and
    // of primes just past the trial divisors; cubes; a square times a prime; products of two
    // primes near 3e7 and of three near the cube root; powers of 2; the top of the range.
    int squares = 0;
    for (std::uint64_t p : primesFrom(30369800, 12))
        if (p * p <= kUpper) expectSound(static_cast<std::int64_t>(p * p)), ++squares;
    EXPECT_GE(squares, 3);
    for (std::int64_t p : primesFrom(2040, 6)) expectSound(p * p), expectSound(p * p * p);
    for (std::int64_t p : primesFrom(97000, 5))
        if (p * p * p <= kUpper) expectSound(p * p * p);
    const auto a = primesFrom(100000, 2), b = primesFrom(96000, 3);
    expectSound(a[0] * a[0] * a[1]);
    expectSound(b[0] * b[1] * b[2]);
    const auto low = primesFrom(29000000, 10), high = primesFrom(30000000, 10);
    for (std::size_t i = 0; i < low.size(); ++i) expectSound(low[i] * high[i]);
    for (int k = 1; k < 50; ++k) expectSound(std::int64_t{1} << k);
    for (std::int64_t n = kUpper; n > kUpper - 300; --n) expectSound(n);
}

TEST(FactorizeNumber, ResultLines) {
    for (const char* line : {"2 = 2", "18 = 2 * 3^2", "360 = 2^3 * 3^2 * 5", "1024 = 2^10"}) {
        const std::int64_t n = std::stoll(line);
        EXPECT_EQ(factorizationLine(n, factors(n)), line);
    }
}

TEST(FactorizeNumber, StopRequestGivesNothing) {
    StopSignal stop;
    stop.request();
    const auto p = primesFrom(30000000, 2);
    EXPECT_FALSE(FactorizeNumber(p[0] * p[1], stop).has_value());
    EXPECT_FALSE(FactorizeNumber(360, stop).has_value());
    EXPECT_TRUE(stop.requested());
    stop.clear();
    EXPECT_TRUE(FactorizeNumber(p[0] * p[1], stop).has_value());
}
