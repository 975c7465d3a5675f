// The wheel of 30 that the Test command's trial division and the generation both walk. Turn t
// starts at 30t + 11 and holds the eight numbers 30t + 11 + offset that have no factor 2, 3 or
// 5, so only 8 numbers in 30 are ever divided by or sieved.
#pragma once

#include <array>
#include <cstdint>

namespace tarn {

inline constexpr std::int64_t kWheelPeriod = 30;
// The first number above 7 with no factor 2, 3 or 5: where the first turn starts.
inline constexpr std::int64_t kFirstTurnStart = 11;
// The eight numbers of a turn, counted from its start: the first turn holds 11, 13, 17, 19,
// 23, 29, 31 and 37.
inline constexpr std::array<std::uint32_t, 8> kTurnOffsets{0, 2, 6, 8, 12, 18, 20, 26};

// A turn's last number is 30k + 7 (37 for the first turn), and the next turn starts 4 above it:
// a stopped job's checkpoint names such a number.
inline constexpr std::int64_t kTurnEndResidue =
    (kFirstTurnStart + kTurnOffsets.back()) % kWheelPeriod;
inline constexpr std::int64_t kLastToNextTurn = kWheelPeriod - kTurnOffsets.back();

inline constexpr std::int64_t turnStart(std::int64_t turn) {
    return kWheelPeriod * turn + kFirstTurnStart;
}
// The index of the turn whose start is `start` (a number 30k + 11).
inline constexpr std::int64_t turnIndex(std::int64_t start) {
    return (start - kFirstTurnStart) / kWheelPeriod;
}

}  // namespace tarn
