// Montgomery arithmetic modulo one odd 64-bit number: products are reduced without any
// division, by one low multiply and two high multiplies (REDC with R = 2^64). Residues are
// kept fully reduced in [0, n), so equality and gcd work on them directly.
#pragma once

#include <cstdint>

namespace tarn {

using u128 = unsigned __int128;

// n^-1 mod 2^64 for odd n. Newton's iteration doubles the correct low bits on every step:
// n is its own inverse to 3 bits, so five steps give 96 >= 64.
constexpr std::uint64_t inverseMod2_64(std::uint64_t n) {
    std::uint64_t inverse = n;
    for (int i = 0; i < 5; ++i) inverse *= 2 - n * inverse;
    return inverse;
}

class Montgomery {
public:
    // n must be odd and above 1.
    explicit Montgomery(std::uint64_t n) : n_(n), inv_(inverseMod2_64(n)) {
        const std::uint64_t r1 = (0 - n) % n;  // R mod n
        one_ = r1;
        r2_ = static_cast<std::uint64_t>(static_cast<u128>(r1) * r1 % n);
    }

    std::uint64_t modulus() const { return n_; }
    std::uint64_t one() const { return one_; }
    // The Montgomery form of -1.
    std::uint64_t minusOne() const { return n_ - one_; }

    // a * b / R mod n, for a, b in [0, n).
    std::uint64_t mul(std::uint64_t a, std::uint64_t b) const {
        return reduce(static_cast<u128>(a) * b);
    }
    std::uint64_t toForm(std::uint64_t a) const { return mul(a % n_, r2_); }

    std::uint64_t pow(std::uint64_t base, std::uint64_t e) const {
        std::uint64_t result = one_;
        while (e != 0) {
            if (e & 1) result = mul(result, base);
            base = mul(base, base);
            e >>= 1;
        }
        return result;
    }

private:
    std::uint64_t reduce(u128 t) const {
        // m makes t - m*n divisible by R; the low words cancel, so only the high words count.
        const std::uint64_t m = static_cast<std::uint64_t>(t) * inv_;
        const std::uint64_t mh = static_cast<std::uint64_t>((static_cast<u128>(m) * n_) >> 64);
        const std::uint64_t th = static_cast<std::uint64_t>(t >> 64);
        return th >= mh ? th - mh : th - mh + n_;
    }

    std::uint64_t n_;
    std::uint64_t inv_;      // n^-1 mod 2^64
    std::uint64_t one_ = 0;  // R mod n
    std::uint64_t r2_ = 0;   // R^2 mod n
};

}  // namespace tarn
