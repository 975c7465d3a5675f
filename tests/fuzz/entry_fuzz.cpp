// The entry rule against a slow reading of its own: the text without its surrounding blanks,
// made only of digits, signs, points and exponent marks, read whole by strtod. The first byte
// picks the decimal separator.
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>

#include "core/entry.hpp"
#include "fuzz_check.hpp"

namespace {

std::optional<double> slowReading(std::string text, char separator) {
    const std::size_t first = text.find_first_not_of(" \t");
    if (first == std::string::npos) return std::nullopt;
    text = text.substr(first, text.find_last_not_of(" \t") + 1 - first);
    for (char& c : text) {
        if (c == separator) c = '.';
        if (c == '\0' || std::string("0123456789+-.eE").find(c) == std::string::npos)
            return std::nullopt;
    }
    char* end = nullptr;
    const double value = std::strtod(text.c_str(), &end);
    if (end != text.c_str() + text.size()) return std::nullopt;
    return value;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const char separator = data[0] & 1 ? ',' : '.';
    const std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);
    const std::optional<double> slow = slowReading(text, separator);
    const std::optional<double> fast = tarn::parseNumericText(text, separator);
    FUZZ_CHECK(slow.has_value() == fast.has_value());
    if (!slow) return 0;
    // Below the smallest normal double the two may round differently; the rule sees zero.
    FUZZ_CHECK(*slow == *fast || (std::fabs(*slow) < 1e-300 && std::fabs(*fast) < 1e-300));

    const tarn::EntryResult entry = tarn::ReadNumberEntry(text, separator);
    if (*slow < tarn::kLowerEntryBound || *slow > tarn::kUpperEntryBound)
        FUZZ_CHECK(entry.message == tarn::kOutOfRangeMessage);
    else
        FUZZ_CHECK(entry.accepted() &&
                   entry.number->whole() == static_cast<std::int64_t>(std::trunc(*slow)));
    return 0;
}
