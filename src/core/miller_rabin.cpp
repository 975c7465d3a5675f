#include "core/miller_rabin.hpp"

#include <bit>

namespace tarn {

bool IsPrimeOdd(const Montgomery& mont) {
    const std::uint64_t n = mont.modulus();
    const std::uint64_t nMinus1 = n - 1;
    const int s = std::countr_zero(nMinus1);
    const std::uint64_t d = nMinus1 >> s;
    const std::uint64_t minusOne = mont.minusOne();

    static constexpr std::uint64_t kBases[] = {2, 325, 9375, 28178, 450775, 9780504, 1795265022};
    for (std::uint64_t base : kBases) {
        const std::uint64_t a = base % n;
        if (a == 0) continue;  // a base that is a multiple of n says nothing
        std::uint64_t x = mont.pow(mont.toForm(a), d);
        if (x == mont.one() || x == minusOne) continue;
        bool witness = true;
        for (int i = 1; i < s; ++i) {
            x = mont.mul(x, x);
            if (x == minusOne) {
                witness = false;
                break;
            }
        }
        if (witness) return false;
    }
    return true;
}

bool IsPrime64(std::uint64_t n) {
    if (n < 2) return false;
    static constexpr std::uint64_t kSmall[] = {2, 3, 5, 7, 11, 13, 17, 19, 23, 29, 31, 37};
    for (std::uint64_t p : kSmall) {
        if (n % p == 0) return n == p;
    }
    if (n < 41 * 41) return true;
    return IsPrimeOdd(Montgomery(n));
}

}  // namespace tarn
