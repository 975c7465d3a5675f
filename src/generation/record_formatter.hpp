// Formats result records ("11\r\n" or "5;11\r\n") into a caller's buffer without dividing the
// prime per digit: the decimal text of the last prime is kept and the gap to the next one is added
// digit by digit (gaps have two or three digits), and the serial number is counted up in its own
// decimal text. Each record is then two fixed 16-byte copies and a CR LF.
#pragma once

#include <cstdint>
#include <cstring>

namespace tarn {

class RecordFormatter {
public:
    // Sizes that a caller's buffer must keep free for one record, copies included.
    static constexpr std::size_t kMaxRecord = 64;

    // `last` is the number the next gap is counted from; `count` the records before the next one.
    RecordFormatter(std::uint64_t last, std::uint64_t count, bool enumerated)
        : enumerated_(enumerated), last_(last) {
        setDigits(number_, numberFirst_, last);
        setDigits(serial_, serialFirst_, count);
    }

    // Appends the record of `prime` (above the previous one) at `out`; returns the new end.
    char* put(char* out, std::uint64_t prime) {
        addGap(prime - last_);
        last_ = prime;
        if (enumerated_) {
            countUp();
            const std::size_t n = static_cast<std::size_t>(kEnd - serialFirst_);
            std::memcpy(out, serial_ + serialFirst_, 16);
            out += n;
            *out++ = ';';
        }
        const std::size_t n = static_cast<std::size_t>(kEnd - numberFirst_);
        std::memcpy(out, number_ + numberFirst_, 16);
        out += n;
        std::memcpy(out, "\r\n", 2);
        return out + 2;
    }

private:
    // Digits stand right-aligned and end at kEnd; zeros fill the left so carries run into them.
    static constexpr int kEnd = 24;

    static void setDigits(char* digits, int& first, std::uint64_t value) {
        std::memset(digits, '0', kSize);
        int i = kEnd;
        do {
            digits[--i] = static_cast<char>('0' + value % 10);
            value /= 10;
        } while (value != 0);
        first = i;
    }

    void addGap(std::uint64_t gap) {
        int i = kEnd - 1;
        while (gap != 0) {
            std::uint64_t d = static_cast<std::uint64_t>(number_[i] - '0') + gap % 10;
            gap /= 10;
            if (d >= 10) {
                d -= 10;
                ++gap;
            }
            number_[i] = static_cast<char>('0' + d);
            --i;
        }
        if (i + 1 < numberFirst_) numberFirst_ = i + 1;
    }

    void countUp() {
        int i = kEnd - 1;
        while (serial_[i] == '9') serial_[i--] = '0';
        ++serial_[i];
        if (i < serialFirst_) serialFirst_ = i;
    }

    static constexpr int kSize = 48;
    bool enumerated_;
    std::uint64_t last_;
    char number_[kSize];
    char serial_[kSize];
    int numberFirst_ = kEnd - 1;
    int serialFirst_ = kEnd - 1;
};

}  // namespace tarn
