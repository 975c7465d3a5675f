#include "core/trial_division.hpp"

#include <cmath>

#include "core/miller_rabin.hpp"

namespace tarn {

int TestPrime2(std::int64_t n, StopSignal& stop) {
    stop.clear();
    return trialDivisionTest(n, stop);
}

int trialDivisionTest(std::int64_t n, const StopSignal& stop) {
    // The bound is taken on the double, as the Test command always has: Fix(sqrt n) + 1.
    const std::uint64_t bound =
        n > 0 ? static_cast<std::uint64_t>(std::sqrt(static_cast<double>(n))) + 1 : 0;
    if (n < 1) return kComposite;
    const auto m = static_cast<std::uint64_t>(n);

    // Integer remainders give the same verdicts as the quotient test on doubles for every
    // number below 2^50, which covers the whole entry range.
    if (m % 2 == 0) return kComposite;
    for (std::uint64_t p : {3u, 5u, 7u}) {
        if (m % p == 0 && bound > p) return kComposite;
    }
    if (11 > bound) return kPrime;

    for (std::uint64_t c = 11;; c += 30) {
        if (stop.requested()) return kStopped;
        // All eight divisors of the turn are tried, even past the bound: the verdict is the
        // same, and the remainders do not wait on each other.
        const bool divided = (m % c == 0) | (m % (c + 2) == 0) | (m % (c + 6) == 0) |
                             (m % (c + 8) == 0) | (m % (c + 12) == 0) | (m % (c + 18) == 0) |
                             (m % (c + 20) == 0) | (m % (c + 26) == 0);
        if (divided) return kComposite;
        if (c + 30 > bound) return kPrime;
    }
}

bool CheckPrime(std::int64_t n) {
    if (n == 1) return true;
    if (n < 3) return false;
    return IsPrime64(static_cast<std::uint64_t>(n));
}

}  // namespace tarn
