// Miller-Rabin over 128-bit products: a few dozen modular multiplications per number.
#include "generation/gap_primality.hpp"

namespace tarn {
namespace {

using u64 = std::uint64_t;
using u128 = unsigned __int128;

u64 mulMod(u64 a, u64 b, u64 m) { return static_cast<u64>(static_cast<u128>(a) * b % m); }

u64 powMod(u64 base, u64 exponent, u64 m) {
    u64 result = 1;
    base %= m;
    while (exponent > 0) {
        if (exponent & 1) result = mulMod(result, base, m);
        base = mulMod(base, base, m);
        exponent >>= 1;
    }
    return result;
}

}  // namespace

bool isPrimeByMillerRabin(std::int64_t value) {
    if (value < 2) return false;
    const u64 n = static_cast<u64>(value);
    constexpr u64 kBases[] = {2, 3, 5, 7, 11, 13, 17, 19, 23, 29, 31, 37};
    for (const u64 p : kBases) {
        if (n == p) return true;
        if (n % p == 0) return false;
    }
    u64 d = n - 1;
    int twos = 0;
    while ((d & 1) == 0) {
        d >>= 1;
        ++twos;
    }
    for (const u64 a : kBases) {
        u64 x = powMod(a, d, n);
        if (x == 1 || x == n - 1) continue;
        bool composite = true;
        for (int i = 1; i < twos && composite; ++i) {
            x = mulMod(x, x, n);
            if (x == n - 1) composite = false;
        }
        if (composite) return false;
    }
    return true;
}

std::optional<std::int64_t> firstPrimeAbove(std::int64_t low, std::int64_t high) {
    for (std::int64_t n = low < 1 ? 2 : low + 1; n <= high; ++n)
        if (isPrimeByMillerRabin(n)) return n;
    return std::nullopt;
}

}  // namespace tarn
