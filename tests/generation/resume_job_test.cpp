// The resume against the oracle: crafted stopped jobs must end with the file of one uninterrupted
// job, with whatever lies past the checkpoint cut and generated again; files it cannot trust must
// be left as they were. Files of a few MiB make records and garbage straddle the 1 MiB blocks in
// which the results file is read back.
#include "generation/resume_job.hpp"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>

#include "generation/results_oracle.hpp"
#include "generation/texts.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using namespace test;
using Status = ResumeResult::Status;

const std::string kNone = "<none>";      // a file that is not there
const std::string kFolder = "<folder>";  // a folder in the file's place: it cannot be read
const std::string kGoodLine = " 37  1000  1 \r\n";

std::string contents(const std::string& path) {
    if (std::filesystem::is_directory(path)) return kFolder;
    return std::filesystem::exists(path) ? readFile(path) : kNone;
}

// Writes the two files and runs the resume, counting its two announcements.
struct Resume {
    TempFolder folder;
    int gathering = 0, continuing = 0;
    ResumeResult result;
    std::string resultsPath() const { return folder.path() + "primes.txt"; }
    std::string checkpointPath() const { return folder.path() + "primes.ini"; }

    Resume(const std::string& records, const std::string& checkpoint, const StopSignal& stop) {
        if (records != kNone) writeFile(resultsPath(), records);
        if (checkpoint == kFolder) std::filesystem::create_directory(checkpointPath());
        if (checkpoint != kNone && checkpoint != kFolder) writeFile(checkpointPath(), checkpoint);
        const ResumeEvents events{[this] { ++gathering; },
                                  [this](const ResumeStart&) { ++continuing; }};
        result = runResume(folder.path(), stop, nullptr, events);
    }
};

TEST(ResumeJob, StoppedJobsEndWithTheFileOfOneUninterruptedJob) {
    struct Case {
        std::int64_t point, limit;
        bool enumerated;
        std::string tail;  // past the checkpoint
    };
    std::vector<Case> cases{{37, 1000, false, ""}, {127, 127, false, ""}, {97, 1000, true, ""}};
    // 127/127: stopped in the last turn at the limit, no turn runs; 97 enumerated: the serial
    // numbers run on, 25;97 then 26;101. Then what a job killed between two checkpoints leaves
    // past the last one: records and a torn line, here one longer than a read block.
    for (const std::string tail : {"4", "41\r", "41\r\n43\r\n47\r\n", "41\r\n43\r\n4"})
        cases.push_back({37, 1000, false, tail});
    for (const std::string tail : {"13;4", "13;41\r\n14;43\r\n15;"})
        cases.push_back({37, 1000, true, tail});
    cases.push_back({37, 1000, false, std::string(3 << 20, '9')});
    for (const bool enumerated : {false, true}) {
        for (const std::int64_t point : {7, 37, 67, 97, 997, 2017, 4987})
            cases.push_back({point, 5000, enumerated, ""});
        // 2999977 = 30 * 99999 + 7, over two MiB into the file.
        const std::string all = oracleResults(3'000'000, enumerated);
        cases.push_back({2999977, 3'000'000, enumerated,
                         all.substr(oracleResults(2999977, enumerated).size()) + "29"});
    }
    for (const Case& c : cases) {
        SCOPED_TRACE(testing::Message() << c.point << "/" << c.limit << " enumerated "
                                        << c.enumerated << " tail " << c.tail.substr(0, 20));
        const Resume r(oracleResults(c.point, c.enumerated) + c.tail,
                       oracleCheckpoint(c.point, c.limit, 1), StopSignal{});
        ASSERT_EQ(r.result.status, Status::Completed) << r.result.message;
        EXPECT_EQ(r.gathering + r.continuing, 2);
        EXPECT_TRUE(sameText(readFile(r.resultsPath()), oracleResults(c.limit, c.enumerated)));
        EXPECT_EQ(readFile(r.checkpointPath()), completeCheckpoint(c.limit));
        EXPECT_EQ(r.result.job.primeCount, primeCount(c.limit));
    }
}

// Nothing is written unless every check has passed, nor after a stop while the results file is
// read; refusals name the file at fault.
TEST(ResumeJob, FilesThatCannotBeTrustedAreLeftUnchanged) {
    const std::string good = oracleResults(37, false);
    auto replaced = [&](const std::string& from, const std::string& to) {
        std::string text = good;
        return text.replace(text.find(from), from.size(), to);
    };
    // Damage inside the file, at block boundaries included, has the scan's own differential
    // test; here one case of each kind the resume itself acts on.
    struct Case {
        const char* name;
        char named;  // the file the message names: 'c'heckpoint, 'r'esults, '-' neither; 's'top
        std::string expected;  // a part of the message; for '-' the whole (none: nothing to resume)
        std::string records;
        std::string checkpoint = kGoodLine;
    };
    const Case cases[] = {
        {"no checkpoint", '-', "", "2\r\n", kNone},
        {"stop asked while gathering", 's', "", good + "41\r\n4"},
        {"finished job", '-', "", good, oracleCheckpoint(101, 100, 0)},
        {"interrupted 2", '-', "", good, oracleCheckpoint(37, 1000, 2)},
        {"candidate above the limit", '-', std::string(kImpossibleToResumeMessage),
         oracleResults(127, false), oracleCheckpoint(127, 105, 1)},
        {"garbage", 'c', "three readable numbers", good, "garbage\r\n"},
        {"checkpoint is a folder", 'c', "cannot be read (Is a directory)", good, kFolder},
        {"not 30k+7", 'c', "30k + 7", good, oracleCheckpoint(38, 1000, 1)},
        {"negative candidate", 'c', "30k + 7", good, "-23  1000  1 \r\n"},
        {"limit out of range", 'c', "922337203685277", good,
         oracleCheckpoint(37, 922337203685477, 1)},
        {"missing results file", 'r', "cannot be read", kNone},
        {"empty results file", 'r', "holds no records", ""},
        {"decreasing", 'r', "increasing order", replaced("11\r\n13\r\n", "13\r\n11\r\n")},
        {"not starting with 2", 'r', "2, 3, 5 and 7", good.substr(3)},
        {"short of the candidate", 'r', "the prime 37 is missing", replaced("37\r\n", "")},
        {"plain then enumerated", 'r', "mixes", replaced("13\r\n", "6;13\r\n")},
        {"serial skipped", 'r', "serial number 12 at line 11",
         oracleResults(29, true) + "12;31\r\n12;37\r\n"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        StopSignal stop;
        if (c.named == 's') stop.request();
        const Resume r(c.records, c.checkpoint, stop);
        EXPECT_EQ(r.result.status, c.named == 's'                         ? Status::Stopped
                                   : c.named == '-' && c.expected.empty() ? Status::NothingToResume
                                                                          : Status::Refused);
        if (c.named == 'c' || c.named == 'r') {
            EXPECT_NE(r.result.message.find(c.expected), std::string::npos) << r.result.message;
            const std::string file = c.named == 'r' ? r.resultsPath() : r.checkpointPath();
            EXPECT_NE(r.result.message.find(file), std::string::npos) << r.result.message;
        } else {
            EXPECT_EQ(r.result.message, c.expected);
        }
        EXPECT_EQ(r.gathering, c.named == 'r' || c.named == 's' ? 1 : 0);
        EXPECT_EQ(r.continuing, 0);
        EXPECT_TRUE(sameText(contents(r.resultsPath()), c.records));
        EXPECT_EQ(contents(r.checkpointPath()), c.checkpoint);
    }
}

}  // namespace
}  // namespace tarn
