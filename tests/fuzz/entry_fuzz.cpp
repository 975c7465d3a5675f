// The entry rule against a slow reading of its own: the text without its surrounding blanks,
// made only of digits, signs, points and exponent marks, read whole by strtod. The first byte
// picks the decimal separator.
#include <cmath>
#include <optional>

#include "core/entry.hpp"
#include "fuzz_check.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const char separator = data[0] & 1 ? ',' : '.';
    const std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);
    std::optional<double> slow;
    const std::size_t first = text.find_first_not_of(" \t");
    std::string bare = first == text.npos ? "" : text.substr(first);
    bare.erase(bare.find_last_not_of(" \t") + 1);
    for (char& c : bare) c = c == separator ? '.' : c;
    char* end = nullptr;
    const double value = std::strtod(bare.c_str(), &end);
    if (!bare.empty() && bare.find_first_not_of("0123456789+-.eE") == bare.npos &&
        end == bare.c_str() + bare.size())
        slow = value;

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
