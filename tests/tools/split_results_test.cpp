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
#include "core/file_messages.hpp"
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
    for (std::size_t start = 0; input.find('\n', start) != std::string::npos;) {
        const std::size_t lf = input.find('\n', start);
        std::string line = input.substr(start, lf - start);
        if (!line.empty() && line.back() == '\r') line.pop_back();
        if (inFile == perFile) files.emplace_back(), inFile = 0;
        files.back() += line + "\r\n";
        ++inFile;
        start = lf + 1;
    }
    return files;
}

// The input with every line ended by CR LF: what the split files hold when joined.
std::string crlfLines(const std::string& input) { return naiveSplit(input, SIZE_MAX)[0]; }

// The first `count` lines of text, each with its line end.
std::string firstRecords(const std::string& text, std::int64_t count) {
    std::size_t end = 0;
    for (std::int64_t i = 0; i < count; ++i) end = text.find('\n', end) + 1;
    return text.substr(0, end);
}

std::int64_t lineEnds(const std::string& text) {
    return std::count(text.begin(), text.end(), '\n');
}

// A system write that takes at most `limit` bytes at a time.
SplitWriteFunction shortWrites(std::size_t limit) {
    return [limit](platform::File& file, const char* bytes, std::size_t count, int& error) {
        return file.writeSome(bytes, std::min(count, limit), error);
    };
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
    // The split files, joined in order, give the input with CR LF line ends, and each file
    // holds perFile whole records, the last one the rest (an empty input: one empty file).
    void expectJoinsBack(const std::string& input, std::int64_t perFile,
                         const SplitOptions& options) {
        const SplitResult r = split(input, perFile, options);
        ASSERT_EQ(r.status, SplitStatus::Completed) << r.message;
        EXPECT_EQ(r.cutBytes, input.size() - (input.rfind('\n') + 1));  // npos + 1 is 0
        const std::string expected = crlfLines(input);
        const std::int64_t records = lineEnds(expected);
        ASSERT_EQ(r.files, std::max<std::int64_t>(1, (records + perFile - 1) / perFile));
        std::string joined;
        for (std::int64_t n = 1; n <= r.files; ++n) {
            const std::string text = readFile(outFile(n));
            EXPECT_EQ(lineEnds(text), std::min(perFile, records - (n - 1) * perFile)) << n;
            EXPECT_TRUE(text.empty() || text.ends_with("\r\n")) << n;
            joined += text;
        }
        EXPECT_FALSE(exists(r.files + 1));
        const auto diff =
            std::mismatch(joined.begin(), joined.end(), expected.begin(), expected.end());
        EXPECT_TRUE(joined == expected)
            << "the joined files differ from byte " << diff.first - joined.begin();
        EXPECT_TRUE(readFile(results) == input) << "the results file must stay as it was";
    }
};

}  // namespace

TEST(SplitNames, JoinTheFolderTextAsItStands) {
    const std::string root(1, kPathSeparator);
    EXPECT_EQ(splitFileName(splitNamePrefix("/home/ann"), 10), "/home/ann" + root + "primes10.txt");
    // A root already ends in the separator; the names then carry two.
    EXPECT_EQ(splitFileName(splitNamePrefix(root), 3), root + root + "primes3.txt");
}

TEST_F(SplitFixture, FilesJoinBackToTheInputWhateverTheCountAndTheChunking) {
    struct Kind {
        const char* name;
        bool enumerated;
        bool crlf;  // else bare LF line ends and a last record cut short
    };
    // How much of the input one read asks for, and how much the system takes per write (0:
    // the system's own). Reads and writes of a few bytes cost a system call each, so they
    // run only on the smaller files.
    struct Chunking {
        std::size_t block;
        std::size_t writeLimit;
        bool smallFilesOnly;
    };
    const Chunking chunkings[] = {{kSplitBlockSize, 0, false},
                                  {kSplitBlockSize, 1, true},
                                  {7, 65536, true},
                                  {4099, 7, true},
                                  {4099, 4096, false},
                                  {40009, 65536, false},
                                  {100003, 0, false},
                                  {kSplitStagingSize + 1, 4096, false}};
    for (const Kind kind : {Kind{"plain CR LF", false, true}, Kind{"enumerated CR LF", true, true},
                            Kind{"bare LF, the last line open", false, false}}) {
        // Record texts do not depend on the count, so one long text gives every input's bytes.
        const std::string sample = resultsText(20000, kind.enumerated, kind.crlf ? "\r\n" : "\n");
        const auto recordsWithin = [&](std::size_t bytes) {
            return lineEnds(sample.substr(0, bytes));
        };
        // Small primes, and files whose bytes fall just under and over the staging size and
        // half of it, where pieces start to bypass the staging.
        std::vector<std::int64_t> perFiles = {1, 2, 3, 7, 3717};
        for (const std::size_t bytes : {kSplitStagingSize / 2, kSplitStagingSize})
            for (const int step : {-1, 0, 1}) perFiles.push_back(recordsWithin(bytes) + step);
        for (const std::int64_t perFile : perFiles) {
            // Two full files and a part of one (none for one record per file).
            std::string input = firstRecords(sample, 2 * perFile + perFile / 2);
            if (!kind.crlf) input.pop_back();
            ASSERT_EQ(kind.crlf, crlfLines(input) == input);
            for (const Chunking& c : chunkings) {
                if (c.smallFilesOnly && perFile > 3717) continue;
                SCOPED_TRACE(std::string(kind.name) + ", " + std::to_string(perFile) +
                             " per file, block " + std::to_string(c.block) + ", writes of " +
                             std::to_string(c.writeLimit));
                SplitOptions options{c.block, {}, {}};
                if (c.writeLimit > 0) options.writeSome = shortWrites(c.writeLimit);
                expectJoinsBack(input, perFile, options);
                if (HasFatalFailure()) return;
            }
        }
    }
}

TEST_F(SplitFixture, OddLinesAreMendedWhateverTheBlockSize) {
    // Mixed line ends, an empty line, records longer than small blocks and one longer than a
    // large block that follows staged records; a last record cut short, also with a lone CR or
    // longer than a block; an empty input gives one empty file.
    std::string mixed = resultsText(2000, false);
    for (int i = 0; i < 1500; ++i) mixed += std::to_string(i) + (i % 3 ? "\n" : "\r\n");
    mixed.append("\n").append(50, '7').append("\r\n").append(40, '9').append("\n123");
    std::string longRecord = "5\n7\r\n";
    longRecord.append(100000, '3').append("\r\n11\r\n");
    for (const std::string& input :
         {mixed, mixed + "\r", longRecord, longRecord + std::string(9000, '7'), std::string()})
        for (std::size_t block : {2u, 3u, 5u, 16u, 33u, 4099u, 40009u}) {
            SCOPED_TRACE("block " + std::to_string(block));
            expectJoinsBack(input, 1000, {block, {}, {}});
        }
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
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_EQ(r.message, "The results file " + results + " was not found.");
    EXPECT_FALSE(exists(1));
    // A "folder" that is a regular file: no file can be created inside it.
    writeFile(results, resultsText(100, false));
    r = splitResultsFile(results, splitNamePrefix(results), 1000, StopSignal{});
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_NE(r.message.find(results + kPathSeparator + "primes1.txt"), std::string::npos)
        << r.message;
    EXPECT_NE(r.message.find("Not a directory"), std::string::npos) << r.message;
    std::filesystem::remove(results);
    std::filesystem::create_directory(results);  // opens, but cannot be read
    r = splitResultsFile(results, prefix, 1000, StopSignal{});
    EXPECT_EQ(r.status, SplitStatus::Failed);
    EXPECT_NE(r.message.find(results), std::string::npos) << r.message;
}

TEST_F(SplitFixture, AWriteTheSystemRefusesFailsTheSplitAndNamesTheFile) {
    // The system takes 4096 bytes at a time and answers one write in the second file with a
    // fault: a refusal with its reason, a write that takes nothing and gives no reason, or an
    // interruption, after which the bytes are offered again and the split completes.
    struct Fault {
        std::ptrdiff_t answer;
        int error;
        std::string reason;  // empty: the split must complete
    };
    const std::string input = resultsText(2500, true);
    const std::size_t firstFile = naiveSplit(input, 1000)[0].size();
    for (const Fault& f : {Fault{-1, ENOSPC, "No space left on device"},
                           Fault{0, 0, "Input/output error"}, Fault{-1, EINTR, ""}}) {
        SCOPED_TRACE(f.reason.empty() ? "interrupted" : f.reason);
        std::size_t written = 0;
        bool faulted = false;
        const SplitWriteFunction faulty = [&](platform::File& file, const char* bytes,
                                              std::size_t count, int& error) -> std::ptrdiff_t {
            if (written > firstFile && !faulted) {
                faulted = true;
                error = f.error;
                return f.answer;
            }
            const std::ptrdiff_t done =
                file.writeSome(bytes, std::min<std::size_t>(count, 4096), error);
            if (done > 0) written += static_cast<std::size_t>(done);
            return done;
        };
        if (f.reason.empty()) {
            expectJoinsBack(input, 1000, {kSplitBlockSize, {}, faulty});
        } else {
            const SplitResult r = split(input, 1000, {kSplitBlockSize, {}, faulty});
            EXPECT_EQ(r.status, SplitStatus::Failed);
            EXPECT_EQ(r.files, 2);
            EXPECT_EQ(r.message, fileWriteFailure(outFile(2), f.reason));
        }
        EXPECT_TRUE(faulted);
    }
}
