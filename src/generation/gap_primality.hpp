// A primality check for the few numbers between the last record of a results file and the
// checkpoint's candidate. That window is shorter than a prime gap when the files agree, and
// the first prime inside it proves that they do not, so only a handful of numbers are ever
// tested. Deterministic Miller-Rabin with the bases 2 to 37 is exact for every 64-bit value.
#pragma once

#include <cstdint>
#include <optional>

namespace tarn {

bool isPrimeByMillerRabin(std::int64_t n);

// The smallest prime p with low < p <= high, or nothing when there is none.
std::optional<std::int64_t> firstPrimeAbove(std::int64_t low, std::int64_t high);

}  // namespace tarn
