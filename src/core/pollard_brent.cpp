#include "core/pollard_brent.hpp"

#include <bit>

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

constexpr int kBatch = 128;

// One walk x -> x^2 + c. Returns the gcd it ends with: a proper factor, n when the walk
// closed its cycle modulo every factor at once, or 0 when stopped.
std::uint64_t walk(const Montgomery& mont, std::uint64_t c, std::uint64_t start,
                   const StopSignal& stop) {
    const std::uint64_t n = mont.modulus();
    auto step = [&](std::uint64_t v) { return mont.add(mont.mul(v, v), c); };
    auto distance = [](std::uint64_t a, std::uint64_t b) { return a > b ? a - b : b - a; };

    std::uint64_t y = start, x = start, saved = start;
    std::uint64_t product = mont.one();
    std::uint64_t g = 1;
    for (std::uint64_t r = 1; g == 1; r *= 2) {
        x = y;
        for (std::uint64_t i = 0; i < r; ++i) y = step(y);
        for (std::uint64_t k = 0; k < r && g == 1; k += kBatch) {
            if (stop.requested()) return 0;
            saved = y;
            const std::uint64_t steps = r - k < kBatch ? r - k : kBatch;
            for (std::uint64_t i = 0; i < steps; ++i) {
                y = step(y);
                product = mont.mul(product, distance(x, y));
            }
            g = binaryGcd(product, n);
        }
    }
    if (g == n) {
        // The batch went past the point where the factors part; walk it again one by one.
        do {
            saved = step(saved);
            g = binaryGcd(distance(x, saved), n);
        } while (g == 1);
    }
    return g;
}

}  // namespace

std::uint64_t PollardBrentFactor(std::uint64_t n, const StopSignal& stop) {
    const Montgomery mont(n);
    for (std::uint64_t c = 1;; ++c) {
        const std::uint64_t g = walk(mont, c, mont.toForm(2), stop);
        if (g == 0) return 0;
        if (g != n) return g;
    }
}

}  // namespace tarn
