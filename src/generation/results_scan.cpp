// The scan keeps only a few numbers of state per record, so its cost is one memchr and a short
// digit loop per line; a line that straddles two blocks is carried over in a small buffer.
#include "generation/results_scan.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <memory>
#include <optional>
#include <string_view>

#include "core/file_messages.hpp"
#include "core/miller_rabin.hpp"

namespace tarn {
namespace {

// The smallest prime p with low < p <= high, or nothing. When the files agree the window is
// shorter than a prime gap, so only a handful of numbers are ever tested.
std::optional<std::int64_t> firstPrimeAbove(std::int64_t low, std::int64_t high) {
    for (std::int64_t n = low < 1 ? 2 : low + 1; n <= high; ++n)
        if (isPrime(static_cast<std::uint64_t>(n))) return n;
    return std::nullopt;
}

constexpr std::size_t kBlockBytes = std::size_t{1} << 20;
// The longest record the writers produce is a 14-digit serial number, ';', a 15-digit prime and
// CR LF; anything much longer is garbage, and the carry buffer never grows past this.
constexpr std::size_t kLongestLine = 64;
constexpr std::int64_t kSeeds[] = {2, 3, 5, 7};

// Digits without a leading zero and without overflow; nothing else.
bool parseDigits(std::string_view text, std::int64_t& value) {
    if (text.empty() || text.size() > 18 || text[0] == '0') return false;
    std::int64_t v = 0;
    for (const char c : text) {
        if (c < '0' || c > '9') return false;
        v = v * 10 + (c - '0');
    }
    value = v;
    return true;
}

class Scanner {
public:
    Scanner(std::int64_t resumePoint, ResultsScan& scan) : resumePoint_(resumePoint), scan_(scan) {}

    // One complete line, terminator included. False ends the scan (damage, or past the
    // candidate); `lineStart` is the file offset of the line.
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

    static std::string printable(std::string_view record) {
        std::string text;
        for (const char c : record.substr(0, 40))
            text += (c >= ' ' && c <= '~' && c != '"') ? c : '?';
        if (record.size() > 40) text += "...";
        return text;
    }

    std::int64_t resumePoint_;
    ResultsScan& scan_;
};

struct FileCloser {
    int fd;
    ~FileCloser() { ::close(fd); }
};

// Runs the scanner over the file; false when it ended early (damage or past the candidate).
ResultsScan::Outcome readLines(int fd, Scanner& scanner, ResultsScan& scan,
                               const StopSignal& stop) {
    const auto block = std::make_unique<char[]>(kBlockBytes);
    std::string carry;  // the start of a line that continues in the next block
    bool carryOverlong = false;
    std::uint64_t offset = 0;  // file offset of block[0]
    for (;;) {
        if (stop.requested()) return ResultsScan::Outcome::Stopped;
        const ssize_t got = ::read(fd, block.get(), kBlockBytes);
        if (got < 0) {
            if (errno == EINTR) continue;
            scan.problem = systemReason(errno);
            return ResultsScan::Outcome::Unreadable;
        }
        if (got == 0) break;
        const char* p = block.get();
        const char* const end = p + got;
        while (p < end) {
            const char* eol = static_cast<const char*>(std::memchr(p, '\n', end - p));
            if (!eol) {
                if (carry.size() + (end - p) > kLongestLine) carryOverlong = true;
                if (!carryOverlong) carry.append(p, end);
                break;
            }
            const std::uint64_t lineOffset = offset + (p - block.get());
            bool go;
            if (carry.empty() && !carryOverlong) {
                go = scanner.line(std::string_view(p, eol + 1 - p), lineOffset);
            } else {
                const std::uint64_t start = lineOffset - carry.size();
                if (carryOverlong) carry = "overlong line";  // unreadable as a record
                carry.append(p, eol + 1);
                go = scanner.line(carry, start);
                carry.clear();
                carryOverlong = false;
            }
            if (!go)
                return scan.outcome == ResultsScan::Outcome::Damaged ? ResultsScan::Outcome::Damaged
                                                                     : ResultsScan::Outcome::Sound;
            p = eol + 1;
        }
        offset += static_cast<std::uint64_t>(got);
    }
    return ResultsScan::Outcome::Sound;
}

}  // namespace

ResultsScan scanResults(const std::string& path, std::int64_t resumePoint, const StopSignal& stop) {
    ResultsScan scan;
    const int fd = ::open(path.c_str(), O_RDONLY | O_CLOEXEC);
    if (fd < 0) {
        scan.problem = systemReason(errno);
        return scan;
    }
    const FileCloser closer{fd};
    const off_t size = ::lseek(fd, 0, SEEK_END);
    if (size < 0 || ::lseek(fd, 0, SEEK_SET) != 0) {
        scan.problem = systemReason(errno);
        return scan;
    }
    scan.fileBytes = static_cast<std::uint64_t>(size);
    ::posix_fadvise(fd, 0, 0, POSIX_FADV_SEQUENTIAL);

    scan.outcome = ResultsScan::Outcome::Sound;
    Scanner scanner(resumePoint, scan);
    scan.outcome = readLines(fd, scanner, scan, stop);
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
