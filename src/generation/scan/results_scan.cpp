// Reads the results file back for a resume and checks every record, at several gigabytes a
// second when the file is in the page cache (bench/resume_gathering_bench.cpp), a few times the
// speed of parsing it line by line.
//
// Two checks of a line work together. The plain one (`LineCheck`) takes a line apart and applies
// the rules in order; it decides every outcome and writes every message. The fast one
// (`FastRun`) only accepts: a line the job itself would have written, which the plain check would
// accept in the same way. It is fast because it does little per line and never calls out:
// - line ends are found 64 bytes at a time, as a bit mask from SIMD compares;
// - a record is not parsed: its digits, right-aligned in the 16 bytes before the CR, form a key
//   that orders like the number (keys.hpp), so "only digits", "increasing" and "at
//   or below the candidate" are a few vector operations on one register, without a branch that
//   depends on the data;
// - the serial number is compared as text with a counter kept in the same form;
// - the number itself is worked out once, for the last record of a run.
// The first line it does not accept goes to the plain check, which accepts it too (a number of 17
// or 18 digits) or ends the scan with the message; the seeds 2, 3, 5, 7 always go there. So the
// fast path can make the scan quicker but never different.
//
// The file is read in blocks into one buffer; the start of a line cut by a block boundary is
// moved in front of the next block, so every line is checked in one piece. A line longer than any
// record is damaged whatever its middle holds, so only its start and its end are kept.
#include "generation/scan/results_scan.hpp"

#include <bit>
#include <cerrno>
#include <cstring>
#include <memory>
#include <optional>
#include <string_view>

#include "core/miller_rabin.hpp"
#include "core/texts.hpp"
#include "generation/scan/fast_run.hpp"
#include "generation/scan/keys.hpp"
#include "generation/scan/line_check.hpp"
#include "platform/files.hpp"

namespace tarn {
namespace {

using scan::FastRun;
using scan::Key;
using scan::LineCheck;

// The smallest prime p with low < p <= high, or nothing. When the files agree the window is
// shorter than a prime gap, so only a handful of numbers are ever tested.
std::optional<std::int64_t> firstPrimeAbove(std::int64_t low, std::int64_t high) {
    for (std::int64_t n = low < 1 ? 2 : low + 1; n <= high; ++n)
        if (isPrime(static_cast<std::uint64_t>(n))) return n;
    return std::nullopt;
}

// The longest record the writers produce is a 14-digit serial number, ';', a 15-digit prime and
// CR LF; a longer line cannot be a record, and the start of a line carried to the next block
// never grows past this.
constexpr std::size_t kLongestLine = 64;
// Room in front of a block for a carried line and the 16 bytes a key reads before its end, and
// behind it for the 64 bytes a line-end mask reads and a serial number looked for past a line.
constexpr std::size_t kFrontRoom = 128;
constexpr std::size_t kBackRoom = 128;

class Scanner {
public:
    Scanner(std::int64_t resumePoint, ResultsScan& scan)
        : check_(resumePoint, scan),
          scan_(scan),
          ceiling_(resumePoint < scan::kKeyLimit ? scan::keyOf(resumePoint)
                                                 : scan::aboveEveryKey()) {}

    // Checks the whole lines of [line, end), `line` at file offset `offset`. Returns where the
    // unfinished last line begins, or nothing when the scan has ended.
    const char* lines(const char* line, const char* end, std::uint64_t offset) {
        const char* const begin = line;
        for (;;) {
            if (fastReady(end - line)) {
                FastRun run(scan_, ceiling_);
                line = scan_.enumerated ? run.run<true>(line, end) : run.run<false>(line, end);
                if (run.accepted() > 0) {
                    scan_.records += run.accepted();
                    scan_.lastPrime = run.lastPrime();
                    scan_.keptBytes = offset + static_cast<std::uint64_t>(line - begin);
                }
            }
            const auto* lineEnd = static_cast<const char*>(std::memchr(line, '\n', end - line));
            if (!lineEnd) return line;
            if (!check_.line(std::string_view(line, lineEnd + 1 - line),
                             offset + static_cast<std::uint64_t>(line - begin)))
                return nullptr;
            line = lineEnd + 1;
        }
    }

    // A line longer than kLongestLine, given by its first kLongestLine bytes and the byte before
    // its '\n': what the plain check makes of the whole line (it never accepts one).
    bool longLine(std::string_view start, char beforeEnd, std::uint64_t lineStart) {
        std::string standIn(start);
        standIn += beforeEnd;
        standIn += '\n';
        return check_.line(standIn, lineStart);
    }

private:
    // After the seeds, with numbers the keys can hold, and serial numbers too for every line
    // that fits in `bytes`.
    bool fastReady(std::ptrdiff_t bytes) const {
        return scan_.records >= 4 && scan_.lastPrime < scan::kKeyLimit &&
               scan_.records + bytes < scan::kKeyLimit;
    }

    LineCheck check_;
    ResultsScan& scan_;
    Key ceiling_;
};

ResultsScan::Outcome readLines(platform::File& file, Scanner& scanner, ResultsScan& scan,
                               const StopSignal& stop, std::size_t blockBytes) {
    // Zeroed, so that what the masks and keys read around the lines is defined.
    const auto buffer = std::make_unique<char[]>(kFrontRoom + blockBytes + kBackRoom);
    char* const block = buffer.get() + kFrontRoom;
    std::uint64_t offset = 0;  // file offset of block[0]
    std::size_t carried = 0;   // bytes of an unfinished line moved in front of the block
    // An unfinished line longer than kLongestLine: its start, its last byte so far, its offset.
    std::string longStart;
    char longLast = 0;
    std::uint64_t longOffset = 0;
    const auto ended = [&scan] {
        return scan.outcome == ResultsScan::Outcome::Damaged ? ResultsScan::Outcome::Damaged
                                                             : ResultsScan::Outcome::Sound;
    };
    for (;;) {
        if (stop.requested()) return ResultsScan::Outcome::Stopped;
        int error = 0;
        const std::ptrdiff_t got = file.read(block, blockBytes, error);
        if (got < 0) {
            if (error == EINTR) continue;
            scan.problem = systemReason(error);
            return ResultsScan::Outcome::Unreadable;
        }
        if (got == 0) break;
        const char* line = block - carried;
        const char* const end = block + got;
        if (!longStart.empty()) {
            const auto* lineEnd = static_cast<const char*>(std::memchr(block, '\n', got));
            if (!lineEnd) {
                longLast = end[-1];
                offset += static_cast<std::uint64_t>(got);
                continue;
            }
            if (!scanner.longLine(longStart, lineEnd > block ? lineEnd[-1] : longLast, longOffset))
                return ended();
            longStart.clear();
            line = lineEnd + 1;
        }
        const std::uint64_t lineOffset = offset + static_cast<std::uint64_t>(line - block);
        const char* const rest = scanner.lines(line, end, lineOffset);
        if (!rest) return ended();
        carried = static_cast<std::size_t>(end - rest);
        if (carried > kLongestLine) {
            longStart.assign(rest, kLongestLine);
            longLast = end[-1];
            longOffset = lineOffset + static_cast<std::uint64_t>(rest - line);
            carried = 0;
        } else {
            std::memmove(block - carried, rest, carried);
        }
        offset += static_cast<std::uint64_t>(got);
    }
    return ResultsScan::Outcome::Sound;
}

}  // namespace

ResultsScan scanResults(const std::string& path, std::int64_t resumePoint, const StopSignal& stop,
                        std::size_t blockBytes) {
    ResultsScan scan;
    int error = 0;
    platform::File file = platform::File::open(path, platform::File::Mode::Read, error);
    if (error == 0) error = file.size(scan.fileBytes);
    if (error != 0) {
        scan.problem = systemReason(error);
        return scan;
    }
    file.adviseSequential();

    scan.outcome = ResultsScan::Outcome::Sound;
    Scanner scanner(resumePoint, scan);
    scan.outcome = readLines(file, scanner, scan, stop, blockBytes);
    if (scan.outcome != ResultsScan::Outcome::Sound) return scan;

    if (scan.records == 0) {
        scan.outcome = ResultsScan::Outcome::Damaged;
        scan.problem = "holds no records at or below " + std::to_string(resumePoint);
        return scan;
    }
    // The last record must be the last prime the interrupted job had reached.
    if (const auto missing = firstPrimeAbove(scan.lastPrime, resumePoint)) {
        scan.outcome = ResultsScan::Outcome::Damaged;
        scan.problem = "ends with " + std::to_string(scan.lastPrime) + ", but the prime " +
                       std::to_string(*missing) + " is missing before the checkpoint's candidate " +
                       std::to_string(resumePoint);
    }
    return scan;
}

}  // namespace tarn
