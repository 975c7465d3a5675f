// The fast check of the resume's read-back: over a stretch of whole lines it accepts, a few
// vector operations per line, exactly the records the job itself writes (see results_scan.cpp),
// and leaves the first line it does not accept to the plain check.
#pragma once

#include <bit>
#include <cstdint>

#include "generation/scan/scan_outcome.hpp"
#include "generation/scan/keys.hpp"

namespace tarn::scan {

// The fast check over a stretch of complete lines; it starts where the scan stands and stops at
// the first line it does not accept.
class FastRun {
public:
    FastRun(const ResultsScan& scan, Key ceiling)
        : last_(scan::keyOf(scan.lastPrime)),
          ceiling_(ceiling),
          serialKey_(scan::keyOf(scan.records + 1)),
          serialDigits_(scan::digitCount(scan.records + 1)) {}

    // Where the first line not accepted begins (`end` when all were); [line, end) holds whole
    // lines but for the last, and the buffer has room around it.
    template <bool kEnumerated>
    const char* run(const char* line, const char* end) {
        // As the keys increase, the last one tells whether any was above the candidate; only then
        // is the run done again to find the first such line, which happens once in a scan.
        const FastRun start = *this;
        const char* const stop = stretch<kEnumerated, false>(line, end);
        if (!(ceiling_ < last_)) return stop;
        *this = start;
        return stretch<kEnumerated, true>(line, end);
    }

    // Records accepted; the last accepted number.
    std::int64_t accepted() const { return accepted_; }
    std::int64_t lastPrime() const { return scan::valueOf(last_); }

private:
    template <bool kEnumerated, bool kCeiling>
    const char* stretch(const char* line, const char* end) {
        for (const char* chunk = line; chunk < end; chunk += 64) {
            std::uint64_t ends = scan::lineEnds(chunk);
            if (end - chunk < 64) ends &= (std::uint64_t{1} << (end - chunk)) - 1;
            for (; ends != 0; ends &= ends - 1) {
                const char* const lineEnd = chunk + std::countr_zero(ends);
                if (!accept<kEnumerated, kCeiling>(line, lineEnd)) return line;
                line = lineEnd + 1;
            }
        }
        return line;
    }

    // The line [line, lineEnd], lineEnd at its '\n'; with kCeiling, only at or below the candidate.
    template <bool kEnumerated, bool kCeiling>
    bool accept(const char* line, const char* lineEnd) {
        const char* digits = line;
        if constexpr (kEnumerated) {
            // The serial number must be the counter's digits and a ';'. Once its bytes equal
            // the counter's they are digits, so the ';' lies before this line's end.
            const char* const semicolon = line + serialDigits_;
            if (*semicolon != ';' ||
                !(scan::keyBefore(semicolon, scan::keyMask(serialDigits_)) == serialKey_))
                return false;
            digits = semicolon + 1;
        }
        const char* const cr = lineEnd - 1;
        const auto length = static_cast<std::size_t>(cr - digits);  // huge when negative
        if (length - 1 >= 16 || *cr != '\r' || *digits == '0') return false;
        const Key mask = scan::keyMask(length);
        const Key key = scan::keyBefore(cr, mask);
        // One branch for the checks, taken only at a line the plain check has to see.
        const bool fits =
            scan::allDigits(key, mask) & (last_ < key) & (!kCeiling || !(ceiling_ < key));
        if (!fits) return false;
        last_ = key;
        ++accepted_;
        if constexpr (kEnumerated) scan::increment(serialKey_, serialDigits_);
        return true;
    }

    Key last_;
    Key ceiling_;
    Key serialKey_;
    int serialDigits_;
    std::int64_t accepted_ = 0;
};

}  // namespace tarn::scan
