// The split of the results file: file sizes and names, byte-for-byte copies against a naive
// line-by-line oracle, stop points, and the failures it must report.
#include "tools/split_results.hpp"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "support/temp_folder.hpp"

using namespace tarn;
using tarn::test::readFile;
using tarn::test::TempFolder;
using tarn::test::writeFile;

namespace {

// Primes by a plain sieve, independent of the generator.
std::vector<std::int64_t> sievePrimes(std::size_t count) {
    std::vector<std::int64_t> primes;
    std::size_t limit = 1 << 16;
    while (primes.size() < count) {
        primes.clear();
        std::vector<bool> composite(limit + 1);
        for (std::size_t i = 2; i <= limit && primes.size() < count; ++i) {
            if (composite[i]) continue;
            primes.push_back(static_cast<std::int64_t>(i));
            for (std::size_t j = i * i; j <= limit; j += i) composite[j] = true;
        }
        limit *= 2;
    }
    return primes;
}

// A results file of `count` records in the plain or the enumerated form.
std::string resultsText(std::size_t count, bool enumerated) {
    std::string text;
    const auto primes = sievePrimes(count);
    for (std::size_t i = 0; i < count; ++i) {
        if (enumerated) text += std::to_string(i + 1) + ';';
        text += std::to_string(primes[i]) + "\r\n";
    }
    return text;
}

// What the split must write: the input's lines (ended by LF, CR LF or the end of the text),
// each ended by CR LF, in groups of perFile.
std::vector<std::string> naiveSplit(const std::string& input, std::size_t perFile) {
    std::vector<std::string> lines;
    std::size_t start = 0;
    while (start < input.size()) {
        std::size_t lf = input.find('\n', start);
        std::string line =
            input.substr(start, lf == std::string::npos ? std::string::npos : lf - start);
        if (!line.empty() && line.back() == '\r') line.pop_back();
        lines.push_back(line + "\r\n");
        if (lf == std::string::npos) break;
        start = lf + 1;
    }
    std::vector<std::string> files(1);
    std::size_t inFile = 0;
    for (const auto& line : lines) {
        if (inFile == perFile) files.emplace_back(), inFile = 0;
        files.back() += line;
        ++inFile;
    }
    return files;
}

std::size_t lineCount(const std::string& text) {
    return static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n'));
}

struct SplitFixture : ::testing::Test {
    TempFolder folder;
    std::string results = folder.path() + "primes.txt";
    std::string out = folder.path() + "out";
    std::string prefix = splitNamePrefix(out);
    StopSignal stop;

    void SetUp() override { std::filesystem::create_directory(out); }

    std::string outFile(int n) const { return splitFileName(prefix, n); }
    bool exists(int n) const { return std::filesystem::exists(outFile(n)); }

    SplitResult split(std::int64_t perFile, SplitOptions options = {}) {
        return splitResultsFile(results, prefix, perFile, stop, options);
    }

    // Runs the split and compares every output file with the oracle, byte for byte.
    void expectSplitLikeOracle(const std::string& input, std::int64_t perFile,
                               std::size_t blockSize) {
        std::filesystem::remove_all(out);
        std::filesystem::create_directory(out);
        writeFile(results, input);
        SplitOptions options;
        options.blockSize = blockSize;
        const SplitResult r = split(perFile, options);
        ASSERT_EQ(r.status, SplitStatus::Completed) << r.message;
        const auto expected = naiveSplit(input, static_cast<std::size_t>(perFile));
        ASSERT_EQ(r.files, static_cast<std::int64_t>(expected.size()))
            << "block " << blockSize << ", per file " << perFile;
        for (std::size_t i = 0; i < expected.size(); ++i)
            ASSERT_EQ(readFile(outFile(static_cast<int>(i + 1))), expected[i])
                << "file " << i + 1 << ", block " << blockSize << ", per file " << perFile;
        EXPECT_FALSE(exists(static_cast<int>(expected.size() + 1)));
    }
};

}  // namespace

TEST(SplitNames, JoinTheFolderTextAndTheNumberAsTheyStand) {
    EXPECT_EQ(splitFileName(splitNamePrefix("/home/ann/Documents"), 1),
              "/home/ann/Documents/primes1.txt");
    EXPECT_EQ(splitFileName(splitNamePrefix("/home/ann"), 10), "/home/ann/primes10.txt");
    // A root already ends in the separator; the names then carry two.
    EXPECT_EQ(splitFileName(splitNamePrefix("/"), 3), "//primes3.txt");
}

TEST(SplitMessage, ReportsTheFileCountAfterABlank) {
    EXPECT_EQ(splitDoneMessage(3), "Done!!! 3 files were created.");
    EXPECT_EQ(splitDoneMessage(1), "Done!!! 1 files were created.");
    EXPECT_EQ(splitDoneMessage(12), "Done!!! 12 files were created.");
}

TEST_F(SplitFixture, FullFilesThenTheRest) {
    const std::string input = resultsText(2500, false);
    writeFile(results, input);
    const SplitResult r = split(1000);
    EXPECT_EQ(r.status, SplitStatus::Completed);
    EXPECT_EQ(r.files, 3);
    EXPECT_EQ(lineCount(readFile(outFile(1))), 1000u);
    EXPECT_EQ(lineCount(readFile(outFile(2))), 1000u);
    EXPECT_EQ(lineCount(readFile(outFile(3))), 500u);
    EXPECT_FALSE(exists(4));
    EXPECT_EQ(readFile(outFile(1)) + readFile(outFile(2)) + readFile(outFile(3)), input);
    EXPECT_EQ(readFile(results), input) << "the results file must stay as it was";
}

TEST_F(SplitFixture, AnEvenlyDividedCountLeavesNoEmptyLastFile) {
    writeFile(results, resultsText(2000, false));
    const SplitResult r = split(1000);
    EXPECT_EQ(r.status, SplitStatus::Completed);
    EXPECT_EQ(r.files, 2);
    EXPECT_EQ(lineCount(readFile(outFile(2))), 1000u);
    EXPECT_FALSE(exists(3));
}

TEST_F(SplitFixture, FewerRecordsThanOneFileHolds) {
    const std::string input = resultsText(25, false);
    ASSERT_TRUE(input.starts_with("2\r\n3\r\n5\r\n7\r\n"));
    ASSERT_TRUE(input.ends_with("\r\n97\r\n"));
    writeFile(results, input);
    const SplitResult r = split(1000);
    EXPECT_EQ(r.files, 1);
    EXPECT_EQ(readFile(outFile(1)), input);
    EXPECT_FALSE(exists(2));
}

TEST_F(SplitFixture, AnEmptyResultsFileGivesOneEmptyFile) {
    writeFile(results, "");
    const SplitResult r = split(1000);
    EXPECT_EQ(r.status, SplitStatus::Completed);
    EXPECT_EQ(r.files, 1);
    EXPECT_TRUE(exists(1));
    EXPECT_EQ(readFile(outFile(1)), "");
    EXPECT_FALSE(exists(2));
}

TEST_F(SplitFixture, EnumeratedRecordsKeepTheirSerialNumbers) {
    const std::string input = resultsText(2300, true);
    writeFile(results, input);
    ASSERT_EQ(split(1000).files, 3);
    EXPECT_TRUE(readFile(outFile(1)).starts_with("1;2\r\n2;3\r\n"));
    EXPECT_TRUE(readFile(outFile(2)).starts_with("1001;7927\r\n"));
    EXPECT_TRUE(readFile(outFile(3)).starts_with("2001;17393\r\n"));
    EXPECT_EQ(readFile(outFile(1)) + readFile(outFile(2)) + readFile(outFile(3)), input);
}

TEST_F(SplitFixture, FilesBeyondALaterSplitStayAsTheyWere) {
    writeFile(results, resultsText(8500, true));
    ASSERT_EQ(split(1000).files, 9);
    std::vector<std::string> before;
    for (int n = 4; n <= 9; ++n) before.push_back(readFile(outFile(n)));
    const SplitResult r = split(3000);
    ASSERT_EQ(r.files, 3);
    EXPECT_EQ(lineCount(readFile(outFile(1))), 3000u);
    EXPECT_EQ(lineCount(readFile(outFile(3))), 2500u);
    for (int n = 4; n <= 9; ++n) EXPECT_EQ(readFile(outFile(n)), before[n - 4]) << n;
}

TEST_F(SplitFixture, AStopBetweenRecordsLeavesCompleteFiles) {
    // Records of nine bytes in blocks of ninety: the split looks at the stop every ten
    // records, so the stop raised at 1 500 records is seen exactly there.
    std::string input;
    for (int i = 0; i < 2500; ++i) input += std::to_string(1000000 + i) + "\r\n";
    writeFile(results, input);
    SplitOptions options;
    options.blockSize = 90;
    options.onCheckpoint = [&](std::int64_t copied) {
        if (copied >= 1500) stop.request();
    };
    const SplitResult r = split(1000, options);
    EXPECT_EQ(r.status, SplitStatus::Stopped);
    EXPECT_EQ(r.files, 2);
    EXPECT_EQ(readFile(outFile(1)), input.substr(0, 9000));
    EXPECT_EQ(readFile(outFile(2)), input.substr(9000, 4500));
    EXPECT_FALSE(exists(3));
}

TEST_F(SplitFixture, AStopWhenAFileIsFullOpensNoFurtherFile) {
    writeFile(results, resultsText(2500, false));
    SplitOptions options;
    options.onCheckpoint = [&](std::int64_t copied) {
        if (copied >= 1000) stop.request();
    };
    const SplitResult r = split(1000, options);
    EXPECT_EQ(r.status, SplitStatus::Stopped);
    EXPECT_EQ(r.files, 1);
    EXPECT_EQ(lineCount(readFile(outFile(1))), 1000u);
    EXPECT_FALSE(exists(2));
}

TEST_F(SplitFixture, AStopBeforeTheFirstRecordLeavesOneEmptyFile) {
    writeFile(results, resultsText(100, false));
    stop.request();
    const SplitResult r = split(1000);
    EXPECT_EQ(r.status, SplitStatus::Stopped);
    EXPECT_EQ(r.files, 1);
    EXPECT_EQ(readFile(outFile(1)), "");
}

TEST_F(SplitFixture, LargeFileIsCopiedWholeWhateverTheBlockSize) {
    // About 4 MB of enumerated records: several default blocks, file ends inside blocks.
    const std::string input = resultsText(300000, true);
    expectSplitLikeOracle(input, 1000, kSplitBlockSize);
    expectSplitLikeOracle(input, 123457, kSplitBlockSize);
    expectSplitLikeOracle(input, 1000000, kSplitBlockSize);
    std::string joined;
    for (int n = 1; exists(n); ++n) joined += readFile(outFile(n));
    EXPECT_EQ(joined, input);
}

TEST_F(SplitFixture, SmallBlocksTearRecordsAndLineEndsApart) {
    const std::string input = resultsText(3000, true);
    for (std::size_t block : {2u, 3u, 7u, 10u, 64u, 4099u})
        expectSplitLikeOracle(input, 1000, block);
}

TEST_F(SplitFixture, LineEndsAreMendedToCrLf) {
    // Bare line ends, a last line without one, an empty line, a CR at the very end, and
    // records longer than the block.
    std::string input;
    for (int i = 0; i < 1500; ++i) input += std::to_string(i) + (i % 3 ? "\n" : "\r\n");
    input += "\n";
    input += std::string(50, '7') + "\r\n" + std::string(40, '9') + "\n";
    input += "123";
    for (std::size_t block : {2u, 5u, 16u, 33u, 4096u}) {
        expectSplitLikeOracle(input, 1000, block);
        expectSplitLikeOracle(input + "\r", 1000, block);
    }
}

TEST_F(SplitFixture, AMissingResultsFileIsReported) {
    const SplitResult r = split(1000);
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_EQ(r.message, "The results file " + results + " was not found.");
    EXPECT_FALSE(exists(1));
}

TEST_F(SplitFixture, AnOutputFolderThatCannotBeWrittenIsReported) {
    writeFile(results, resultsText(100, false));
    // The "folder" is a regular file, so no file can be created inside it.
    const std::string notAFolder = folder.path() + "plain";
    writeFile(notAFolder, "x");
    const SplitResult r =
        splitResultsFile(results, splitNamePrefix(notAFolder), 1000, stop, SplitOptions{});
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_NE(r.message.find(notAFolder + "/primes1.txt"), std::string::npos) << r.message;
    EXPECT_NE(r.message.find("Not a directory"), std::string::npos) << r.message;
}

TEST_F(SplitFixture, AResultsPathThatIsAFolderIsReported) {
    std::filesystem::create_directory(results);
    const SplitResult r = split(1000);
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_NE(r.message.find(results), std::string::npos) << r.message;
}
