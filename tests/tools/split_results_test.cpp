// The split of the results file: the files joined back give the input with CR LF line ends,
// byte for byte, each holding its count of whole records, over record counts, read and write
// chunkings and mended line ends; stop points; the failures, among them refused writes.
#include "tools/split_results.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <filesystem>
#include <string>
#include <tuple>
#include <vector>

#include "core/app_folder.hpp"
#include "core/texts.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;
using tarn::test::readFile;
using tarn::test::writeFile;

namespace {

// `count` records of varying length, enumerated ("7;49") or plain ("49"), each ended by
// lineEnd.
std::string resultsText(std::int64_t count, bool enumerated, const std::string& lineEnd = "\r\n") {
    std::string text;
    for (std::int64_t i = 1; i <= count; ++i)
        text += (enumerated ? std::to_string(i) + ';' : "") + std::to_string(i * i) + lineEnd;
    return text;
}

// What the split must write: the input's lines (ended by LF or CR LF), each ended by CR LF, in
// groups of perFile. Bytes after the last line end are a record cut short, and left out.
std::vector<std::string> naiveSplit(const std::string& input, std::size_t perFile) {
    std::vector<std::string> files(1);
    std::size_t inFile = 0;
    for (std::size_t start = 0, lf; (lf = input.find('\n', start)) != std::string::npos;) {
        const std::size_t end = lf > start && input[lf - 1] == '\r' ? lf - 1 : lf;
        if (inFile++ == perFile) files.emplace_back(), inFile = 1;
        files.back() += input.substr(start, end - start) + "\r\n";
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
    // The split files are those of the naive split: joined in order they give the input with
    // CR LF line ends, perFile whole records each, the last one the rest (an empty input: one
    // empty file); the cut record is counted, the results file stays as it was.
    void expectJoinsBack(const std::string& input, std::int64_t perFile,
                         const SplitOptions& options) {
        const SplitResult r = split(input, perFile, options);
        ASSERT_EQ(r.status, SplitStatus::Completed) << r.message;
        EXPECT_EQ(r.cutBytes, input.size() - (input.rfind('\n') + 1));  // npos + 1 is 0
        const auto expected = naiveSplit(input, static_cast<std::size_t>(perFile));
        ASSERT_EQ(r.files, static_cast<std::int64_t>(expected.size()));
        for (std::int64_t n = 1; n <= r.files; ++n)
            ASSERT_TRUE(readFile(outFile(n)) == expected[n - 1]) << "file " << n;
        EXPECT_FALSE(exists(r.files + 1));
        EXPECT_TRUE(readFile(results) == input);
    }
};

}  // namespace

TEST_F(SplitFixture, FilesJoinBackToTheInputWhateverTheCountAndTheChunking) {
    // How much of the input one read asks for, how much the system takes per write (0: the
    // system's own), and whether only on the smaller files (a system call for a few bytes).
    const std::size_t big = kSplitBlockSize, staging = kSplitStagingSize;
    const std::size_t chunkings[][3] = {{big, 0, 0},    {big, 1, 1},           {7, 65536, 1},
                                        {4099, 7, 1},   {4099, 4096, 0},       {40009, 65536, 0},
                                        {100003, 0, 0}, {staging + 1, 4096, 0}};
    // Plain and enumerated with CR LF; bare LF line ends with the last line open.
    for (const auto& [enumerated, crlf] : {std::pair{false, true}, {true, true}, {false, false}}) {
        // Record texts do not depend on the count, so one long text gives every input's bytes.
        const std::string sample = resultsText(20000, enumerated, crlf ? "\r\n" : "\n");
        // Small primes, and files whose bytes fall just under and over the staging size and
        // half of it, where pieces start to bypass the staging.
        std::vector<std::int64_t> perFiles = {1, 2, 3, 7, 3717};
        for (const std::size_t bytes : {staging / 2, staging})
            for (const int step : {-1, 0, 1})
                perFiles.push_back(std::count(sample.begin(), sample.begin() + bytes, '\n') + step);
        for (const std::int64_t perFile : perFiles) {
            // Two full files and a part of one (none for one record per file).
            std::size_t end = 0;
            for (auto k = 2 * perFile + perFile / 2; k-- > 0;) end = sample.find('\n', end) + 1;
            std::string input = sample.substr(0, end);
            if (!crlf) input.pop_back();
            for (const auto& [block, writeLimit, smallFilesOnly] : chunkings) {
                if (smallFilesOnly && perFile > 3717) continue;
                SCOPED_TRACE(::testing::Message()
                             << enumerated << crlf << ", " << perFile << " per file, block "
                             << block << ", writes of " << writeLimit);
                SplitOptions options{block, {}, {}};
                if (writeLimit > 0)  // a system write that takes at most writeLimit bytes
                    options.writeSome = [limit = writeLimit](platform::File& file,
                                                             const char* bytes, std::size_t count,
                                                             int& error) {
                        return file.writeSome(bytes, std::min(count, limit), error);
                    };
                expectJoinsBack(input, perFile, options);
                if (HasFatalFailure()) return;
            }
        }
    }
    // Mixed line ends, an empty line, a last record cut short by a lone CR; an empty input.
    for (const std::size_t block : {2u, 3u, 4099u})
        expectJoinsBack("1\r\n22\n\n3\r\n\r", 2, {block, {}, {}});
    expectJoinsBack("", 1000, {});
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
        const SplitResult r = split(input, 1000, {block, stopThere, {}}, stop);
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
    EXPECT_EQ(r.message, resultsNotFoundMessage(results));
    EXPECT_FALSE(exists(1));
    // A "folder" that is a regular file: no file can be created inside it.
    writeFile(results, resultsText(100, false));
    r = splitResultsFile(results, splitNamePrefix(results), 1000, StopSignal{});
    EXPECT_EQ(r.message,
              fileWriteFailure(results + kPathSeparator + "primes1.txt", systemReason(ENOTDIR)));
    // The folder's text is joined as it stands: a root, already ended, gives two separators.
    const std::string root(1, kPathSeparator);
    EXPECT_EQ(splitFileName(splitNamePrefix(root), 3), root + root + "primes3.txt");
    std::filesystem::remove(results);
    std::filesystem::create_directory(results);  // opens, but cannot be read
    r = splitResultsFile(results, prefix, 1000, StopSignal{});
    EXPECT_TRUE(r.status == SplitStatus::Failed && r.message.find(results) != std::string::npos)
        << r.message;
}

TEST_F(SplitFixture, AWriteTheSystemRefusesFailsTheSplitAndNamesTheFile) {
    // From the second file on, the system refuses every write with its reason, or takes nothing
    // and gives none.
    const std::string input = resultsText(2500, true);
    const std::size_t firstFile = naiveSplit(input, 1000)[0].size();
    for (const int fault : {ENOSPC, 0}) {
        std::size_t written = 0;
        const SplitWriteFunction faulty = [&](platform::File& file, const char* bytes,
                                              std::size_t count, int& error) -> std::ptrdiff_t {
            if (written == firstFile) return error = fault, fault == 0 ? 0 : -1;
            const auto done = file.writeSome(bytes, std::min(count, firstFile - written), error);
            written += static_cast<std::size_t>(std::max<std::ptrdiff_t>(done, 0));
            return done;
        };
        const SplitResult r = split(input, 1000, {kSplitBlockSize, {}, faulty});
        EXPECT_TRUE(r.status == SplitStatus::Failed && r.files == 2) << fault;
        EXPECT_EQ(r.message, fileWriteFailure(outFile(2), systemReason(fault)));
    }
}
