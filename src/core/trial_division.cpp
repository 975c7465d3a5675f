// The wheel of trial divisions behind the Test command. The eight remainders of a turn are
// independent and or-ed together without a branch, so the divider works on them back to back.
#include "core/trial_division.hpp"

#include <cmath>

#include "core/wheel.hpp"

namespace tarn {

int TestPrime2(std::int64_t n, StopSignal& stop) {
    if (n < 1) return kComposite;
    // The bound is taken on the double, as the Test command always has: Fix(sqrt n) + 1.
    const auto bound = static_cast<std::uint64_t>(std::sqrt(static_cast<double>(n))) + 1;
    const auto m = static_cast<std::uint64_t>(n);

    // Integer remainders give the same verdicts as the quotient test on doubles for every
    // number below 2^50, which covers the whole entry range.
    if (m % 2 == 0) return kComposite;
    // 3, 5 and 7 themselves have bounds 2, 3 and 3, so they stay prime.
    for (std::uint64_t p : {3u, 5u, 7u}) {
        if (m % p == 0 && bound > p) return kComposite;
    }
    constexpr auto kFirst = static_cast<std::uint64_t>(kFirstTurnStart);
    constexpr auto kPeriod = static_cast<std::uint64_t>(kWheelPeriod);
    if (kFirst > bound) return kPrime;

    for (std::uint64_t c = kFirst;; c += kPeriod) {
        if (stop.requested()) return kStopped;
        // All eight divisors of the turn are tried, even past the bound: the verdict is the
        // same, and the remainders do not wait on each other.
        bool divided = false;
        for (const std::uint32_t offset : kTurnOffsets) divided |= m % (c + offset) == 0;
        if (divided) return kComposite;
        if (c + kPeriod > bound) return kPrime;
    }
}

}  // namespace tarn
