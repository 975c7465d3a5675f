// Deterministic primality for 64-bit numbers: a few small divisors, then strong probable-prime
// tests in Montgomery form to the seven bases that are proven to leave no 64-bit pseudoprime.
// Composites nearly always fail the first base, so a composite costs one modular power.
#pragma once

#include <cstdint>

#include "core/montgomery.hpp"

namespace tarn {

// True when n is prime (0 and 1 are not).
bool IsPrime64(std::uint64_t n);

// The strong tests alone, for an odd n above 1 whose Montgomery context is already built.
bool IsPrimeOdd(const Montgomery& mont);

}  // namespace tarn
