// The read-back of files larger than one 1 MiB read block: records and garbage that straddle
// block boundaries must be seen exactly as in the small files of the resume tests.
#include "generation/results_scan.hpp"

#include <gtest/gtest.h>

#include <algorithm>

#include "generation/results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using Outcome = ResultsScan::Outcome;
using test::oracleResults;

ResultsScan scanText(const std::string& text, std::int64_t resumePoint) {
    test::TempFolder folder;
    test::writeFile(folder.path() + "primes.txt", text);
    return scanResults(folder.path() + "primes.txt", resumePoint, StopSignal{});
}

TEST(ResultsScan, RecordsAndDamageAcrossBlocks) {
    // 2999977 = 30 * 99999 + 7; everything past it, with a torn line, is to be cut.
    const std::int64_t point = 2999977;
    for (const bool enumerated : {false, true}) {
        const std::string full = oracleResults(3000000, enumerated);
        ASSERT_GT(full.size(), std::size_t{1} << 20);
        const ResultsScan scan = scanText(full + "29", point);
        ASSERT_EQ(scan.outcome, Outcome::Sound) << scan.problem;
        EXPECT_EQ(scan.records, test::primeCount(point));
        EXPECT_EQ(scan.enumerated, enumerated);
        EXPECT_EQ(scan.keptBytes, oracleResults(point, enumerated).size());
        EXPECT_EQ(scan.fileBytes, full.size() + 2);
    }
    // Damage the record that spans the first block boundary.
    std::string text = oracleResults(3000000, false);
    const std::size_t start = text.rfind('\n', (std::size_t{1} << 20) - 1) + 1;
    ASSERT_LT(start, std::size_t{1} << 20);
    text[start] = 'x';
    const auto line = std::count(text.begin(), text.begin() + start, '\n') + 1;
    const ResultsScan scan = scanText(text, point);
    EXPECT_EQ(scan.outcome, Outcome::Damaged);
    EXPECT_NE(scan.problem.find("not a number at line " + std::to_string(line)), std::string::npos)
        << scan.problem;
}

TEST(ResultsScan, OverlongLinesAreGarbageWhenCompleteAndCutWhenTorn) {
    const std::string good = oracleResults(37, false);
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

}  // namespace
}  // namespace tarn
