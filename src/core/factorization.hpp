// FactorizeNumber: a whole number split into prime powers, primes ascending, each once, and
// the result line the Factorize command shows ("360 = 2^3 * 3^2 * 5").
// The list equals the one that dividing by 2, 3 and then every prime in turn gives, but it is
// found fast: division by the primes below 2048 with multiply-and-compare tests, a
// deterministic primality test of the cofactor, square and cube roots, and Pollard-Brent rho
// in Montgomery form for what remains (each piece below 2^50 has at most a few factors).
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "core/stop_signal.hpp"

namespace tarn {

struct FactorEntry {
    std::uint64_t prime;
    unsigned exponent;

    bool operator==(const FactorEntry&) const = default;
};
using FactorList = std::vector<FactorEntry>;

// The prime powers of n (2 to 922 337 203 685 277; below 2 the list is empty). Returns nothing
// when a stop request is seen: on entry, and once per batch of rho steps, so it is never lost.
std::optional<FactorList> FactorizeNumber(std::int64_t n, const StopSignal& stop);

// "360 = 2^3 * 3^2 * 5": blanks around "=" and "*", none around "^", exponent 1 not written.
std::string factorizationLine(std::int64_t n, const FactorList& factors);
// The same line appended to `out`, for batches.
void appendFactorizationLine(std::string& out, std::int64_t n, const FactorList& factors);

}  // namespace tarn
