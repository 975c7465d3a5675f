// Segmented sieve of Eratosthenes on the 30-wheel, for the primes below kMediumPrimeBound. One
// byte is one wheel turn: turn t starts at 30t + 11 and bit b stands for 30t + 11 +
// kTurnOffsets[b], the eight numbers of the turn that have no factor 2, 3 or 5. A segment of
// turns is small enough to stay in the first-level cache. The multiples of 7 to 19 come from a
// pattern that repeats every 7 * 11 * 13 * 17 * 19 turns, those of 23 to 61 from a pattern for
// each pair of them. The other primes hit every segment:
// those below 2^13 cross off along eight fixed-bit progressions of step p bytes (taken together,
// eight stores a round), the rest walk their multiples along the wheel in one loop, which ends once
// per segment rather than eight times. The few thousand of them make a state of a few hundred
// kilobytes, one per sieving thread. The larger primes wait in the buckets of bucket_sieve.hpp.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "generation/config.hpp"

namespace tarn {

class WheelSieve {
public:
    // Patterns of two primes each, after the one of 7 to 19.
    static constexpr std::size_t kPairPatterns = 5;

    // Sieves turns from `firstTurn` on, with the primes below kMediumPrimeBound that sieve up
    // to `limit`.
    WheelSieve(std::int64_t firstTurn, std::int64_t limit);

    // Marks in the next `turns` turns (consecutive with the previous call) of `bytes` the
    // multiples of its primes: bit set = composite. Other bits are left as they are.
    void sieveNext(std::uint8_t* bytes, std::size_t turns);

    // Moves on to `turn` (not before the next one) without sieving the turns in between, so that
    // one sieve can serve segments far apart.
    void skipTo(std::int64_t turn);

private:
    struct Medium {
        std::uint32_t p;
        std::array<std::uint64_t, 8> next;  // byte offset from the current segment, per bit
    };

    struct Walker {
        std::uint32_t prime;  // as packPrime gives it
        std::uint32_t wheel;  // position of the next multiplier on the wheel
        std::uint64_t next;   // turn of the next multiple, from the current segment
    };

    // Where turn_ falls in each pattern.
    void placePatterns();

    std::int64_t turn_;  // first turn of the next segment
    std::size_t patternAt_ = 0;
    std::array<std::size_t, kPairPatterns> pairAt_{};
    std::vector<Medium> medium_;
    std::vector<Walker> walkers_;
};

}  // namespace tarn
