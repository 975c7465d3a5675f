// The plain check of one line of the results file, for the resume's read-back: it takes the line
// apart and applies the rules in order, and so decides every outcome and writes every message.
// The fast path of the scan only ever accepts lines this check would accept too.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "generation/scan/scan_outcome.hpp"

namespace tarn::scan {

inline constexpr std::int64_t kSeeds[] = {2, 3, 5, 7};

// Digits without a leading zero and without overflow; nothing else.
inline bool parseDigits(std::string_view text, std::int64_t& value) {
    if (text.empty() || text.size() > 18 || text[0] == '0') return false;
    std::int64_t v = 0;
    for (const char c : text) {
        if (c < '0' || c > '9') return false;
        v = v * 10 + (c - '0');
    }
    value = v;
    return true;
}

inline std::string printable(std::string_view record) {
    std::string text;
    for (const char c : record.substr(0, 40)) text += (c >= ' ' && c <= '~' && c != '"') ? c : '?';
    if (record.size() > 40) text += "...";
    return text;
}

class LineCheck {
public:
    LineCheck(std::int64_t resumePoint, ResultsScan& scan)
        : resumePoint_(resumePoint), scan_(scan) {}

    // One complete line, terminator included, at file offset `lineStart`. False ends the scan
    // (damage, or past the candidate).
    bool line(std::string_view text, std::uint64_t lineStart) {
        const std::int64_t number = scan_.records + 1;
        if (text.size() < 2 || text[text.size() - 2] != '\r')
            return damaged("has a line that does not end with CR LF at line " +
                           std::to_string(number));
        const std::string_view record = text.substr(0, text.size() - 2);
        const std::size_t semicolon = record.find(';');
        const bool enumerated = semicolon != std::string_view::npos;
        std::int64_t value = 0;
        std::int64_t serial = 0;
        const bool readable = enumerated ? parseDigits(record.substr(0, semicolon), serial) &&
                                               parseDigits(record.substr(semicolon + 1), value)
                                         : parseDigits(record, value);
        if (!readable)
            return damaged("holds a record that is not a number at line " + std::to_string(number) +
                           ": \"" + printable(record) + "\"");
        if (scan_.records > 0 && enumerated != scan_.enumerated)
            return damaged("mixes plain and enumerated records at line " + std::to_string(number));
        if (value > resumePoint_) return false;  // beyond the checkpoint: cut from here
        if (enumerated && serial != number)
            return damaged("has the serial number " + std::to_string(serial) + " at line " +
                           std::to_string(number));
        if (number <= 4 && value != kSeeds[number - 1])
            return damaged("does not begin with the records 2, 3, 5 and 7 (line " +
                           std::to_string(number) + " holds " + std::to_string(value) + ")");
        if (scan_.records > 0 && value <= scan_.lastPrime)
            return damaged("is not in increasing order at line " + std::to_string(number) + " (" +
                           std::to_string(value) + " after " + std::to_string(scan_.lastPrime) +
                           ")");
        scan_.enumerated = enumerated;
        scan_.records = number;
        scan_.lastPrime = value;
        scan_.keptBytes = lineStart + text.size();
        return true;
    }

private:
    bool damaged(std::string problem) {
        scan_.outcome = ResultsScan::Outcome::Damaged;
        scan_.problem = std::move(problem);
        return false;
    }

    std::int64_t resumePoint_;
    ResultsScan& scan_;
};

}  // namespace tarn::scan
