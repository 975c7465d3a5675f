// tarn-cli generate and resume as a user runs them: the arguments, the report on stdout, refusals
// and notes on stderr, and the exit codes 0 (done), 1 (write failure), 2 (refused), 3 (stopped).
// What the jobs write, and the refusals' texts, are the engine's, tested with the generation
// tests; one refusal of each command shows the way out, and the results file only shows that
// --enumerate reaches the job.
#include <gtest/gtest.h>

#include <filesystem>

#include "generation/results_oracle.hpp"
#include "generation/texts.hpp"
#include "support/child_process.hpp"

namespace tarn {
namespace {

using namespace test;

const std::string kResumeNotes =
    std::string(kGatheringInfoLine) + "\n" + std::string(kDoingResumeInfoLine) + "\n";

TEST(JobCommands, ReportsGoToStdoutRefusalsToStderrWithTheirExitCodes) {
    struct Case {
        std::string command, number, records;  // records: with a checkpoint at 97, "": none
        int code;
        std::string report, err;  // report: the middle of the line on stdout, "": none
    };
    const Case cases[] = {{"generate", "100.9", "", 0, "25 primes found up to number 100", ""},
                          {"resume", "", oracleResults(97, true), 0,
                           "168 primes found up to number 1000", kResumeNotes},
                          {"generate", "99.9", "", 2, "", std::string(kMinimumMessage) + "\n"},
                          {"resume", "", "", 2, "", "Nothing to resume.\n"}};
    for (const Case& c : cases) {
        TempFolder folder, output;
        const std::string results = folder.path() + "primes.txt";
        if (!c.records.empty()) writeFile(results, c.records);
        if (!c.records.empty())
            writeFile(folder.path() + "primes.ini", oracleCheckpoint(97, 1000, 1));
        std::vector<std::string> args{"--folder", folder.path(), c.command};
        if (!c.number.empty()) args.insert(args.end(), {c.number, "--enumerate"});
        const std::string out = c.report.empty() ? ""
                                                 : "Done!!! The results were saved in the file " +
                                                       results + ". " + c.report +
                                                       "... Save the file to other location.\n";
        EXPECT_EQ(runCli(args, output.path()), (CliRun{c.code, out, c.err}));
        if (c.number == "100.9") {
            EXPECT_EQ(readFile(results), oracleResults(100, true));
        }
    }
}

TEST(JobCommands, WriteFailureExitsWithOne) {
    if (!std::filesystem::exists("/dev/full")) GTEST_SKIP() << "no /dev/full";
    TempFolder folder, output;
    std::filesystem::create_symlink("/dev/full", folder.path() + "primes.txt");
    const CliRun run = runCli({"--folder", folder.path(), "generate", "1000"}, output.path());
    EXPECT_EQ(run.code, 1);
    EXPECT_EQ(run.out, "");
    EXPECT_TRUE(
        run.err.starts_with("The file " + folder.path() + "primes.txt could not be written"))
        << run.err;
}

// SIGTERM, or SIGHUP from a closed terminal, during a long job: it leaves through its stop path.
TEST(JobCommands, TerminationStopsTheJobWithExitCodeThree) {
    for (const bool resume : {false, true}) {
        TempFolder folder, output;
        const std::string results = folder.path() + "primes.txt";
        if (resume) writeFile(results, oracleResults(37, false));
        if (resume) writeFile(folder.path() + "primes.ini", " 37  100000000000  1 \r\n");
        const auto before = sizeOf(results);
        ChildProcess child({"--folder", folder.path(), resume ? "resume" : "generate",
                            resume ? "--threads=1" : "100000000000"},
                           output.path());
        // The signal comes once the job is writing records, however slowly the program starts.
        waitForGrowth(results, before + 100'000);
        if (!child.stop(resume ? ChildProcess::Stop::HangUp : ChildProcess::Stop::Terminate))
            GTEST_SKIP() << "no console events (Wine: stop_under_wine.sh)";
        const int code = child.wait();
        EXPECT_EQ(
            (CliRun{code, child.out(), child.err()}),
            (CliRun{3, "", (resume ? kResumeNotes : "") + std::string(kAllStoppedMessage) + "\n"}));
    }
}

}  // namespace
}  // namespace tarn
