#include "core/entry.hpp"

#include <cctype>
#include <charconv>
#include <cmath>

namespace tarn {
namespace {

bool isBlank(char c) { return c == ' ' || c == '\t'; }
bool isDigit(char c) { return c >= '0' && c <= '9'; }

}  // namespace

std::optional<double> parseNumericText(std::string_view text, char decimalSeparator) {
    std::size_t begin = 0, end = text.size();
    while (begin < end && isBlank(text[begin])) ++begin;
    while (end > begin && isBlank(text[end - 1])) --end;

    // Rebuild the text in the C form that from_chars reads, checking the grammar as we go.
    std::string normal;
    std::size_t i = begin;
    bool negative = false;
    if (i < end && (text[i] == '+' || text[i] == '-')) negative = text[i++] == '-';
    std::size_t digits = 0;
    while (i < end && isDigit(text[i])) normal += text[i++], ++digits;
    if (i < end && (text[i] == decimalSeparator || text[i] == '.')) {
        normal += '.';
        ++i;
        while (i < end && isDigit(text[i])) normal += text[i++], ++digits;
    }
    if (digits == 0) return std::nullopt;
    if (i < end && (text[i] == 'e' || text[i] == 'E')) {
        normal += 'e';
        ++i;
        if (i < end && (text[i] == '+' || text[i] == '-')) normal += text[i++];
        std::size_t exponentDigits = 0;
        while (i < end && isDigit(text[i])) normal += text[i++], ++exponentDigits;
        if (exponentDigits == 0) return std::nullopt;
    }
    if (i != end) return std::nullopt;

    double value = 0.0;
    const auto [ptr, ec] = std::from_chars(normal.data(), normal.data() + normal.size(), value);
    if (ec == std::errc::result_out_of_range) {
        // Too large or too small for a double: keep the side it falls on.
        std::size_t e = normal.find('e');
        const bool tiny = e != std::string::npos && normal[e + 1] == '-';
        value = tiny ? 0.0 : HUGE_VAL;
    } else if (ec != std::errc() || ptr != normal.data() + normal.size()) {
        return std::nullopt;
    }
    return negative ? -value : value;
}

EntryResult ReadNumberEntry(std::string_view text, char decimalSeparator) {
    const auto value = parseNumericText(text, decimalSeparator);
    if (!value) return {std::nullopt, std::string(kInvalidEntryMessage)};
    if (*value < kLowerEntryBound || *value > kUpperEntryBound)
        return {std::nullopt, std::string(kOutOfRangeMessage)};
    return {Number::fromDouble(std::trunc(*value)), {}};
}

EntryResult readWholeEntry(std::string_view text, char decimalSeparator) {
    const auto value = parseNumericText(text, decimalSeparator);
    if (!value) return {std::nullopt, std::string(kInvalidEntryMessage)};
    try {
        return {Number::fromDouble(std::trunc(*value)), {}};
    } catch (const std::overflow_error&) {
        return {std::nullopt, {}};
    }
}

}  // namespace tarn
