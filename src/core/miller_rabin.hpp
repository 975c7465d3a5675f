// isPrime: the engine's one primality test for 64-bit numbers, deterministic Miller-Rabin.
// A few small divisors first, then strong probable-prime tests in Montgomery form to the seven
// bases that are proven to leave no 64-bit pseudoprime; a composite nearly always fails the
// first base, so it costs one modular power.
#pragma once

#include <cstdint>

namespace tarn {

// True when n is prime: false for 0 and 1, true for 2.
bool isPrime(std::uint64_t n);

}  // namespace tarn
