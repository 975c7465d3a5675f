// The read-back of files larger than one read block: records and garbage that straddle block
// boundaries must be seen exactly as in a small file.
#include "generation/results_scan.hpp"

#include <gtest/gtest.h>

#include <algorithm>

#include "results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using Outcome = ResultsScan::Outcome;

ResultsScan scanText(const std::string& text, std::int64_t resumePoint) {
    test::TempFolder folder;
    test::writeFile(folder.path() + "primes.txt", text);
    return scanResults(folder.path() + "primes.txt", resumePoint, StopSignal{});
}

TEST(ResultsScan, CountsMegabytesOfRecordsAcrossBlocks) {
    const std::int64_t top = 3000000;
    const auto primes = test::sievePrimes(top);
    for (const bool enumerated : {false, true}) {
        const std::string full = test::oracleResults(top, enumerated);
        ASSERT_GT(full.size(), std::size_t{1} << 20);
        // 2999977 = 30 * 99999 + 7; everything past it, with a torn line, is to be cut.
        const std::int64_t point = 2999977;
        const std::string kept = test::oracleResults(point, enumerated);
        const ResultsScan scan = scanText(full + "29", point);
        ASSERT_EQ(scan.outcome, Outcome::Sound) << scan.problem;
        std::int64_t count = 0;
        for (const std::int64_t p : primes) count += p <= point;
        EXPECT_EQ(scan.records, count);
        EXPECT_EQ(scan.enumerated, enumerated);
        EXPECT_EQ(scan.keptBytes, kept.size());
        EXPECT_EQ(scan.fileBytes, full.size() + 2);
    }
}

TEST(ResultsScan, FindsADamagedRecordOnABlockBoundary) {
    std::string text = test::oracleResults(3000000, false);
    // Damage the record that spans the first 1 MiB boundary.
    const std::size_t boundary = std::size_t{1} << 20;
    const std::size_t start = text.rfind('\n', boundary - 1) + 1;
    ASSERT_LT(start, boundary);
    text[start] = 'x';
    const std::int64_t line = std::count(text.begin(), text.begin() + start, '\n') + 1;
    const ResultsScan scan = scanText(text, 2999977);
    EXPECT_EQ(scan.outcome, Outcome::Damaged);
    EXPECT_NE(scan.problem.find("not a number at line " + std::to_string(line)), std::string::npos)
        << scan.problem;
}

TEST(ResultsScan, OverlongLinesAreGarbageWhenCompleteAndCutWhenTorn) {
    const std::string good = test::oracleResults(37, false);
    const std::string garbage(3 << 20, '9');
    const ResultsScan complete = scanText(good + garbage + "\r\n", 37);
    EXPECT_EQ(complete.outcome, Outcome::Damaged);
    EXPECT_NE(complete.problem.find("not a number at line 13"), std::string::npos)
        << complete.problem;

    const ResultsScan torn = scanText(good + garbage, 37);
    ASSERT_EQ(torn.outcome, Outcome::Sound) << torn.problem;
    EXPECT_EQ(torn.records, 12);
    EXPECT_EQ(torn.keptBytes, good.size());
}

TEST(ResultsScan, StopsBeforeReadingWhenAsked) {
    test::TempFolder folder;
    test::writeFile(folder.path() + "primes.txt", test::oracleResults(37, false));
    StopSignal stop;
    stop.request();
    EXPECT_EQ(scanResults(folder.path() + "primes.txt", 37, stop).outcome, Outcome::Stopped);
}

}  // namespace
}  // namespace tarn
