// Segmented sieve of Eratosthenes on the 30-wheel. One byte is one wheel turn: turn t starts at
// 30t + 11 and bit b stands for 30t + 11 + kTurnOffsets[b], the eight numbers of the turn that have
// no factor 2, 3 or 5. A segment of turns is small enough to stay in the first-level cache.
// Primes below the segment length cross off along eight fixed-bit progressions of step p bytes
// (a tight loop per progression); larger primes, which hit a segment a few times at most, walk
// their multiples along the wheel one by one. State grows with the count of sieving primes up to
// sqrt(limit), at most 1.9 million of them (about 30 MB at the top of the range).
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "core/wheel.hpp"

namespace tarn {

class WheelSieve {
public:
    // Sieves turns from `firstTurn` on, for numbers up to `limit`.
    WheelSieve(std::int64_t firstTurn, std::int64_t limit);

    // Sieves the next `turns` turns (consecutive with the previous call) into `bytes`: bit set =
    // the number is composite.
    void sieveNext(std::uint8_t* bytes, std::size_t turns);

    // Moves on to `turn` (not before the next one) without sieving the turns in between, so that
    // one sieve can serve segments far apart: small primes by a remainder, large ones that have
    // fallen behind by a division each.
    void skipTo(std::int64_t turn);

private:
    struct Small {
        std::uint32_t p;
        std::array<std::uint64_t, 8> next;  // byte offset from the current segment, per bit
    };
    struct Large {
        std::uint64_t multiple;  // next multiple to cross off
        std::uint32_t p;
        std::uint32_t wheel;  // position of the multiplier on the wheel of 30
    };

    std::int64_t turn_;  // first turn of the next segment
    std::vector<Small> small_;
    std::vector<Large> large_;
};

}  // namespace tarn
