// The limit of a generation job as typed: the entry rule, then the job's own minimum of 100.
// The window and the command line both read it here, so that they refuse the same texts.
#pragma once

#include <string_view>

#include "core/entry.hpp"

namespace tarn {

// Accepted: a whole Number from 100 up ("100.9" gives 100). Refused with the entry rule's
// message, or with "Minimum value is 100" for a whole number below 100.
EntryResult readLimitEntry(std::string_view text, char decimalSeparator = '.');

}  // namespace tarn
