// The read-back of the results file, with its fast path, against its plain check applied to one
// line at a time. Random files of records in either form, each damaged in the way its table row
// names, are read in blocks of many sizes, among them blocks whose boundaries fall inside the
// damaged line and inside the last record at or below the checkpoint. Every field of the outcome
// must agree, the message included.
#include "generation/scan/results_scan.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <functional>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#include "core/miller_rabin.hpp"
#include "generation/scan/line_check.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using Outcome = ResultsScan::Outcome;

// The other side: the plain check applied to one whole line after another, then the two checks
// after the last line.
ResultsScan plainScan(const std::string& file, std::int64_t resumePoint) {
    ResultsScan scan;
    scan.outcome = Outcome::Sound;
    scan.fileBytes = file.size();
    scan::LineCheck check(resumePoint, scan);
    for (std::size_t start = 0, end; (end = file.find('\n', start)) != std::string::npos;
         start = end + 1)
        if (!check.line(std::string_view(file).substr(start, end + 1 - start), start)) break;
    if (scan.outcome != Outcome::Sound) return scan;
    scan.outcome = Outcome::Damaged;
    if (scan.records == 0)
        scan.problem = "holds no records at or below " + std::to_string(resumePoint);
    for (std::int64_t n = scan.lastPrime + 1; scan.records > 0 && n <= resumePoint; ++n)
        if (isPrime(static_cast<std::uint64_t>(n))) {
            scan.problem = "ends with " + std::to_string(scan.lastPrime) + ", but the prime " +
                           std::to_string(n) + " is missing before the checkpoint's candidate " +
                           std::to_string(resumePoint);
            break;
        }
    if (scan.problem.empty()) scan.outcome = Outcome::Sound;
    return scan;
}

std::string describe(const ResultsScan& scan) {
    return std::to_string(static_cast<int>(scan.outcome)) + " \"" + scan.problem + "\" records " +
           std::to_string(scan.records) + " last " + std::to_string(scan.lastPrime) +
           " enumerated " + std::to_string(scan.enumerated) + " kept " +
           std::to_string(scan.keptBytes) + " of " + std::to_string(scan.fileBytes);
}

// ---- Random files: the seeds, random increasing numbers of any length up to 18 digits, the
// largest prime at or below the checkpoint's candidate, sometimes records beyond it.

using Random = std::mt19937_64;

std::int64_t uniform(Random& random, std::int64_t low, std::int64_t high) {
    return std::uniform_int_distribution<std::int64_t>(low, high)(random);
}

std::int64_t power10(int digits) {
    std::int64_t p = 1;
    while (digits-- > 0) p *= 10;
    return p;
}

struct Draft {
    bool enumerated = false;
    std::int64_t resumePoint = 0;
    std::vector<std::string> lines;  // each with its line end, but for a torn last one
    std::size_t checkpointLine = 0;  // the last record at or below resumePoint
    std::size_t touched = 0;         // the line the damage went to

    std::string record(std::int64_t serial, std::int64_t value) const {
        return (enumerated ? std::to_string(serial) + ";" : "") + std::to_string(value) + "\r\n";
    }
    void insert(std::size_t at, const std::string& line) {
        lines.insert(lines.begin() + static_cast<std::ptrdiff_t>(at), line);
        if (at <= checkpointLine) ++checkpointLine;
    }
    void erase(std::size_t at) {
        lines.erase(lines.begin() + static_cast<std::ptrdiff_t>(at));
        if (at <= checkpointLine && checkpointLine > 0) --checkpointLine;
    }
    std::string text() const {
        std::string all;
        for (const std::string& line : lines) all += line;
        return all;
    }
    // Appends records above the candidate: increasing, well formed, numbered on.
    void appendBeyond(Random& random, int count) {
        std::int64_t value = resumePoint;
        for (int i = 0; i < count && value < power10(17); ++i) {
            value += uniform(random, 1, random() % 2 ? 30 : value);
            lines.push_back(record(static_cast<std::int64_t>(lines.size()) + 1, value));
        }
    }
};

Draft randomDraft(Random& random) {
    Draft draft;
    draft.enumerated = random() % 2;
    const int digits = static_cast<int>(uniform(random, 2, 18));
    draft.resumePoint = uniform(random, power10(digits - 1), power10(digits) - 1);
    std::int64_t last = draft.resumePoint;
    while (!isPrime(static_cast<std::uint64_t>(last))) --last;
    std::vector<std::int64_t> values;
    for (int i = static_cast<int>(uniform(random, 0, 40)); i > 0; --i) {
        const int length = static_cast<int>(uniform(random, 1, digits));
        const std::int64_t value = uniform(random, power10(length - 1), power10(length) - 1);
        if (value > 7 && value < last) values.push_back(value);
    }
    std::sort(values.begin(), values.end());
    values.erase(std::unique(values.begin(), values.end()), values.end());
    values.insert(values.begin(), {2, 3, 5, 7});
    if (last > 7) values.push_back(last);
    for (std::size_t i = 0; i < values.size(); ++i)
        draft.lines.push_back(draft.record(static_cast<std::int64_t>(i) + 1, values[i]));
    draft.checkpointLine = draft.lines.size() - 1;
    if (random() % 3 == 0) draft.appendBeyond(random, static_cast<int>(uniform(random, 1, 4)));
    return draft;
}

std::size_t anyLine(Draft& draft, Random& random) {
    draft.touched = static_cast<std::size_t>(uniform(random, 0, draft.lines.size() - 1));
    return draft.touched;
}

// Bytes a stray byte is drawn from: the digits' neighbours in ASCII, separators, control bytes.
const std::string kStray = std::string("/:0;9\r\n x-+\x7f\xff") + '\0';

struct Damage {
    const char* name;
    std::function<void(Draft&, Random&)> apply;
};

const Damage kDamages[] = {
    {"none", [](Draft& d, Random&) { d.touched = d.checkpointLine; }},
    {"a digit changed",  // to another, or to one of its neighbours in ASCII, '/' and ':'
     [](Draft& d, Random& r) {
         std::string& line = d.lines[anyLine(d, r)];
         std::vector<std::size_t> digits;
         for (std::size_t i = 0; i < line.size(); ++i)
             if (line[i] >= '0' && line[i] <= '9') digits.push_back(i);
         char& c = line[digits[static_cast<std::size_t>(uniform(r, 0, digits.size() - 1))]];
         c = r() % 3   ? static_cast<char>('0' + (c - '0' + uniform(r, 1, 9)) % 10)
             : r() % 2 ? '/'
                       : ':';
     }},
    {"a line dropped", [](Draft& d, Random& r) { d.erase(anyLine(d, r)); }},
    {"a line repeated",
     [](Draft& d, Random& r) {
         const std::size_t at = anyLine(d, r);
         d.insert(at, d.lines[at]);
     }},
    {"lines swapped",
     [](Draft& d, Random& r) {
         const std::size_t at = anyLine(d, r);
         if (at + 1 < d.lines.size()) std::swap(d.lines[at], d.lines[at + 1]);
     }},
    {"a serial number off by one",  // in a plain file, a serial number where none belongs
     [](Draft& d, Random& r) {
         std::string& line = d.lines[anyLine(d, r)];
         const std::size_t semicolon = line.find(';');
         if (semicolon == std::string::npos) {
             line = std::to_string(d.touched + 1) + ";" + line;
             return;
         }
         const std::int64_t serial = std::stoll(line.substr(0, semicolon)) + (r() % 2 ? 1 : -1);
         line = std::to_string(serial) + line.substr(semicolon);
     }},
    {"a leading zero",
     [](Draft& d, Random& r) {
         std::string& line = d.lines[anyLine(d, r)];
         const std::size_t semicolon = line.find(';');
         const std::size_t at = semicolon != std::string::npos && r() % 2 ? semicolon + 1 : 0;
         line = line.substr(0, at) + '0' + line.substr(at);
     }},
    {"a stray byte",
     [](Draft& d, Random& r) {
         std::string& line = d.lines[anyLine(d, r)];
         line.insert(line.begin() + uniform(r, 0, static_cast<std::int64_t>(line.size())),
                     kStray[static_cast<std::size_t>(uniform(r, 0, kStray.size() - 1))]);
     }},
    {"a byte lost",
     [](Draft& d, Random& r) {
         std::string& line = d.lines[anyLine(d, r)];
         line.erase(static_cast<std::size_t>(uniform(r, 0, line.size() - 1)), 1);
     }},
    {"a CR missing",
     [](Draft& d, Random& r) {
         std::string& line = d.lines[anyLine(d, r)];
         line.erase(line.size() - 2, 1);
     }},
    {"an empty line", [](Draft& d, Random& r) { d.insert(anyLine(d, r), "\r\n"); }},
    {"a long line",  // longer than any record, mostly digits, mostly ending in CR LF
     [](Draft& d, Random& r) {
         std::string line;
         for (std::int64_t n = uniform(r, 19, 300); n > 0; --n)
             line += r() % 8 ? static_cast<char>('0' + r() % 10) : ';';
         d.insert(anyLine(d, r), line + (r() % 4 ? "\r\n" : "\n"));
     }},
    {"a torn last line",
     [](Draft& d, Random& r) {
         const std::size_t at = anyLine(d, r);
         d.lines.resize(at + 1);
         d.lines[at].resize(static_cast<std::size_t>(uniform(r, 0, d.lines[at].size() - 1)));
     }},
    {"records past the checkpoint, then garbage",
     [](Draft& d, Random& r) {
         d.lines.resize(d.checkpointLine + 1);
         d.appendBeyond(r, static_cast<int>(uniform(r, 1, 3)));
         d.touched = d.checkpointLine + 1;
         d.lines.push_back(r() % 2 ? "garbage\r\n" : "0;0");
     }},
};

// Block sizes for one file: tiny, small, the default, and sizes whose boundaries cut the damaged
// line, the checkpoint's record and the line after it (the n-th boundary of a block of b bytes
// lies at n * b).
std::vector<std::size_t> blockSizes(const Draft& draft, Random& random) {
    std::vector<std::size_t> sizes{static_cast<std::size_t>(uniform(random, 1, 8)),
                                   static_cast<std::size_t>(uniform(random, 9, 120)),
                                   kResultsScanBlockBytes};
    std::vector<std::size_t> starts{0};
    for (const std::string& line : draft.lines) starts.push_back(starts.back() + line.size());
    for (const std::size_t target :
         {draft.touched, draft.checkpointLine, draft.checkpointLine + 1}) {
        if (target >= draft.lines.size()) continue;
        const std::size_t length = draft.lines[target].size();
        for (std::size_t n = 1; n <= 3 && n < length; ++n)
            sizes.push_back((starts[target] + static_cast<std::size_t>(
                                                  uniform(random, static_cast<std::int64_t>(n),
                                                          static_cast<std::int64_t>(length) - 1))) /
                            n);
    }
    sizes.erase(std::remove(sizes.begin(), sizes.end(), 0), sizes.end());
    return sizes;
}

TEST(ResultsScan, AgreesWithALineByLineReadingOfRandomDamagedFiles) {
    const test::TempFolder folder;
    const std::string path = folder.path() + "primes.txt";
    Random random(20240611);
    for (const Damage& damage : kDamages) {
        int failures = 0;
        for (int n = 0; n < 150 && failures < 3; ++n) {
            Draft draft = randomDraft(random);
            damage.apply(draft, random);
            const std::string text = draft.text();
            std::filesystem::remove(path);  // ext4 flushes a file cut to 0 and written again
            test::writeFile(path, text);
            const std::string expected = describe(plainScan(text, draft.resumePoint));
            for (const std::size_t blockBytes : blockSizes(draft, random)) {
                const std::string got =
                    describe(scanResults(path, draft.resumePoint, StopSignal{}, blockBytes));
                if (got == expected) continue;
                ADD_FAILURE() << damage.name << ", blocks of " << blockBytes << ", candidate "
                              << draft.resumePoint << ", file:\n"
                              << text << "\ngot      " << got << "\nexpected " << expected;
                ++failures;
                break;
            }
        }
    }
}

}  // namespace
}  // namespace tarn
