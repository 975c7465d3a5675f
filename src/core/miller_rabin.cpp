// Division by the primes up to 37 first, then the seven strong tests. Every modular product is a
// Montgomery product, so past the small primes the test divides only to set up n and each base.
#include "core/miller_rabin.hpp"

#include <bit>

#include "core/montgomery.hpp"

namespace tarn {
namespace {

// Small primes tried by division first: they settle most composites at once, and every odd
// number left below the square of the next prime (41) is prime without a modular power.
constexpr std::uint64_t kSmallPrimes[] = {2, 3, 5, 7, 11, 13, 17, 19, 23, 29, 31, 37};
constexpr std::uint64_t kSurelyPrimeBelow = 41 * 41;

// Strong probable-prime tests to these bases leave no pseudoprime below 2^64 (Jim Sinclair).
constexpr std::uint64_t kBases[] = {2, 325, 9375, 28178, 450775, 9780504, 1795265022};

// The strong tests for an odd n above 1.
bool passesStrongTests(std::uint64_t n) {
    const Montgomery mont(n);
    const std::uint64_t nMinus1 = n - 1;
    const int s = std::countr_zero(nMinus1);
    const std::uint64_t d = nMinus1 >> s;
    const std::uint64_t minusOne = mont.minusOne();

    for (std::uint64_t base : kBases) {
        const std::uint64_t a = base % n;
        if (a == 0) continue;  // a base that is a multiple of n says nothing
        std::uint64_t x = mont.pow(mont.toForm(a), d);
        if (x == mont.one() || x == minusOne) continue;
        bool witness = true;
        for (int i = 1; i < s; ++i) {
            x = mont.mul(x, x);
            if (x == minusOne) {
                witness = false;
                break;
            }
        }
        if (witness) return false;
    }
    return true;
}

}  // namespace

bool isPrime(std::uint64_t n) {
    if (n < 2) return false;
    for (std::uint64_t p : kSmallPrimes) {
        if (n % p == 0) return n == p;
    }
    if (n < kSurelyPrimeBelow) return true;
    return passesStrongTests(n);
}

}  // namespace tarn
