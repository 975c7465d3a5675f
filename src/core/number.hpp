// Number: the fixed-point type in which every limit, candidate, divisor and count is held.
// It counts ten-thousandths in a signed 64-bit integer, so whole values reach 922 337 203 685 477.
// The engines work on plain 64-bit integers; Number is where typed text and exact text forms meet.
#pragma once

#include <compare>
#include <cstdint>
#include <stdexcept>
#include <string>

namespace tarn {

class Number {
public:
    static constexpr std::int64_t kScale = 10000;
    static constexpr std::int64_t kMaxWhole = INT64_MAX / kScale;  // 922 337 203 685 477

    constexpr Number() = default;

    // A whole value; throws std::overflow_error outside the type's range.
    static Number fromWhole(std::int64_t whole);
    // Scales by 10 000 and rounds ties to even; throws std::overflow_error outside the range.
    static Number fromDouble(double value);
    static constexpr Number fromRaw(std::int64_t raw) {
        Number n;
        n.raw_ = raw;
        return n;
    }

    constexpr std::int64_t raw() const { return raw_; }
    // Whole part toward zero.
    constexpr std::int64_t whole() const { return raw_ / kScale; }

    constexpr auto operator<=>(const Number&) const = default;

private:
    std::int64_t raw_ = 0;
};

// A blank for zero and positive values (minus sign otherwise), the digits, and the
// fraction only when it is not zero: 360 gives " 360".
std::string signedText(Number n);
// The signed text without surrounding blanks: 360 gives "360".
std::string trimmedText(Number n);
// Shortest decimal form with at most 15 significant digits; whole values have no point.
std::string doubleText(double value);

}  // namespace tarn
