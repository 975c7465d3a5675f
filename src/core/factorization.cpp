#include "core/factorization.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>

#include "core/miller_rabin.hpp"
#include "core/pollard_brent.hpp"
#include "core/small_primes.hpp"

namespace tarn {
namespace {

// Prime factors with repetition; a number below 2^63 has fewer than 63.
class PrimeCollector {
public:
    void add(std::uint64_t p, unsigned times = 1) {
        for (unsigned i = 0; i < times; ++i) primes_[count_++] = p;
    }
    FactorList list() {
        std::sort(primes_.begin(), primes_.begin() + count_);
        FactorList out;
        for (std::size_t i = 0; i < count_; ++i) {
            if (!out.empty() && out.back().prime == primes_[i])
                ++out.back().exponent;
            else
                out.push_back({primes_[i], 1});
        }
        return out;
    }

private:
    std::array<std::uint64_t, 64> primes_{};
    std::size_t count_ = 0;
};

std::uint64_t exactSquareRoot(std::uint64_t m) {
    const auto s = static_cast<std::uint64_t>(std::llround(std::sqrt(static_cast<double>(m))));
    for (std::uint64_t r = s > 0 ? s - 1 : 0; r <= s + 1; ++r) {
        if (r * r == m) return r;
    }
    return 0;
}

std::uint64_t exactCubeRoot(std::uint64_t m) {
    const auto s = static_cast<std::uint64_t>(std::llround(std::cbrt(static_cast<double>(m))));
    for (std::uint64_t r = s > 0 ? s - 1 : 0; r <= s + 1; ++r) {
        if (r * r * r == m) return r;
    }
    return 0;
}

constexpr std::uint64_t kLastTrialPrime = kTrialPrimes.back().prime;
// Every prime factor left after trial division is above kLastTrialPrime, so a cofactor below
// the square of that is prime.
constexpr std::uint64_t kSurelyPrimeBelow = kLastTrialPrime * kLastTrialPrime;

// Splits an odd m, all of whose prime factors are above the trial primes, into primes.
// Returns false when stopped.
bool splitLarge(std::uint64_t m, PrimeCollector& out, const StopSignal& stop) {
    std::array<std::uint64_t, 64> pending{};
    std::size_t count = 0;
    pending[count++] = m;
    while (count > 0) {
        const std::uint64_t v = pending[--count];
        if (v < kSurelyPrimeBelow || IsPrimeOdd(Montgomery(v))) {
            out.add(v);
            continue;
        }
        if (const std::uint64_t r = exactSquareRoot(v); r != 0) {
            pending[count++] = r;
            pending[count++] = r;
            continue;
        }
        if (const std::uint64_t r = exactCubeRoot(v); r != 0) {
            pending[count++] = r;
            pending[count++] = r;
            pending[count++] = r;
            continue;
        }
        const std::uint64_t f = PollardBrentFactor(v, stop);
        if (f == 0) return false;
        pending[count++] = f;
        pending[count++] = v / f;
    }
    return true;
}

void appendNumber(std::string& out, std::uint64_t v) {
    char digits[24];
    const auto end = std::to_chars(digits, digits + sizeof digits, v).ptr;
    out.append(digits, end);
}

}  // namespace

std::optional<FactorList> FactorizeNumber(std::int64_t n, const StopSignal& stop) {
    if (stop.requested()) return std::nullopt;
    if (n < 2) return FactorList{};
    auto m = static_cast<std::uint64_t>(n);
    PrimeCollector primes;

    const int twos = std::countr_zero(m);
    primes.add(2, static_cast<unsigned>(twos));
    m >>= twos;

    for (const TrialPrime& p : kTrialPrimes) {
        if (p.prime * p.prime > m) break;
        while (dividesExactly(m, p)) {
            primes.add(p.prime);
            m *= p.inverse;  // the exact quotient
        }
    }
    // When the loop ended early, m is 1 or a prime below kSurelyPrimeBelow, which
    // splitLarge takes as it is.
    if (m > 1 && !splitLarge(m, primes, stop)) return std::nullopt;
    return primes.list();
}

void appendFactorizationLine(std::string& out, std::int64_t n, const FactorList& factors) {
    appendNumber(out, static_cast<std::uint64_t>(n));
    out += " = ";
    for (std::size_t i = 0; i < factors.size(); ++i) {
        if (i > 0) out += " * ";
        appendNumber(out, factors[i].prime);
        if (factors[i].exponent != 1) {
            out += '^';
            appendNumber(out, factors[i].exponent);
        }
    }
}

std::string factorizationLine(std::int64_t n, const FactorList& factors) {
    std::string line;
    appendFactorizationLine(line, n, factors);
    return line;
}

}  // namespace tarn
