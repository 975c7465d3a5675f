// TestPrime2: the Test command's primality test, by trial division by 2, 3, 5, 7 and then by
// every number from 11 up that has no factor 2, 3 or 5 (a wheel of 30). It needs no table, and
// it looks at the stop request once per turn of eight divisors.
#pragma once

#include <cstdint>

#include "core/stop_signal.hpp"

namespace tarn {

enum TestCode : int { kComposite = 0, kPrime = 1, kStopped = 2 };

// The result code for n (callers pass 1 to 922 337 203 685 277): 0 when a divisor was found
// (every even n, 2 included), 1 when none was (also n = 1), 2 when a stop request was seen at
// the start of a wheel turn. The command clears `stop` when it is given, on its own thread, so
// that a stop made before it is not for this test, and one made right after it is; a stop that
// ended the test stays set. Numbers below 1 are reported composite.
int TestPrime2(std::int64_t n, StopSignal& stop);

}  // namespace tarn
