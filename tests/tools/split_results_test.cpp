// The split of the results file: every output file against a naive line-by-line oracle, byte
// for byte, over file counts, torn blocks and mended line ends; stop points; the failures.
#include "tools/split_results.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <string>
#include <tuple>
#include <vector>

#include "support/temp_folder.hpp"

using namespace tarn;
using tarn::test::readFile;
using tarn::test::writeFile;

namespace {

// `count` records of varying length, enumerated ("7;49") or plain ("49"), ended by CR LF.
std::string resultsText(std::int64_t count, bool enumerated) {
    std::string text;
    for (std::int64_t i = 1; i <= count; ++i)
        text += (enumerated ? std::to_string(i) + ';' : "") + std::to_string(i * i) + "\r\n";
    return text;
}

// What the split must write: the input's lines (ended by LF, CR LF or the end of the text),
// each ended by CR LF, in groups of perFile.
std::vector<std::string> naiveSplit(const std::string& input, std::size_t perFile) {
    std::vector<std::string> files(1);
    std::size_t inFile = 0;
    for (std::size_t start = 0; start < input.size();) {
        const std::size_t lf = std::min(input.find('\n', start), input.size());
        std::string line = input.substr(start, lf - start);
        if (!line.empty() && line.back() == '\r') line.pop_back();
        if (inFile == perFile) files.emplace_back(), inFile = 0;
        files.back() += line + "\r\n";
        ++inFile;
        start = lf + 1;
    }
    return files;
}

struct SplitFixture : ::testing::Test {
    tarn::test::TempFolder folder;
    std::string results = folder.path() + "primes.txt", out = folder.path() + "out/";
    std::string prefix = splitNamePrefix(folder.path() + "out");

    std::string outFile(std::int64_t n) const { return splitFileName(prefix, n); }
    bool exists(std::int64_t n) const { return std::filesystem::exists(outFile(n)); }
    // Writes the results file and splits it into an empty folder.
    SplitResult split(const std::string& input, std::int64_t perFile, SplitOptions options = {},
                      const StopSignal& stop = StopSignal{}) {
        std::filesystem::remove_all(out);
        std::filesystem::create_directory(out);
        writeFile(results, input);
        return splitResultsFile(results, prefix, perFile, stop, options);
    }
    void expectLikeOracle(const std::string& input, std::int64_t perFile,
                          std::size_t block = kSplitBlockSize) {
        SCOPED_TRACE("block " + std::to_string(block) + ", per file " + std::to_string(perFile));
        const SplitResult r = split(input, perFile, {block, {}});
        ASSERT_EQ(r.status, SplitStatus::Completed) << r.message;
        const auto expected = naiveSplit(input, static_cast<std::size_t>(perFile));
        ASSERT_EQ(r.files, static_cast<std::int64_t>(expected.size()));
        for (std::size_t i = 0; i < expected.size(); ++i)
            ASSERT_TRUE(readFile(outFile(static_cast<std::int64_t>(i + 1))) == expected[i])
                << i + 1;
        EXPECT_FALSE(exists(r.files + 1));
        EXPECT_TRUE(readFile(results) == input) << "the results file must stay as it was";
    }
};

}  // namespace

TEST(SplitNames, JoinTheFolderTextAsItStands) {
    EXPECT_EQ(splitFileName(splitNamePrefix("/home/ann"), 10), "/home/ann/primes10.txt");
    // A root already ends in the separator; the names then carry two.
    EXPECT_EQ(splitFileName(splitNamePrefix("/"), 3), "//primes3.txt");
}

TEST_F(SplitFixture, CopiesLikeTheOracleWhateverTheBlockSize) {
    // Full files then the rest, with no empty last file (3, 2, 1 and 1 empty file); enumerated
    // records are copied unchanged.
    for (const int records : {2500, 2000, 25, 0})
        expectLikeOracle(resultsText(records, true), 1000);
    // About 4 MB: several default blocks, files ending inside blocks.
    const std::string large = resultsText(300000, true);
    for (std::int64_t perFile : {1000, 123457, 1000000}) expectLikeOracle(large, perFile);
    // Bare line ends, a last line without one, an empty line, records longer than the block;
    // small blocks tear records and CR LF pairs apart.
    std::string mixed = resultsText(2000, false);
    for (int i = 0; i < 1500; ++i) mixed += std::to_string(i) + (i % 3 ? "\n" : "\r\n");
    mixed += "\n" + std::string(50, '7') + "\r\n" + std::string(40, '9') + "\n123";
    for (const std::string& input : {mixed, mixed + "\r", resultsText(3000, true)})
        for (std::size_t block : {2u, 3u, 5u, 7u, 16u, 33u, 64u, 4099u})
            expectLikeOracle(input, 1000, block);
}

TEST_F(SplitFixture, FilesBeyondALaterSplitStayAsTheyWere) {
    const std::string input = resultsText(8500, true);
    ASSERT_EQ(split(input, 1000).files, 9);
    std::vector<std::string> before;
    for (int n = 4; n <= 9; ++n) before.push_back(readFile(outFile(n)));
    ASSERT_EQ(splitResultsFile(results, prefix, 3000, StopSignal{}).files, 3);
    const auto expected = naiveSplit(input, 3000);
    for (int n = 1; n <= 9; ++n)
        EXPECT_EQ(readFile(outFile(n)), n <= 3 ? expected[n - 1] : before[n - 4]) << n;
}

TEST_F(SplitFixture, AStopLeavesWholeRecordsAndOpensNoFileItCannotFill) {
    // Records of nine bytes: blocks of ninety make the split look at the stop every ten
    // records; one large block has it look only at the start and where a file is full.
    std::string input;
    for (int i = 0; i < 2500; ++i) input += std::to_string(1000000 + i) + "\r\n";
    using Case = std::tuple<std::int64_t, std::size_t, std::int64_t, std::size_t>;
    for (const auto& [stopAt, block, files, bytes] :
         {Case{1500, 90, 2, 13500}, {1000, kSplitBlockSize, 1, 9000}, {0, kSplitBlockSize, 1, 0}}) {
        SCOPED_TRACE(stopAt);
        StopSignal stop;
        const auto stopThere = [&, at = stopAt](std::int64_t copied) {
            if (copied >= at) stop.request();
        };
        const SplitResult r = split(input, 1000, {block, stopThere}, stop);
        EXPECT_EQ(r.status, SplitStatus::Stopped);
        EXPECT_EQ(r.files, files);
        const auto expected = naiveSplit(input.substr(0, bytes), 1000);
        for (int n = 1; n <= files; ++n) EXPECT_EQ(readFile(outFile(n)), expected[n - 1]) << n;
        EXPECT_TRUE(exists(files) && !exists(files + 1));
    }
}

TEST_F(SplitFixture, FailuresNameTheFile) {
    std::filesystem::create_directory(out);
    SplitResult r = splitResultsFile(results, prefix, 1000, StopSignal{});
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_EQ(r.message, "The results file " + results + " was not found.");
    EXPECT_FALSE(exists(1));
    // A "folder" that is a regular file: no file can be created inside it.
    writeFile(results, resultsText(100, false));
    r = splitResultsFile(results, splitNamePrefix(results), 1000, StopSignal{});
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_NE(r.message.find(results + "/primes1.txt"), std::string::npos) << r.message;
    EXPECT_NE(r.message.find("Not a directory"), std::string::npos) << r.message;
    std::filesystem::remove(results);
    std::filesystem::create_directory(results);  // opens, but cannot be read
    r = splitResultsFile(results, prefix, 1000, StopSignal{});
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_NE(r.message.find(results), std::string::npos) << r.message;
}
