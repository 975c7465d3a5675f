// The resume against an independent sieve: crafted stopped jobs must end with the file of one
// uninterrupted job; refusals must leave both files untouched; cut-off tails must come back.
#include "generation/resume_job.hpp"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "generation/resume_texts.hpp"
#include "results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using test::nextTurnAbove;
using test::oracleCheckpoint;
using test::oracleResults;
using test::readFile;
using test::TempFolder;
using test::writeFile;

struct Files {
    TempFolder folder;
    std::string results() const { return folder.path() + "primes.txt"; }
    std::string checkpoint() const { return folder.path() + "primes.ini"; }
    void write(const std::string& records, const std::string& checkpointLine) {
        writeFile(results(), records);
        writeFile(checkpoint(), checkpointLine);
    }
};

struct Recorded {
    int gathering = 0;
    int continuing = 0;
    ResumeStart start{};
    ResumeEvents events() {
        return {[this] { ++gathering; },
                [this](const ResumeStart& s) {
                    EXPECT_EQ(gathering, 1) << "gathering comes first";
                    ++continuing;
                    start = s;
                }};
    }
};

ResumeResult resume(const Files& files, Recorded& recorded, const StopSignal& stop = {},
                    JobProgress* progress = nullptr) {
    return runResume(files.folder.path(), stop, progress, recorded.events());
}

TEST(ResumeJob, StoppedAfterTheFirstTurnEndsLikeAnUninterruptedJob) {
    Files files;
    files.write(oracleResults(37, false), oracleCheckpoint(37, 1000, 1));
    Recorded recorded;
    const ResumeResult result = resume(files, recorded);

    ASSERT_EQ(result.status, ResumeResult::Status::Completed) << result.message;
    EXPECT_EQ(recorded.continuing, 1);
    EXPECT_EQ(recorded.start.limit, 1000);
    EXPECT_EQ(recorded.start.resumePoint, 37);
    EXPECT_EQ(recorded.start.primeCount, 12);
    EXPECT_FALSE(recorded.start.enumerated);
    EXPECT_EQ(readFile(files.results()), oracleResults(1000, false));
    EXPECT_EQ(readFile(files.checkpoint()), " 1001  1000  0 \r\n");
    EXPECT_EQ(result.job.primeCount, 168);
    EXPECT_NE(completionReport(result.job).find(". 168 primes found up to number 1000... "),
              std::string::npos);
}

TEST(ResumeJob, StoppedInTheLastTurnAtTheLimitRunsNoTurn) {
    Files files;
    files.write(oracleResults(127, false), oracleCheckpoint(127, 127, 1));
    Recorded recorded;
    const ResumeResult result = resume(files, recorded);

    ASSERT_EQ(result.status, ResumeResult::Status::Completed) << result.message;
    EXPECT_EQ(recorded.start.primeCount, 31);
    EXPECT_EQ(readFile(files.results()), oracleResults(127, false));
    EXPECT_EQ(readFile(files.checkpoint()), " 131  127  0 \r\n");
    EXPECT_EQ(result.job.primeCount, 31);
    EXPECT_EQ(completionInfoLine(result.job), "INFO: 31 primes found up to number 127...");
}

TEST(ResumeJob, CandidateAboveTheLimitIsRefusedWithTheFixedText) {
    Files files;
    const std::string records = oracleResults(127, false);
    files.write(records, oracleCheckpoint(127, 105, 1));
    Recorded recorded;
    const ResumeResult result = resume(files, recorded);

    EXPECT_EQ(result.status, ResumeResult::Status::Refused);
    EXPECT_EQ(result.message,
              "Impossible to resume! Some error must have ocuured. To Resume you must Cancel the "
              "Calculations.");
    EXPECT_EQ(recorded.gathering, 0);
    EXPECT_EQ(readFile(files.results()), records);
    EXPECT_EQ(readFile(files.checkpoint()), oracleCheckpoint(127, 105, 1));
}

TEST(ResumeJob, EnumeratedFileContinuesItsSerialNumbers) {
    Files files;
    files.write(oracleResults(97, true), oracleCheckpoint(97, 1000, 1));
    Recorded recorded;
    const ResumeResult result = resume(files, recorded);

    ASSERT_EQ(result.status, ResumeResult::Status::Completed) << result.message;
    EXPECT_TRUE(recorded.start.enumerated);
    EXPECT_EQ(recorded.start.primeCount, 25);
    const std::string text = readFile(files.results());
    EXPECT_NE(text.find("\r\n25;97\r\n26;101\r\n"), std::string::npos);
    EXPECT_EQ(text, oracleResults(1000, true));
}

TEST(ResumeJob, NothingToResumeTouchesNothing) {
    {
        Files files;  // no checkpoint at all
        writeFile(files.results(), "2\r\n");
        Recorded recorded;
        EXPECT_EQ(resume(files, recorded).status, ResumeResult::Status::NothingToResume);
        EXPECT_EQ(recorded.gathering, 0);
        EXPECT_EQ(readFile(files.results()), "2\r\n");
    }
    for (const int interrupted : {0, 2, -1}) {
        Files files;
        const std::string records = oracleResults(37, false);
        const std::string line = interrupted == 0 ? oracleCheckpoint(101, 100, 0)
                                                  : oracleCheckpoint(37, 1000, interrupted);
        files.write(records, line);
        Recorded recorded;
        EXPECT_EQ(resume(files, recorded).status, ResumeResult::Status::NothingToResume)
            << interrupted;
        EXPECT_EQ(recorded.gathering, 0);
        EXPECT_EQ(readFile(files.results()), records);
        EXPECT_EQ(readFile(files.checkpoint()), line);
    }
}

// Stopped jobs crafted at several turns, in both forms, all end with the same file.
TEST(ResumeJob, EveryStopPointGivesTheUninterruptedFile) {
    const std::int64_t limit = 5000;
    for (const bool enumerated : {false, true}) {
        for (const std::int64_t point : {7, 37, 67, 97, 997, 2017, 4987}) {
            Files files;
            files.write(oracleResults(point, enumerated), oracleCheckpoint(point, limit, 1));
            Recorded recorded;
            const ResumeResult result = resume(files, recorded);
            ASSERT_EQ(result.status, ResumeResult::Status::Completed) << result.message;
            EXPECT_EQ(readFile(files.results()), oracleResults(limit, enumerated)) << point;
            EXPECT_EQ(readFile(files.checkpoint()),
                      oracleCheckpoint(nextTurnAbove(limit), limit, 0));
        }
    }
}

// What a job killed between two periodic checkpoints leaves: records past the checkpoint and a
// torn last line. Both are cut and generated again.
TEST(ResumeJob, TailPastTheCheckpointIsCutAndRegenerated) {
    struct Case {
        const char* name;
        bool enumerated;
        std::string tail;
    };
    const Case cases[] = {
        {"torn digits", false, "4"},
        {"torn before LF", false, "41\r"},
        {"records past the checkpoint", false, "41\r\n43\r\n47\r\n"},
        {"records and a torn line", false, "41\r\n43\r\n4"},
        {"enumerated torn", true, "13;4"},
        {"enumerated past the checkpoint", true, "13;41\r\n14;43\r\n15;"},
    };
    for (const Case& c : cases) {
        Files files;
        files.write(oracleResults(37, c.enumerated) + c.tail, oracleCheckpoint(37, 1000, 1));
        Recorded recorded;
        const ResumeResult result = resume(files, recorded);
        ASSERT_EQ(result.status, ResumeResult::Status::Completed) << c.name << result.message;
        EXPECT_EQ(recorded.start.primeCount, 12) << c.name;
        EXPECT_EQ(readFile(files.results()), oracleResults(1000, c.enumerated)) << c.name;
    }
}

// Every file the resume cannot trust is refused before anything is written.
TEST(ResumeJob, FilesThatCannotBeTrustedAreRefusedUnchanged) {
    const std::string good = oracleResults(37, false);
    const std::string goodLine = oracleCheckpoint(37, 1000, 1);
    auto replaced = [&](const std::string& from, const std::string& to) {
        std::string text = good;
        text.replace(text.find(from), from.size(), to);
        return text;
    };
    struct Case {
        const char* name;
        std::string records;  // "<none>" for a missing results file
        std::string checkpoint;
        const char* expected;  // a part of the message
    };
    const Case cases[] = {
        {"missing results file", "<none>", goodLine, "cannot be read"},
        {"empty results file", "", goodLine, "holds no records"},
        {"checkpoint garbage", good, "garbage\r\n", "three readable numbers"},
        {"checkpoint two numbers", good, " 37  1000 \r\n", "three readable numbers"},
        {"checkpoint overflow", good, " 99999999999999999999  1000  1 \r\n",
         "three readable numbers"},
        {"candidate not 30k+7", good, oracleCheckpoint(38, 1000, 1), "30k + 7"},
        {"negative candidate", good, oracleCheckpoint(-23, 1000, 1), "30k + 7"},
        {"limit out of range", good, oracleCheckpoint(37, 922337203685477, 1), "922337203685277"},
        {"letters in a record", replaced("13\r\n", "1x\r\n"), goodLine, "not a number at line 6"},
        {"empty record", replaced("13\r\n", "\r\n13\r\n"), goodLine, "not a number at line 6"},
        {"leading zero", replaced("13\r\n", "013\r\n"), goodLine, "not a number at line 6"},
        {"blank in a record", replaced("13\r\n", " 13\r\n"), goodLine, "not a number at line 6"},
        {"LF without CR", replaced("13\r\n", "13\n"), goodLine, "CR LF at line 6"},
        {"decreasing", replaced("11\r\n13\r\n", "13\r\n11\r\n"), goodLine, "increasing order"},
        {"repeated record", replaced("13\r\n", "11\r\n13\r\n"), goodLine, "increasing order"},
        {"not starting with 2", good.substr(3), goodLine, "2, 3, 5 and 7"},
        {"a seed missing", replaced("5\r\n", ""), goodLine, "2, 3, 5 and 7"},
        {"last record short of the candidate", replaced("37\r\n", ""), goodLine,
         "the prime 37 is missing"},
        {"file of another job", oracleResults(31, false), oracleCheckpoint(997, 1000, 1),
         "the prime 37 is missing"},
        {"plain then enumerated", replaced("13\r\n", "6;13\r\n"), goodLine, "mixes"},
        {"enumerated then plain", oracleResults(31, true) + "37\r\n", goodLine, "mixes"},
        {"serial number skipped", oracleResults(29, true) + "12;31\r\n12;37\r\n", goodLine,
         "serial number 12 at line 11"},
        {"serial numbers from 0", "0;2\r\n", oracleCheckpoint(7, 1000, 1), "not a number"},
        {"overlong line", good + std::string(5000, '9') + "\r\n", goodLine, "not a number"},
    };
    for (const Case& c : cases) {
        Files files;
        if (c.records != "<none>") writeFile(files.results(), c.records);
        writeFile(files.checkpoint(), c.checkpoint);
        Recorded recorded;
        const ResumeResult result = resume(files, recorded);
        EXPECT_EQ(result.status, ResumeResult::Status::Refused) << c.name;
        EXPECT_NE(result.message.find(c.expected), std::string::npos)
            << c.name << ": " << result.message;
        const std::string named =
            c.records == good && c.checkpoint != goodLine ? files.checkpoint() : files.results();
        EXPECT_NE(result.message.find(named), std::string::npos)
            << c.name << ": " << result.message;
        EXPECT_EQ(recorded.continuing, 0) << c.name;
        EXPECT_EQ(readFile(files.results()), c.records == "<none>" ? "" : c.records) << c.name;
        EXPECT_EQ(readFile(files.checkpoint()), c.checkpoint) << c.name;
    }
}

TEST(ResumeJob, StopWhileGatheringChangesNoFile) {
    Files files;
    const std::string records = oracleResults(37, false) + "41\r\n4";
    files.write(records, oracleCheckpoint(37, 1000, 1));
    StopSignal stop;
    stop.request();
    Recorded recorded;
    const ResumeResult result = resume(files, recorded, stop);
    EXPECT_EQ(result.status, ResumeResult::Status::Stopped);
    EXPECT_EQ(recorded.continuing, 0);
    EXPECT_EQ(readFile(files.results()), records);
    EXPECT_EQ(readFile(files.checkpoint()), oracleCheckpoint(37, 1000, 1));
}

// Stops raised from another thread while the engine runs, resumed again each time.
TEST(ResumeJob, RepeatedStopsAndResumesGiveTheUninterruptedFile) {
    const std::int64_t limit = 400000;
    for (const bool enumerated : {false, true}) {
        Files files;
        files.write(oracleResults(37, enumerated), oracleCheckpoint(37, limit, 1));
        int stops = 0;
        ResumeResult result;
        for (int cycle = 1; cycle <= 20; ++cycle) {
            StopSignal stop;
            JobProgress progress;
            std::atomic<bool> done{false};
            const std::int64_t target = cycle * 30000;
            std::thread watcher([&] {
                while (!done.load() && progress.candidate.load() < target)
                    std::this_thread::yield();
                stop.request();
            });
            Recorded recorded;
            result = resume(files, recorded, stop, &progress);
            done = true;
            watcher.join();
            if (result.status == ResumeResult::Status::Completed) break;
            ASSERT_EQ(result.status, ResumeResult::Status::Stopped) << result.message;
            ++stops;
            // The stopped engine's checkpoint must be resumable as it is.
            EXPECT_EQ(readFile(files.checkpoint()),
                      oracleCheckpoint(result.job.candidate, limit, 1));
            EXPECT_EQ(result.job.candidate % 30, 7);
        }
        ASSERT_EQ(result.status, ResumeResult::Status::Completed) << result.message;
        EXPECT_EQ(readFile(files.results()), oracleResults(limit, enumerated));
        EXPECT_EQ(readFile(files.checkpoint()), oracleCheckpoint(nextTurnAbove(limit), limit, 0));
        RecordProperty(enumerated ? "stopsEnumerated" : "stopsPlain", stops);
    }
}

}  // namespace
}  // namespace tarn
