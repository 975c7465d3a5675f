// The Number conversions and text forms. Conversions check the range before they scale, in
// 128-bit integers, so an out-of-range value is refused instead of wrapping.
#include "core/number.hpp"

#include <cmath>
#include <cstdio>

namespace tarn {
namespace {
// Above every whole value of the type (and NaN fails the test too): the whole part of anything
// below it fits 64 bits, and the exact range check follows.
constexpr double kBeyondRange = 1e15;
}  // namespace

Number Number::fromWhole(std::int64_t whole) {
    if (whole > kMaxWhole || whole < -kMaxWhole - 1) throw std::overflow_error("Number overflow");
    return fromRaw(whole * kScale);
}

Number Number::fromDouble(double value) {
    // Whole part and fraction apart: scaling the whole value in double precision would lose
    // the last digits of large numbers (they pass 2^53 once multiplied by 10 000).
    if (!(std::fabs(value) < kBeyondRange)) throw std::overflow_error("Number overflow");
    const double whole = std::trunc(value);
    const double fraction = std::nearbyint((value - whole) * kScale);  // ties to even
    const __int128 raw = static_cast<__int128>(static_cast<std::int64_t>(whole)) * kScale +
                         static_cast<std::int64_t>(fraction);
    if (raw > INT64_MAX || raw < INT64_MIN) throw std::overflow_error("Number overflow");
    return fromRaw(static_cast<std::int64_t>(raw));
}

std::string signedText(Number n) {
    const std::int64_t raw = n.raw();
    // Work on the unsigned magnitude so that the most negative value is safe.
    const std::uint64_t magnitude =
        raw < 0 ? 0 - static_cast<std::uint64_t>(raw) : static_cast<std::uint64_t>(raw);
    std::string text = raw < 0 ? "-" : " ";
    text += std::to_string(magnitude / Number::kScale);
    std::uint64_t fraction = magnitude % Number::kScale;
    if (fraction != 0) {
        char digits[8];
        std::snprintf(digits, sizeof digits, "%04llu", static_cast<unsigned long long>(fraction));
        std::string f = digits;
        while (!f.empty() && f.back() == '0') f.pop_back();
        text += '.';
        text += f;
    }
    return text;
}

std::string trimmedText(Number n) {
    std::string text = signedText(n);
    if (!text.empty() && text.front() == ' ') text.erase(0, 1);
    return text;
}

std::string doubleText(double value) {
    char buffer[40];
    std::snprintf(buffer, sizeof buffer, "%.15g", value);
    return buffer;
}

}  // namespace tarn
