// Pollard-Brent rho with products reduced lazily (no final compare) and two walks side by side,
// so the multiplier never idles; the stop is read once per batch of steps.
#include "core/pollard_brent.hpp"

#include <array>
#include <bit>

#include "core/config.hpp"
#include "core/montgomery.hpp"

namespace tarn {
namespace {

std::uint64_t binaryGcd(std::uint64_t a, std::uint64_t b) {
    if (a == 0) return b;
    if (b == 0) return a;
    const int shift = std::countr_zero(a | b);
    a >>= std::countr_zero(a);
    do {
        b >>= std::countr_zero(b);
        if (a > b) std::swap(a, b);
        b -= a;
    } while (b != 0);
    return a << shift;
}

// Montgomery products without the final correction. For n below 2^58 and factors below 8n,
// (a*b + m*n) / 2^64 stays below 2n, so the walk x -> x^2 + c (c < 2n) never leaves [0, 4n)
// and needs no compare at all; residues are only congruent, which is all a gcd needs.
class LazyMontgomery {
public:
    explicit LazyMontgomery(std::uint64_t n) : n_(n), negInv_(0 - inverseMod2_64(n)) {}
    std::uint64_t mul(std::uint64_t a, std::uint64_t b) const {
        const u128 t = static_cast<u128>(a) * b;
        const auto tl = static_cast<std::uint64_t>(t);
        const std::uint64_t m = tl * negInv_;
        const u128 mn = static_cast<u128>(m) * n_;
        // tl + low(m*n) is 0 mod 2^64, with a carry exactly when tl is not 0.
        return static_cast<std::uint64_t>(t >> 64) + static_cast<std::uint64_t>(mn >> 64) +
               (tl != 0);
    }

private:
    std::uint64_t n_;
    std::uint64_t negInv_;
};

// Where every walk starts; any residue serves.
constexpr std::uint64_t kWalkStart = 2;

struct Walk {
    std::uint64_t c, x, y, saved, product;
};

// Result of a round of walks: a proper factor, n when every walk that closed its cycle did so
// modulo all factors at once, or 0 when stopped.
std::uint64_t search(std::uint64_t n, std::uint64_t firstC, const StopSignal& stop) {
    const LazyMontgomery mont(n);
    const std::uint64_t fourN = 4 * n;
    std::array<Walk, kPollardWalks> walks;
    for (int w = 0; w < kPollardWalks; ++w)
        walks[w] = {firstC + w, kWalkStart, kWalkStart, kWalkStart, 1};
    auto step = [&](std::uint64_t v, std::uint64_t c) { return mont.mul(v, v) + c; };
    // x and y lie in [0, 4n), so this is a positive residue of x - y below 8n.
    auto difference = [&](std::uint64_t x, std::uint64_t y) { return x + fourN - y; };

    for (std::uint64_t r = 1;; r *= 2) {
        for (Walk& w : walks) w.x = w.y;
        for (std::uint64_t i = 0; i < r; ++i) {
            for (Walk& w : walks) w.y = step(w.y, w.c);
        }
        for (std::uint64_t k = 0; k < r; k += kPollardBatch) {
            if (stop.requested()) return 0;
            const std::uint64_t steps = r - k < kPollardBatch ? r - k : kPollardBatch;
            for (Walk& w : walks) w.saved = w.y;
            for (std::uint64_t i = 0; i < steps; ++i) {
                for (Walk& w : walks) {
                    w.y = step(w.y, w.c);
                    w.product = mont.mul(w.product, difference(w.x, w.y));
                }
            }
            bool closed = false;
            for (Walk& w : walks) {
                std::uint64_t g = binaryGcd(w.product, n);
                if (g == 1) continue;
                if (g == n) {
                    // The batch went past the point where the factors part; walk it again
                    // one step at a time.
                    do {
                        w.saved = step(w.saved, w.c);
                        g = binaryGcd(difference(w.x, w.saved), n);
                    } while (g == 1);
                }
                if (g != n) return g;
                closed = true;
            }
            if (closed) return n;
        }
    }
}

}  // namespace

std::uint64_t pollardBrentFactor(std::uint64_t n, const StopSignal& stop) {
    for (std::uint64_t c = 1;; c += kPollardWalks) {
        const std::uint64_t g = search(n, c, stop);
        if (g != n) return g;
    }
}

}  // namespace tarn
