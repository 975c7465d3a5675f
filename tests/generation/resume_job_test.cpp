// The resume against the oracle: crafted stopped jobs must end with the file of one uninterrupted
// job; cut-off tails must come back; files it cannot trust must be left as they were.
#include "generation/resume_job.hpp"

#include <gtest/gtest.h>

#include <filesystem>

#include "generation/results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using Status = ResumeResult::Status;
using test::oracleCheckpoint;
using test::oracleResults;

const std::string kNone = "<none>";  // a file that is not there

std::string contents(const std::string& path) {
    return std::filesystem::exists(path) ? test::readFile(path) : kNone;
}

// Writes the two files and runs the resume, recording its events.
struct Resume {
    test::TempFolder folder;
    int gathering = 0, continuing = 0;
    ResumeStart start{};
    ResumeResult result;
    std::string resultsPath() const { return folder.path() + "primes.txt"; }
    std::string checkpointPath() const { return folder.path() + "primes.ini"; }

    Resume(const std::string& records, const std::string& checkpoint,
           const StopSignal& stop = StopSignal{}) {
        if (records != kNone) test::writeFile(resultsPath(), records);
        if (checkpoint != kNone) test::writeFile(checkpointPath(), checkpoint);
        const ResumeEvents events{[this] { ++gathering; },
                                  [this](const ResumeStart& s) {
                                      EXPECT_EQ(gathering, 1) << "gathering comes first";
                                      ++continuing;
                                      start = s;
                                  }};
        result = runResume(folder.path(), stop, nullptr, events);
    }
};

TEST(ResumeJob, StoppedJobsEndWithTheFileOfOneUninterruptedJob) {
    struct Case {
        std::int64_t point, limit;
        bool enumerated;
        std::string tail;  // left past the checkpoint by a job killed between two checkpoints
    };
    std::vector<Case> cases{
        {37, 1000, false, ""},
        {127, 127, false, ""},  // stopped in the last turn at the limit: no turn runs
        {97, 1000, true, ""},   // the serial numbers run on: 25;97 then 26;101
        {37, 1000, false, "4"},
        {37, 1000, false, "41\r"},
        {37, 1000, false, "41\r\n43\r\n47\r\n"},
        {37, 1000, false, "41\r\n43\r\n4"},
        {37, 1000, true, "13;4"},
        {37, 1000, true, "13;41\r\n14;43\r\n15;"},
    };
    for (const std::int64_t point : {7, 37, 67, 97, 997, 2017, 4987})
        for (const bool enumerated : {false, true}) cases.push_back({point, 5000, enumerated, ""});
    for (const Case& c : cases) {
        SCOPED_TRACE(std::to_string(c.point) + "/" + std::to_string(c.limit) +
                     (c.enumerated ? " enumerated, tail " : " plain, tail ") + c.tail);
        const Resume r(oracleResults(c.point, c.enumerated) + c.tail,
                       oracleCheckpoint(c.point, c.limit, 1));
        ASSERT_EQ(r.result.status, Status::Completed) << r.result.message;
        EXPECT_EQ(r.continuing, 1);
        EXPECT_EQ(r.start.limit, c.limit);
        EXPECT_EQ(r.start.resumePoint, c.point);
        EXPECT_EQ(r.start.primeCount, test::primeCount(c.point));
        EXPECT_EQ(r.start.enumerated, c.enumerated);
        EXPECT_EQ(test::readFile(r.resultsPath()), oracleResults(c.limit, c.enumerated));
        EXPECT_EQ(test::readFile(r.checkpointPath()), test::completeCheckpoint(c.limit));
        EXPECT_EQ(r.result.job.primeCount, test::primeCount(c.limit));
    }
}

// Nothing is written unless every check has passed; refusals name the file at fault.
TEST(ResumeJob, FilesThatCannotBeTrustedAreLeftUnchanged) {
    const std::string good = oracleResults(37, false);
    const std::string goodLine = oracleCheckpoint(37, 1000, 1);
    auto replaced = [&](const std::string& from, const std::string& to) {
        std::string text = good;
        return text.replace(text.find(from), from.size(), to);
    };
    enum Named { kNeither, kCheckpoint, kResults };
    struct Case {
        const char* name;
        std::string records, checkpoint;
        Status status;
        Named named;           // the file the message names
        std::string expected;  // kNeither: the whole message; otherwise a part of it
    };
    const Case cases[] = {
        {"no checkpoint", "2\r\n", kNone, Status::NothingToResume, kNeither, ""},
        {"finished job", good, oracleCheckpoint(101, 100, 0), Status::NothingToResume, kNeither,
         ""},
        {"interrupted 2", good, oracleCheckpoint(37, 1000, 2), Status::NothingToResume, kNeither,
         ""},
        {"interrupted -1", good, " 37  1000 -1 \r\n", Status::NothingToResume, kNeither, ""},
        {"candidate above the limit", oracleResults(127, false), oracleCheckpoint(127, 105, 1),
         Status::Refused, kNeither,
         "Impossible to resume! Some error must have ocuured. To Resume you must Cancel the "
         "Calculations."},
        {"checkpoint garbage", good, "garbage\r\n", Status::Refused, kCheckpoint,
         "three readable numbers"},
        {"checkpoint two numbers", good, " 37  1000 \r\n", Status::Refused, kCheckpoint,
         "three readable numbers"},
        {"checkpoint overflow", good, " 99999999999999999999  1000  1 \r\n", Status::Refused,
         kCheckpoint, "three readable numbers"},
        {"candidate not 30k+7", good, oracleCheckpoint(38, 1000, 1), Status::Refused, kCheckpoint,
         "30k + 7"},
        {"negative candidate", good, "-23  1000  1 \r\n", Status::Refused, kCheckpoint,
         "30k + 7"},
        {"limit out of range", good, oracleCheckpoint(37, 922337203685477, 1), Status::Refused,
         kCheckpoint, "922337203685277"},
        {"missing results file", kNone, goodLine, Status::Refused, kResults, "cannot be read"},
        {"empty results file", "", goodLine, Status::Refused, kResults, "holds no records"},
        {"letters in a record", replaced("13\r\n", "1x\r\n"), goodLine, Status::Refused, kResults,
         "not a number at line 6"},
        {"empty record", replaced("13\r\n", "\r\n13\r\n"), goodLine, Status::Refused, kResults,
         "not a number at line 6"},
        {"leading zero", replaced("13\r\n", "013\r\n"), goodLine, Status::Refused, kResults,
         "not a number at line 6"},
        {"blank in a record", replaced("13\r\n", " 13\r\n"), goodLine, Status::Refused, kResults,
         "not a number at line 6"},
        {"LF without CR", replaced("13\r\n", "13\n"), goodLine, Status::Refused, kResults,
         "CR LF at line 6"},
        {"decreasing", replaced("11\r\n13\r\n", "13\r\n11\r\n"), goodLine, Status::Refused,
         kResults, "increasing order"},
        {"repeated record", replaced("13\r\n", "11\r\n13\r\n"), goodLine, Status::Refused,
         kResults, "increasing order"},
        {"not starting with 2", good.substr(3), goodLine, Status::Refused, kResults,
         "2, 3, 5 and 7"},
        {"a seed missing", replaced("5\r\n", ""), goodLine, Status::Refused, kResults,
         "2, 3, 5 and 7"},
        {"last record short of the candidate", replaced("37\r\n", ""), goodLine, Status::Refused,
         kResults, "the prime 37 is missing"},
        {"file of another job", oracleResults(31, false), oracleCheckpoint(997, 1000, 1),
         Status::Refused, kResults, "the prime 37 is missing"},
        {"plain then enumerated", replaced("13\r\n", "6;13\r\n"), goodLine, Status::Refused,
         kResults, "mixes"},
        {"enumerated then plain", oracleResults(31, true) + "37\r\n", goodLine, Status::Refused,
         kResults, "mixes"},
        {"serial number skipped", oracleResults(29, true) + "12;31\r\n12;37\r\n", goodLine,
         Status::Refused, kResults, "serial number 12 at line 11"},
        {"serial numbers from 0", "0;2\r\n", oracleCheckpoint(7, 1000, 1), Status::Refused,
         kResults, "not a number"},
        {"overlong line", good + std::string(5000, '9') + "\r\n", goodLine, Status::Refused,
         kResults, "not a number"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        const Resume r(c.records, c.checkpoint);
        EXPECT_EQ(r.result.status, c.status);
        if (c.named == kNeither) {
            EXPECT_EQ(r.result.message, c.expected);
        } else {
            EXPECT_NE(r.result.message.find(c.expected), std::string::npos) << r.result.message;
            const std::string file = c.named == kResults ? r.resultsPath() : r.checkpointPath();
            EXPECT_NE(r.result.message.find(file), std::string::npos) << r.result.message;
        }
        EXPECT_EQ(r.gathering, c.named == kResults ? 1 : 0);
        EXPECT_EQ(r.continuing, 0);
        EXPECT_EQ(contents(r.resultsPath()), c.records);
        EXPECT_EQ(contents(r.checkpointPath()), c.checkpoint);
    }
}

TEST(ResumeJob, StopWhileGatheringChangesNoFile) {
    const std::string records = oracleResults(37, false) + "41\r\n4";
    StopSignal stop;
    stop.request();
    const Resume r(records, oracleCheckpoint(37, 1000, 1), stop);
    EXPECT_EQ(r.result.status, Status::Stopped);
    EXPECT_EQ(r.continuing, 0);
    EXPECT_EQ(test::readFile(r.resultsPath()), records);
    EXPECT_EQ(test::readFile(r.checkpointPath()), oracleCheckpoint(37, 1000, 1));
}

}  // namespace
}  // namespace tarn
