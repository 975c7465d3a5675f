// What both halves of the generation sieve share: the odd primes that sieve up to a limit, and
// the walk of a prime's multiples along the wheel of 30 (only multipliers prime to 30, so every
// multiple lands on a candidate of some turn).
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "core/wheel.hpp"

namespace tarn {

inline constexpr auto kSievePeriod = static_cast<std::uint64_t>(kWheelPeriod);
inline constexpr auto kSieveFirst = static_cast<std::uint64_t>(kFirstTurnStart);

// Numbers prime to 30 in one period, and the steps from one to the next.
inline constexpr std::array<std::uint32_t, 8> kWheelNumbers{1, 7, 11, 13, 17, 19, 23, 29};
inline constexpr std::array<std::uint32_t, 8> kWheelSteps{6, 4, 2, 4, 2, 4, 6, 2};

// Bit of a number m prime to 30 inside its turn, by (m - 11) mod 30.
inline constexpr std::array<std::uint8_t, kSievePeriod> kBitOfOffset = [] {
    std::array<std::uint8_t, kSievePeriod> table{};
    for (std::uint32_t b = 0; b < kTurnOffsets.size(); ++b)
        table[kTurnOffsets[b]] = static_cast<std::uint8_t>(1u << b);
    return table;
}();

// A prime p = 30a + r steps from the multiple p * q to p * (q + s), s the wheel step after q:
// a * s turns plus a carry that depends only on r and the position of q on the wheel, and the
// multiple's bit in its turn depends on the same two.
struct Crossing {
    std::array<std::array<std::uint8_t, 8>, 8> bit{};    // by residue and wheel position
    std::array<std::array<std::uint8_t, 8>, 8> carry{};  // turns beyond a * s
    std::array<std::uint8_t, kSievePeriod> residue{};    // position of p mod 30 on the wheel
};

inline constexpr Crossing kCrossing = [] {
    Crossing c;
    for (std::uint32_t i = 0; i < 8; ++i) {
        const std::uint32_t r = kWheelNumbers[i];
        c.residue[r] = static_cast<std::uint8_t>(i);
        for (std::uint32_t w = 0; w < 8; ++w) {
            const std::uint32_t offset = (r * kWheelNumbers[w] + kSievePeriod - kSieveFirst) % 30;
            c.bit[i][w] = kBitOfOffset[offset];
            c.carry[i][w] = static_cast<std::uint8_t>((offset + r * kWheelSteps[w]) / 30);
        }
    }
    return c;
}();

// p / 30 << 3 | the position of p mod 30 on the wheel: what a walk along p's multiples needs.
inline constexpr std::uint32_t packPrime(std::uint32_t p) {
    return static_cast<std::uint32_t>(p / kSievePeriod << 3) | kCrossing.residue[p % kSievePeriod];
}

// The whole part of the square root, exact for every 64-bit value.
std::uint64_t wholeSqrt(std::uint64_t n);

// The primes p with from <= p <= bound and p >= 7, ascending, by a plain sieve of odd numbers
// (for the medium primes: kMediumPrimeBound is small).
std::vector<std::uint32_t> sievingPrimes(std::uint32_t from, std::uint32_t bound);

// The first multiple p * q to cross off at or above `start`: q prime to 30 and q >= p (smaller
// multipliers leave multiples that a smaller prime crosses off). `wheel` receives the position of
// q on the wheel.
std::uint64_t firstMultiple(std::uint32_t p, std::uint64_t start, std::uint32_t& wheel);

}  // namespace tarn
