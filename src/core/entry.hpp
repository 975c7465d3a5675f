// The entry rule: turns the text of an entry box into a whole Number, or a rejection that
// carries the exact message the window shows. The numeric test and the conversion are one
// grammar, so they accept exactly the same texts.
#pragma once

#include <optional>
#include <string>
#include <string_view>

#include "core/number.hpp"
#include "core/texts.hpp"

namespace tarn {

// The range of the entry, both ends included: 200 below the Number type's largest whole value,
// and the figure the range message quotes.
inline constexpr std::int64_t kUpperEntryWhole = 922337203685277;
inline constexpr double kLowerEntryBound = 2.0;
inline constexpr double kUpperEntryBound = static_cast<double>(kUpperEntryWhole);

// Plain decimal text: surrounding blanks, an optional sign, digits with an optional fraction
// (after the locale's separator or a point), an optional exponent. Returns nothing when the
// text is not such a number; a number too large for a double comes back as infinity.
std::optional<double> parseNumericText(std::string_view text, char decimalSeparator = '.');

struct EntryResult {
    std::optional<Number> number;  // the accepted whole number
    std::string message;           // the rejection's message, empty when accepted

    bool accepted() const { return number.has_value(); }
};

// Numeric test, range check before truncation (2 to 922 337 203 685 277), then truncation.
EntryResult ReadNumberEntry(std::string_view text, char decimalSeparator = '.');

// The conversion alone, truncated toward zero, for entries with their own bounds.
// Rejects non-numeric text with "Invalid entry."; a value beyond the Number type is returned
// as nothing with an empty message so that the caller can word its own refusal.
EntryResult readWholeEntry(std::string_view text, char decimalSeparator = '.');

}  // namespace tarn
