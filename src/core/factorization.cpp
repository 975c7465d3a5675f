// Factorization in three steps: the primes below 2048 by multiply-and-compare division, then
// square and cube roots, then Pollard-Brent rho on what is left, every piece checked by isPrime.
// Fixed arrays hold the factors, so a factorization allocates only its result.
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

// A number below 2^63 has fewer than 63 prime factors, counted with repetition.
constexpr std::size_t kMaxPrimeFactors = 64;

// Prime factors with repetition.
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
    std::array<std::uint64_t, kMaxPrimeFactors> primes_{};
    std::size_t count_ = 0;
};

// r when m is r^k (k is 2 or 3), otherwise 0. The double root is off by at most one.
std::uint64_t exactRoot(std::uint64_t m, unsigned k) {
    const double root =
        k == 2 ? std::sqrt(static_cast<double>(m)) : std::cbrt(static_cast<double>(m));
    const auto s = static_cast<std::uint64_t>(std::llround(root));
    for (std::uint64_t r = s > 0 ? s - 1 : 0; r <= s + 1; ++r) {
        std::uint64_t power = r;
        for (unsigned i = 1; i < k; ++i) power *= r;
        if (power == m) return r;
    }
    return 0;
}

// 2 or 3 with `root` set when m is root^2 or root^3 (squares first), otherwise 0.
unsigned squareOrCube(std::uint64_t m, std::uint64_t& root) {
    for (const unsigned k : {2u, 3u}) {
        root = exactRoot(m, k);
        if (root != 0) return k;
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
    std::array<std::uint64_t, kMaxPrimeFactors> pending{};
    std::size_t count = 0;
    pending[count++] = m;
    while (count > 0) {
        const std::uint64_t v = pending[--count];
        if (v < kSurelyPrimeBelow || isPrime(v)) {
            out.add(v);
            continue;
        }
        // A square or a cube falls to its root at once, well before a rho walk would part it.
        std::uint64_t root = 0;
        if (const unsigned k = squareOrCube(v, root); k != 0) {
            for (unsigned i = 0; i < k; ++i) pending[count++] = root;
            continue;
        }
        const std::uint64_t f = pollardBrentFactor(v, stop);
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
