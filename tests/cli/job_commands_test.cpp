// tarn-cli generate and resume as a user runs them: the arguments, the report on stdout, refusals
// and notes on stderr, and the exit codes 0 (done), 1 (write failure), 2 (refused), 3 (stopped).
// What the jobs write is the engine's, tested in depth with the generation tests.
#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <thread>

#include "cli/cli_child.hpp"
#include "generation/checkpoint_file.hpp"
#include "generation/results_oracle.hpp"

namespace tarn {
namespace {

using namespace test;

struct Cli {
    TempFolder folder;  // the program's files
    TempFolder output;  // the child's captured output, kept apart
    std::string results() const { return folder.path() + "primes.txt"; }
    std::string checkpoint() const { return folder.path() + "primes.ini"; }
    std::vector<std::string> args(std::vector<std::string> command) const {
        command.insert(command.begin(), {"--folder", folder.path()});
        return command;
    }
    CliRun run(const std::vector<std::string>& command) const {
        return runCli(args(command), output.path());
    }
};

std::string report(const std::string& path, int primes, int limit) {
    return "Done!!! The results were saved in the file " + path + ". " + std::to_string(primes) +
           " primes found up to number " + std::to_string(limit) +
           "... Save the file to other location.\n";
}

TEST(JobCommands, CompletedJobsPrintTheReportAndExitWithZero) {
    const Cli generate;
    const CliRun g = generate.run({"generate", "100.9", "--enumerate"});
    EXPECT_EQ(g.code, 0) << g.err;
    EXPECT_EQ(g.out, report(generate.results(), 25, 100));
    EXPECT_EQ(readFile(generate.results()), oracleResults(100, true));
    EXPECT_EQ(readFile(generate.checkpoint()), " 101  100  0 \r\n");

    const Cli resume;
    writeFile(resume.results(), oracleResults(97, true));
    writeFile(resume.checkpoint(), oracleCheckpoint(97, 1000, 1));
    const CliRun r = resume.run({"resume"});
    EXPECT_EQ(r.code, 0) << r.err;
    EXPECT_EQ(r.out, report(resume.results(), 168, 1000));
    EXPECT_EQ(readFile(resume.checkpoint()), " 1001  1000  0 \r\n");
}

TEST(JobCommands, RefusalsGoToStderrAndExitWithTwo) {
    struct Case {
        std::vector<std::string> command;
        std::string records, checkpoint;  // written before, and still there after; "": no file
        std::string message;
    };
    const std::string outOfRange =
        "Value out of range. Value must be between 2 and 922 337 203 685 277.\n";
    const std::string impossible =
        "Impossible to resume! Some error must have ocuured. To Resume you must Cancel the "
        "Calculations.\n";
    const Case cases[] = {
        {{"generate", "99.9"}, "", "", "Minimum value is 100\n"},
        {{"generate", "abc"}, "", "", "Invalid entry.\n"},
        {{"generate", "1.5"}, "", "", outOfRange},
        {{"resume"}, "", "", "Nothing to resume.\n"},
        {{"resume"}, oracleResults(127, false), oracleCheckpoint(127, 105, 1), impossible}};
    for (const Case& c : cases) {
        const Cli cli;
        if (!c.records.empty()) writeFile(cli.results(), c.records);
        if (!c.checkpoint.empty()) writeFile(cli.checkpoint(), c.checkpoint);
        const CliRun run = cli.run(c.command);
        EXPECT_EQ(run.code, 2) << c.message;
        EXPECT_EQ(run.err, c.message);
        EXPECT_EQ(run.out, "");
        for (const auto& [path, text] :
             {std::pair{cli.results(), c.records}, {cli.checkpoint(), c.checkpoint}}) {
            EXPECT_EQ(std::filesystem::exists(path), !text.empty()) << path;
            EXPECT_EQ(readFile(path), text);
        }
    }
}

TEST(JobCommands, WriteFailureExitsWithOne) {
    if (!std::filesystem::exists("/dev/full")) GTEST_SKIP() << "no /dev/full";
    const Cli cli;
    std::filesystem::create_symlink("/dev/full", cli.results());
    const CliRun run = cli.run({"generate", "1000"});
    EXPECT_EQ(run.code, 1);
    EXPECT_EQ(run.err.rfind("The file " + cli.results() + " could not be written: ", 0), 0u)
        << run.err;
}

// SIGTERM during a long job: it leaves through its stop path with a resumable checkpoint.
TEST(JobCommands, TerminationStopsAtAWholeTurnAndExitsWithThree) {
    const std::int64_t limit = 100'000'000'000;
    for (const bool resume : {false, true}) {
        const Cli cli;
        if (resume) writeFile(cli.results(), oracleResults(37, false));
        if (resume) writeFile(cli.checkpoint(), oracleCheckpoint(37, limit, 1));
        CliChild child(
            cli.args(resume ? std::vector<std::string>{"resume"}
                            : std::vector<std::string>{"generate", std::to_string(limit)}),
            cli.output.path());
        std::this_thread::sleep_for(std::chrono::milliseconds(300));
        child.signal(SIGTERM);
        EXPECT_EQ(child.wait(), 3) << child.err();
        EXPECT_EQ(child.err(), resume ? "INFO: Gathering information...\nINFO: Doing resume...\n"
                                        "All calculations were stopped!\n"
                                      : "All calculations were stopped!\n");
        EXPECT_EQ(child.out(), "");
        const auto checkpoint = readCheckpoint(cli.checkpoint());
        ASSERT_TRUE(checkpoint.has_value());
        EXPECT_EQ(checkpoint->limit, limit);
        EXPECT_EQ(checkpoint->interrupted, 1);
        EXPECT_EQ(checkpoint->candidate % 30, 7);
        EXPECT_GT(checkpoint->candidate, 37);
    }
}

}  // namespace
}  // namespace tarn
