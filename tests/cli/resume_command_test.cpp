// tarn-cli resume as a user runs it: exit codes, the report on stdout, notes on stderr, and the
// files it leaves.
#include <gtest/gtest.h>

#include <chrono>
#include <thread>

#include "../generation/results_oracle.hpp"
#include "generation/checkpoint_file.hpp"
#include "resume_child_process.hpp"

namespace tarn {
namespace {

using test::oracleCheckpoint;
using test::oracleResults;
using test::readFile;
using test::TempFolder;
using test::writeFile;

struct CliFiles {
    TempFolder folder;  // the program's files
    TempFolder output;  // the child's captured output, kept apart
    std::string results() const { return folder.path() + "primes.txt"; }
    std::string checkpoint() const { return folder.path() + "primes.ini"; }
    test::CliRun resume() {
        return test::runCli({"--folder", folder.path(), "resume"}, output.path());
    }
};

TEST(ResumeCommand, CompletesAndPrintsTheReport) {
    CliFiles files;
    writeFile(files.results(), oracleResults(97, true));
    writeFile(files.checkpoint(), oracleCheckpoint(97, 1000, 1));
    const test::CliRun run = files.resume();
    EXPECT_EQ(run.code, 0) << run.err;
    EXPECT_EQ(run.out, "Done!!! The results were saved in the file " + files.results() +
                           ". 168 primes found up to number 1000... Save the file to other "
                           "location.\n");
    EXPECT_EQ(readFile(files.results()), oracleResults(1000, true));
    EXPECT_EQ(readFile(files.checkpoint()), " 1001  1000  0 \r\n");
}

TEST(ResumeCommand, NothingToResumeAndRefusalsExitWithTwo) {
    {
        CliFiles files;
        const test::CliRun run = files.resume();
        EXPECT_EQ(run.code, 2);
        EXPECT_EQ(run.err, "Nothing to resume.\n");
        EXPECT_EQ(run.out, "");
        EXPECT_EQ(readFile(files.checkpoint()), "") << "resume creates no checkpoint";
    }
    {
        CliFiles files;
        writeFile(files.results(), oracleResults(127, false));
        writeFile(files.checkpoint(), oracleCheckpoint(127, 105, 1));
        const test::CliRun run = files.resume();
        EXPECT_EQ(run.code, 2);
        EXPECT_EQ(run.err,
                  "Impossible to resume! Some error must have ocuured. To Resume you must Cancel "
                  "the Calculations.\n");
        EXPECT_EQ(run.out, "");
        EXPECT_EQ(readFile(files.results()), oracleResults(127, false));
        EXPECT_EQ(readFile(files.checkpoint()), oracleCheckpoint(127, 105, 1));
    }
    {
        CliFiles files;
        const std::string records = oracleResults(31, false);
        writeFile(files.results(), records);
        writeFile(files.checkpoint(), oracleCheckpoint(37, 1000, 1));
        const test::CliRun run = files.resume();
        EXPECT_EQ(run.code, 2);
        EXPECT_NE(run.err.find("the results file " + files.results()), std::string::npos)
            << run.err;
        EXPECT_EQ(readFile(files.results()), records);
    }
}

// SIGTERM during a long resume: the job leaves through its stop path and can be resumed again.
TEST(ResumeCommand, TerminationStopsAndLeavesAResumableCheckpoint) {
    CliFiles files;
    const std::int64_t limit = 1000000000000;
    writeFile(files.results(), oracleResults(37, false));
    writeFile(files.checkpoint(), oracleCheckpoint(37, limit, 1));
    for (int round = 0; round < 2; ++round) {
        test::CliChild child({"--folder", files.folder.path(), "resume"}, files.output.path());
        ASSERT_TRUE(child.started());
        std::this_thread::sleep_for(std::chrono::milliseconds(300));
        child.signal(SIGTERM);
        EXPECT_EQ(child.wait(), 3) << child.err();
        EXPECT_NE(child.err().find("All calculations were stopped!\n"), std::string::npos);
        EXPECT_EQ(child.out(), "");
        const auto checkpoint = readCheckpoint(files.checkpoint());
        ASSERT_TRUE(checkpoint.has_value());
        EXPECT_EQ(checkpoint->limit, limit);
        EXPECT_EQ(checkpoint->interrupted, 1);
        EXPECT_EQ(checkpoint->candidate % 30, 7);
        EXPECT_GT(checkpoint->candidate, 37);
    }
}

}  // namespace
}  // namespace tarn
