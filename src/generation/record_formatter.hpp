// Formats result records ("11\r\n" or "5;11\r\n") into a caller's buffer without dividing per
// record: each number is kept as its text above the last four digits plus the last four digits as
// a small integer. Adding a gap touches only that integer; its four digits come from a table, and
// the upper text is rebuilt only when the integer passes 9999 (once per hundreds of records).
// A record is then a fixed 16-byte copy, a 4-byte copy and CR LF.
#pragma once

#include <array>
#include <charconv>
#include <cstdint>
#include <cstring>

namespace tarn {

namespace detail {

// The last four digits are kept apart as a number below 10^4.
inline constexpr std::uint64_t kLowModulus = 10000;
// Room for the upper digits of any 64-bit number (at most 16 of them): a record copies this
// fixed count of bytes whatever the digits' count, and the caller's buffer has room past them.
inline constexpr std::size_t kUpperCopy = 16;

struct FourDigits {
    std::array<std::array<char, 4>, kLowModulus> text;
    constexpr FourDigits() : text() {
        for (std::size_t i = 0; i < kLowModulus; ++i) {
            text[i] = {static_cast<char>('0' + i / 1000), static_cast<char>('0' + i / 100 % 10),
                       static_cast<char>('0' + i / 10 % 10), static_cast<char>('0' + i % 10)};
        }
    }
};
inline constexpr FourDigits kFourDigits{};

// A whole number that grows by small steps and prints itself fast.
class GrowingDecimal {
public:
    explicit GrowingDecimal(std::uint64_t value) { set(value); }

    void add(std::uint64_t step) {
        low_ += step;
        if (low_ >= kLowModulus) set(high_ * kLowModulus + low_);
    }

    char* write(char* out) const {
        if (highLength_ == 0) return std::to_chars(out, out + kUpperCopy, low_).ptr;
        std::memcpy(out, upper_, kUpperCopy);
        out += highLength_;
        std::memcpy(out, kFourDigits.text[low_].data(), 4);
        return out + 4;
    }

private:
    void set(std::uint64_t value) {
        high_ = value / kLowModulus;
        low_ = value % kLowModulus;
        highLength_ =
            high_ == 0
                ? 0
                : static_cast<int>(std::to_chars(upper_, upper_ + kUpperCopy, high_).ptr - upper_);
    }

    std::uint64_t high_ = 0;
    std::uint64_t low_ = 0;
    int highLength_ = 0;
    char upper_[kUpperCopy] = {};
};

}  // namespace detail

class RecordFormatter {
public:
    // Room that a caller's buffer must keep free for one record, fixed-size copies included.
    static constexpr std::size_t kMaxRecord = 64;

    // `last` is the number the next gap is counted from; `count` the records before the next one.
    RecordFormatter(std::uint64_t last, std::uint64_t count, bool enumerated)
        : enumerated_(enumerated), last_(last), number_(last), serial_(count) {}

    // Appends the record of `prime` (above the previous one) at `out`; returns the new end.
    char* put(char* out, std::uint64_t prime) {
        number_.add(prime - last_);
        last_ = prime;
        if (enumerated_) {
            serial_.add(1);
            out = serial_.write(out);
            *out++ = ';';
        }
        out = number_.write(out);
        std::memcpy(out, "\r\n", 2);
        return out + 2;
    }

private:
    bool enumerated_;
    std::uint64_t last_;
    detail::GrowingDecimal number_;
    detail::GrowingDecimal serial_;
};

}  // namespace tarn
