// Tuning of tarn-cli: buffer sizes and the progress line's pace.
#pragma once

#include <chrono>
#include <cstddef>

namespace tarn::cli {

// Output of a batch of entries is gathered and written in blocks of this size.
inline constexpr std::size_t kFlushSize = 1 << 16;
// Standard input is read in blocks of this size.
inline constexpr std::size_t kInputBlock = 1 << 16;
// The progress line on a terminal is redrawn this often.
inline constexpr std::chrono::milliseconds kProgressInterval{250};

}  // namespace tarn::cli
