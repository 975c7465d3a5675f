// Pollard's rho with Brent's cycle search, in Montgomery form. The differences of a batch of
// steps are multiplied together and one gcd is taken per batch, so the walk costs two
// Montgomery products per step; a batch that overshoots (gcd = n) is walked again step by step.
#pragma once

#include <cstdint>

#include "core/stop_signal.hpp"

namespace tarn {

// A factor of the odd composite n (below 2^58), strictly between 1 and n; a walk that meets n
// itself is started again with another constant. Returns 0 when `stop` was seen; it is read
// once per batch of steps.
std::uint64_t pollardBrentFactor(std::uint64_t n, const StopSignal& stop);

}  // namespace tarn
