// The count entry of the split: how many records go into each output file.
// It takes the entry rule's conversion (numeric test, truncation toward zero) but not its
// range; the split has its own floor of 1000 records and refuses counts beyond a Number.
#pragma once

#include <cstdint>
#include <string_view>

#include "core/entry.hpp"
#include "tools/texts.hpp"

namespace tarn {

inline constexpr std::int64_t kMinimumRecordsPerFile = 1000;

// Accepted: a whole Number of at least 1000 ("1000.9" gives 1000). Refused with
// "Invalid entry." (not numeric, empty), "Minimum value is 1000 records." (below 1000 after
// truncation) or the out-of-range message (beyond the Number type).
EntryResult parseRecordsPerFile(std::string_view text, char decimalSeparator = '.');

}  // namespace tarn
