// tarn-cli test and factorize, run as a program: numbers as arguments and on standard input,
// refused entries, exit codes.
#include <gtest/gtest.h>

#include <filesystem>

#include "support/child_process.hpp"

using namespace tarn::test;

namespace {

CliRun run(const std::vector<std::string>& args, const std::string& input = "",
           const std::string& stdoutPath = "") {
    TempFolder scratch;
    return runCli(args, scratch.path(), input, stdoutPath);
}

}  // namespace

// Arguments and standard input (Windows line ends, blank lines, a refused line, a line too long
// to be held and a last line without its newline): one line each on stdout, refusals on stderr,
// exit code 2 after a refusal.
TEST(CliNumbers, OneLineEachOnStdoutRefusalsOnStderr) {
    EXPECT_EQ(run({"test", "2.7", "abc", "9"}),
              (CliRun{2, "Number 2 is prime.\nNumber 9 is not prime.\n", "Invalid entry.\n"}));
    EXPECT_EQ(run({"factorize", "360", "2.9"}), (CliRun{0, "360 = 2^3 * 3^2 * 5\n2 = 2\n", ""}));
    EXPECT_EQ(run({"test"}, "127\r\n\nx\n9\n" + std::string(5000, '7') + "\n922337203685277"),
              (CliRun{2,
                      "Number 127 is prime.\nNumber 9 is not prime.\nNumber 922337203685277 is "
                      "not prime.\n",
                      "Invalid entry.\nLine 5 is longer than 1024 characters: passed over.\n"}));
}

// Standard output on a full disk: every way of printing there (a batch of entries, the help, the
// version, the reports) ends with exit code 1 and the system's reason, told once; a batch ends at
// the first block that could not be written, before the refusal that follows it.
TEST(CliNumbers, AFailedWriteOnStandardOutputExitsWithOne) {
    if (!std::filesystem::exists("/dev/full")) GTEST_SKIP() << "no /dev/full";
    std::string manyLines;  // more output than one block of the batch
    for (int i = 0; i < 5000; ++i) manyLines += "97\n";
    TempFolder files;  // generate writes primes.txt there, split reads it back
    const std::pair<std::vector<std::string>, std::string> runs[] = {
        {{"test", "97", "x"}, ""},
        {{"test"}, manyLines + "x\n"},
        {{}, ""},
        {{"--version"}, ""},
        {{"--folder", files.path(), "generate", "100"}, ""},
        {{"--folder", files.path(), "split", "--records", "1000", "--into", files.path()}, ""}};
    for (const auto& [args, input] : runs)
        EXPECT_EQ(run(args, input, "/dev/full"),
                  (CliRun{1, "",
                          "The file standard output could not be written: No space left on "
                          "device.\n"}))
            << ::testing::PrintToString(args);
}

TEST(CliNumbers, InterruptEndsTheBatchWithExitCodeThree) {
    // Far more hard numbers than a few seconds can factorize; SIGINT comes once some are done.
    TempFolder folder;
    std::string input;
    for (int i = 0; i < 400000; ++i) input += "922335988900189\n";
    writeFile(folder.path() + "in.txt", input);
    ChildProcess child({"factorize"}, folder.path(), folder.path() + "in.txt");
    waitForGrowth(folder.path() + "cli.out", 0);
    if (!child.stop(ChildProcess::Stop::Interrupt))
        GTEST_SKIP() << "no console events (Wine: stop_under_wine.sh)";
    EXPECT_EQ(child.wait(), 3);
    // Whatever was done is there, in whole lines, and far from all of it.
    const std::string out = child.out();
    EXPECT_LT(out.size(), input.size() * 2);
    EXPECT_TRUE(out.empty() || out.back() == '\n') << out.substr(out.size() - 40);
}
