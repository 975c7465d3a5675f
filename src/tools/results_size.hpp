// How big the results file is, in the figure the window shows when it asks whether to open a
// large file in the text editor: megabytes cut (never rounded) to two decimals.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace tarn {

// The byte count as megabytes cut to two decimals: 12 582 911 bytes give 11.99.
double sizeFigure(std::uint64_t bytes);

// Larger than 10 MB once cut: 10 496 245 bytes are not, 10 496 246 bytes are.
bool isLargeFigure(double figure);

// The figure with a point, no blanks and only the decimals needed: 10.5, 15, 10.01.
std::string megabyteText(double figure);

// "The file is bigger than 10 MB (11.99 MB). Do you still want to open it with Notepad? ..."
std::string largeFileQuestion(double figure);

// The file's length, nothing when it cannot be measured.
std::optional<std::uint64_t> fileLength(const std::string& path);

}  // namespace tarn
