// The read-back of the results file, with its fast path, against its plain check applied to one
// line at a time: random files of records in either form, each damaged in one way, read in blocks
// of many sizes, among them blocks whose boundaries fall inside the damaged line and around the
// last record at or below the checkpoint. Every field of the outcome must agree, the message
// included. The fuzz target of the scan explores odd bytes; this test, real files.
#include "generation/scan/results_scan.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <random>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

#include "core/miller_rabin.hpp"
#include "generation/scan/line_check.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

// The plain check on each whole line, then the two checks after the last line.
ResultsScan plainScan(const std::string& file, std::int64_t resumePoint) {
    ResultsScan scan;
    scan.outcome = ResultsScan::Outcome::Sound;
    scan.fileBytes = file.size();
    scan::LineCheck check(resumePoint, scan);
    for (std::size_t start = 0, end; (end = file.find('\n', start)) != std::string::npos;
         start = end + 1)
        if (!check.line(std::string_view(file).substr(start, end + 1 - start), start)) break;
    if (scan.outcome != ResultsScan::Outcome::Sound) return scan;
    if (scan.records == 0)
        scan.problem = "holds no records at or below " + std::to_string(resumePoint);
    for (std::int64_t n = scan.lastPrime + 1; scan.records > 0 && n <= resumePoint; ++n)
        if (isPrime(static_cast<std::uint64_t>(n))) {
            scan.problem = "ends with " + std::to_string(scan.lastPrime) + ", but the prime " +
                           std::to_string(n) + " is missing before the checkpoint's candidate " +
                           std::to_string(resumePoint);
            break;
        }
    if (!scan.problem.empty()) scan.outcome = ResultsScan::Outcome::Damaged;
    return scan;
}

std::string describe(const ResultsScan& s) {
    return testing::PrintToString(std::tuple(s.outcome, s.problem, s.records, s.lastPrime,
                                             s.enumerated, s.keptBytes, s.fileBytes));
}

using Random = std::mt19937_64;
std::int64_t uniform(Random& random, std::int64_t low, std::int64_t high) {
    return std::uniform_int_distribution<std::int64_t>(low, high)(random);
}
std::int64_t power10(int digits) { return digits == 0 ? 1 : 10 * power10(digits - 1); }

enum Damage { None, Drop, Repeat, Long, Replace, Insert, Erase, Torn };

// A file of the seeds, random increasing numbers of up to 18 digits and the largest prime at or
// below the candidate, sometimes records beyond it and garbage after them, damaged at one line.
struct Draft {
    std::int64_t resumePoint;
    std::string text;
    std::size_t cuts[3];  // for block boundaries: the damaged line, the checkpoint's, the next
};

Draft randomDraft(Random& r, int damage) {
    Draft d;
    const bool enumerated = r() % 2;
    const int digits = static_cast<int>(uniform(r, 2, 18));
    d.resumePoint = uniform(r, power10(digits - 1), power10(digits) - 1);
    std::int64_t last = d.resumePoint;
    while (!isPrime(static_cast<std::uint64_t>(last))) --last;
    std::vector<std::int64_t> values;
    for (std::int64_t i = uniform(r, 0, 40); i > 0; --i)
        values.push_back(uniform(r, 8, power10(static_cast<int>(uniform(r, 1, digits)))));
    std::erase_if(values, [&](std::int64_t v) { return v >= last; });
    std::sort(values.begin(), values.end());
    values.erase(std::unique(values.begin(), values.end()), values.end());
    values.insert(values.begin(), {2, 3, 5, 7});
    if (last > 7) values.push_back(last);
    const std::size_t checkpointLine = values.size() - 1;
    const bool beyond = r() % 3 == 0;
    for (std::int64_t v = d.resumePoint, i = beyond ? uniform(r, 1, 4) : 0; i > 0; --i)
        if (v < power10(17)) values.push_back(v += uniform(r, 1, r() % 2 ? 30 : v));
    std::vector<std::size_t> starts;
    for (std::size_t i = 0; i < values.size(); ++i) {
        starts.push_back(d.text.size());
        d.text +=
            (enumerated ? std::to_string(i + 1) + ";" : "") + std::to_string(values[i]) + "\r\n";
    }
    starts.push_back(d.text.size());
    if (beyond && r() % 2) d.text += r() % 2 ? "garbage\r\n" : "0;0";
    const std::size_t line = static_cast<std::size_t>(uniform(r, 0, values.size() - 1));
    const std::size_t start = starts[line], length = starts[line + 1] - start;
    const std::string record = d.text.substr(start, length);
    // A byte near the digits in ASCII, a separator, a control byte or a digit; at the start of a
    // number, at its CR or LF, or anywhere.
    const std::string stray = std::string("/:0;9\r\n x-+\x7f\xff") + '\0';
    const char byte = r() % 2 ? stray[r() % stray.size()] : static_cast<char>('0' + r() % 10);
    const std::size_t at[] = {0, record.find(';') + 1, length - 2, length - 1,
                              static_cast<std::size_t>(uniform(r, 0, length - 1))};
    const std::size_t pos = start + at[r() % 5];
    std::string longLine;  // longer than any record, mostly digits, mostly ending in CR LF
    for (std::int64_t n = uniform(r, 19, 300); n > 0; --n)
        longLine += r() % 8 ? static_cast<char>('0' + r() % 10) : ';';
    if (damage == Drop) d.text.erase(start, length);
    if (damage == Repeat) d.text.insert(start, record);
    if (damage == Long) d.text.insert(start, longLine + (r() % 4 ? "\r\n" : "\n"));
    if (damage == Replace) d.text[pos] = byte;
    if (damage == Insert) d.text.insert(pos, 1, byte);
    if (damage == Erase) d.text.erase(pos, 1);
    if (damage == Torn) d.text.resize(start + static_cast<std::size_t>(uniform(r, 0, length - 1)));
    d.cuts[0] = start;
    d.cuts[1] = starts[checkpointLine];
    d.cuts[2] = starts[checkpointLine + 1];
    return d;
}

TEST(ResultsScan, AgreesWithALineByLineReadingOfRandomDamagedFiles) {
    const test::TempFolder folder;
    const std::string path = folder.path() + "primes.txt";
    Random random(20240611);
    for (int damage = None; damage <= Torn; ++damage) {
        int failures = 0;
        for (int n = 0; n < 150 && failures < 3; ++n) {
            const Draft draft = randomDraft(random, damage);
            const std::string& text = draft.text;
            std::filesystem::remove(path);  // ext4 flushes a file cut to 0 and written again
            test::writeFile(path, text);
            const std::string expected = describe(plainScan(text, draft.resumePoint));
            // Tiny, small and the default blocks, and blocks whose first or second boundary falls
            // inside the damaged line, the checkpoint's record or the line after it.
            std::vector<std::size_t> blocks{static_cast<std::size_t>(uniform(random, 1, 8)),
                                            static_cast<std::size_t>(uniform(random, 9, 120)),
                                            kResultsScanBlockBytes};
            for (const std::size_t cut : draft.cuts)
                for (const std::size_t n : {1, 2})
                    blocks.push_back(std::max<std::size_t>(
                        1, (cut + static_cast<std::size_t>(uniform(random, 1, 20))) / n));
            for (const std::size_t blockBytes : blocks) {
                const std::string got =
                    describe(scanResults(path, draft.resumePoint, StopSignal{}, blockBytes));
                if (got == expected) continue;
                ADD_FAILURE() << "damage " << damage << ", blocks of " << blockBytes
                              << ", candidate " << draft.resumePoint << ", file:\n"
                              << text << "\ngot      " << got << "\nexpected " << expected;
                ++failures;
                break;
            }
        }
    }
}

}  // namespace
}  // namespace tarn
