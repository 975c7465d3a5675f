// The tools' tuning: buffer sizes of the split.
#pragma once

#include <cstddef>

namespace tarn {

// Bytes read at once: enough that the system calls cost little next to the copy, and a constant
// memory whatever the file's size.
inline constexpr std::size_t kSplitBlockSize = std::size_t{1} << 20;
// Small pieces for one output file are gathered up to this many bytes; pieces of half of it
// or more go to the system directly.
inline constexpr std::size_t kSplitStagingSize = std::size_t{64} << 10;

}  // namespace tarn
