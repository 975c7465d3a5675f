// How big the results file is, in the figure the window shows when it asks whether to open a
// large file in the text editor: megabytes cut (never rounded) to two decimals.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "tools/texts.hpp"

namespace tarn {

// The byte count as megabytes cut to two decimals: 12 582 911 bytes give 11.99.
double sizeFigure(std::uint64_t bytes);

// Larger than 10 MB once cut: 10 496 245 bytes are not, 10 496 246 bytes are.
bool isLargeFigure(double figure);

// The file's length, nothing when it cannot be measured.
std::optional<std::uint64_t> fileLength(const std::string& path);

}  // namespace tarn
