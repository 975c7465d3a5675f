// tarn-cli generate and resume as a user runs them: the arguments, the report on stdout, refusals
// and notes on stderr, and the exit codes 0 (done), 1 (write failure), 2 (refused), 3 (stopped).
// What the jobs write, and what a refusal leaves alone, is the engine's, tested in depth with the
// generation tests; here the results file only shows that --enumerate reaches the job.
#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <thread>

#include "cli/cli_child.hpp"
#include "generation/results_oracle.hpp"
#include "generation/texts.hpp"

namespace tarn {
namespace {

using namespace test;

struct Cli {
    TempFolder folder;  // the program's files
    TempFolder output;  // the child's captured output, kept apart
    std::string results() const { return folder.path() + "primes.txt"; }
    std::vector<std::string> args(std::vector<std::string> command) const {
        command.insert(command.begin(), {"--folder", folder.path()});
        return command;
    }
};

const std::string kResumeNotes =
    std::string(kGatheringInfoLine) + "\n" + std::string(kDoingResumeInfoLine) + "\n";

TEST(JobCommands, ReportsGoToStdoutRefusalsToStderrWithTheirExitCodes) {
    struct Case {
        std::vector<std::string> command;
        std::string records, checkpoint;  // written before the run; "": no file
        int code;
        std::string report, err;  // report: the middle of the line on stdout, "": none
    };
    const std::string stopped = oracleResults(97, true), at97 = oracleCheckpoint(97, 1000, 1);
    const std::string beyond = oracleResults(127, false);
    const std::string impossible = std::string(kImpossibleToResumeMessage) + "\n";
    const Case cases[] = {
        {{"generate", "100.9", "--enumerate"}, "", "", 0, "25 primes found up to number 100", ""},
        {{"resume"}, stopped, at97, 0, "168 primes found up to number 1000", kResumeNotes},
        {{"generate", "99.9"}, "", "", 2, "", std::string(kMinimumMessage) + "\n"},
        {{"generate", "abc"}, "", "", 2, "", "Invalid entry.\n"},
        {{"resume"}, "", "", 2, "", "Nothing to resume.\n"},
        {{"resume"}, beyond, " 127  105  1 \r\n", 2, "", impossible}};
    for (const Case& c : cases) {
        const Cli cli;
        if (!c.records.empty()) writeFile(cli.results(), c.records);
        if (!c.checkpoint.empty()) writeFile(cli.folder.path() + "primes.ini", c.checkpoint);
        std::string out = c.report;
        if (!out.empty())
            out = "Done!!! The results were saved in the file " + cli.results() + ". " + out +
                  "... Save the file to other location.\n";
        EXPECT_EQ(runCli(cli.args(c.command), cli.output.path()), (CliRun{c.code, out, c.err}));
        if (c.command.back() == "--enumerate") {
            EXPECT_EQ(readFile(cli.results()), oracleResults(100, true));
        }
    }
}

TEST(JobCommands, WriteFailureExitsWithOne) {
    if (!std::filesystem::exists("/dev/full")) GTEST_SKIP() << "no /dev/full";
    const Cli cli;
    std::filesystem::create_symlink("/dev/full", cli.results());
    const CliRun run = runCli(cli.args({"generate", "1000"}), cli.output.path());
    EXPECT_EQ(run.code, 1);
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err.rfind("The file " + cli.results() + " could not be written: ", 0), 0u)
        << run.err;
}

// SIGTERM, or SIGHUP from a closed terminal, during a long job: it leaves through its stop path.
TEST(JobCommands, TerminationStopsTheJobWithExitCodeThree) {
    for (const bool resume : {false, true}) {
        const Cli cli;
        if (resume) writeFile(cli.results(), oracleResults(37, false));
        if (resume) writeFile(cli.folder.path() + "primes.ini", " 37  100000000000  1 \r\n");
        const auto before = resume ? std::filesystem::file_size(cli.results()) : 0;
        CliChild child(cli.args(resume ? std::vector<std::string>{"resume"}
                                       : std::vector<std::string>{"generate", "100000000000"}),
                       cli.output.path());
        // The signal comes once the job is writing records, however slowly the program starts.
        waitForGrowth(cli.results(), before + 100'000);
        const bool sent = resume ? child.hangUp() : child.terminate();
        if (!sent) GTEST_SKIP() << "no console events (Wine: stop_under_wine.sh)";
        EXPECT_EQ(child.wait(), 3) << child.err();
        EXPECT_EQ(child.err(),
                  (resume ? kResumeNotes : "") + std::string(kAllStoppedMessage) + "\n");
        EXPECT_EQ(child.out(), "");
    }
}

}  // namespace
}  // namespace tarn
