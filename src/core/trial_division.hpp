// TestPrime2: the stand-alone primality test by trial division on a wheel of 30, as the Test
// command runs it, and CheckPrime, its fast equivalent for the factorization.
// TestPrime2 divides by 2, 3, 5, 7 and then by every number from 11 up that has no factor 2, 3
// or 5, eight divisors per wheel turn, looking at the stop request once per turn. It is fast
// because the eight remainders of a turn are independent, so the divider works on them
// back to back instead of waiting on a branch after each one.
#pragma once

#include <cstdint>

#include "core/stop_signal.hpp"

namespace tarn {

enum TestCode : int { kComposite = 0, kPrime = 1, kStopped = 2 };

// The result code for n (callers pass 1 to 922 337 203 685 277): 0 when a divisor was found
// (every even n, 2 included), 1 when none was (also n = 1), 2 when a stop request was seen at
// the start of a wheel turn. Clears `stop` on entry; a stop that ended the test stays set.
// Numbers below 1 are reported composite.
int TestPrime2(std::int64_t n, StopSignal& stop);

// The same test without clearing the stop request first. The window clears it on its own
// thread when the command starts, so that a stop pressed before the worker gets going counts.
int trialDivisionTest(std::int64_t n, const StopSignal& stop);

// True exactly when TestPrime2 would return 1: so true for 1 and for primes from 3 up, false
// for 2 and for composites. Decided by deterministic Miller-Rabin, without any stop request.
bool CheckPrime(std::int64_t n);

}  // namespace tarn
