#include "core/entry.hpp"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>

namespace tarn {
namespace {

bool isBlank(char c) { return c == ' ' || c == '\t'; }
bool isDigit(char c) { return c >= '0' && c <= '9'; }

// The power of ten of the first digit that is not zero in a C-form number such as "0.0026e-3":
// its side of 1 tells a number too large for a double from one too small, whatever the sign of
// the exponent says on its own (4000 digits and "e-3" are still far too large).
std::int64_t decimalOrder(std::string_view normal) {
    const std::size_t e = std::min(normal.find('e'), normal.size());
    const std::string_view mantissa = normal.substr(0, e);
    const std::size_t point = std::min(mantissa.find('.'), mantissa.size());
    const std::size_t first = mantissa.find_first_not_of("0.");
    if (first == std::string_view::npos) return 0;  // zero is never out of range
    std::int64_t order = first < point ? static_cast<std::int64_t>(point - first) - 1
                                       : -static_cast<std::int64_t>(first - point);
    std::int64_t exponent = 0;
    for (const char c : normal.substr(std::min(e + 1, normal.size())))
        if (isDigit(c)) exponent = std::min<std::int64_t>(exponent * 10 + (c - '0'), 1'000'000'000);
    return order + (e + 1 < normal.size() && normal[e + 1] == '-' ? -exponent : exponent);
}

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
        value = decimalOrder(normal) < 0 ? 0.0 : HUGE_VAL;
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
