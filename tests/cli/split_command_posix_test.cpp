// tarn-cli split reading a pipe in the results file's place, and factorize reading a pipe on
// standard input: stopped by Ctrl-C while they wait; the split's progress line on a terminal
// (POSIX: named pipes, signals, pseudo-terminals).
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <pty.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>

#include "cli_child.hpp"

using namespace tarn::test;

namespace {

struct SplitInterrupt : ::testing::Test {
    TempFolder data, into, scratch;
};

}  // namespace

TEST_F(SplitInterrupt, CtrlCStopsBetweenRecordsWithExitCodeThree) {
    // The results file is a pipe that this test feeds, so the split is surely running, and
    // waiting for more records, when the interrupt comes.
    const std::string results = data.path() + "primes.txt";
    ASSERT_EQ(mkfifo(results.c_str(), 0600), 0);
    CliChild child({"--folder", data.path(), "split", "--records", "1000", "--into", into.path()},
                   scratch.path());
    const auto oldPipeAction = std::signal(SIGPIPE, SIG_IGN);
    std::FILE* feed = std::fopen(results.c_str(), "w");  // waits for the reader
    bool done = false;
    // The interrupt may meet the split just before it waits for the pipe again; more records
    // wake it up until it has seen the stop and left.
    for (int more = 0; feed && !done && more <= 1000; ++more) {
        std::fputs(
            more ? ("2;" + std::to_string(more) + "\r\n").c_str() : enumeratedRecords(1500).c_str(),
            feed);
        std::fflush(feed);
        if (more == 0) child.interrupt();
        usleep(5000);
        done = child.finished();
    }
    if (feed) std::fclose(feed);
    std::signal(SIGPIPE, oldPipeAction);
    ASSERT_TRUE(done) << "the split did not stop";
    EXPECT_EQ(child.wait(), 3);
    const std::string printed = child.out();
    EXPECT_TRUE(printed.starts_with("Done!!! ") && printed.ends_with(" files were created.\n"))
        << printed;
}

TEST_F(SplitInterrupt, CtrlCEndsABatchWaitingForStandardInputWithExitCodeThree) {
    const std::string input = data.path() + "in";
    ASSERT_EQ(mkfifo(input.c_str(), 0600), 0);
    // Open for both, so that neither this open nor the child's waits for the other end.
    const int feed = open(input.c_str(), O_RDWR);
    ASSERT_GE(feed, 0);
    CliChild child({"factorize"}, scratch.path(), input);
    // Lines whose answers just fill a block of output (64 KiB), so that all show before it waits
    // for more.
    std::string lines, factors;
    for (int i = 0; i < 3277; ++i) lines += "360\n", factors += "360 = 2^3 * 3^2 * 5\n";
    ASSERT_EQ(write(feed, lines.data(), lines.size()), static_cast<ssize_t>(lines.size()));
    waitForGrowth(scratch.path() + "cli.out", factors.size() - 1);
    for (int tries = 0; tries < 100 && !child.finished(); ++tries) {
        if (tries % 10 == 0) child.interrupt();
        usleep(10000);
    }
    close(feed);
    EXPECT_EQ(child.wait(), 3);
    EXPECT_EQ(child.out(), factors);
}

TEST_F(SplitInterrupt, ShowsProgressOnATerminal) {
    // Fed through a pipe, the split runs long enough for a progress line; a pipe has no size, so
    // the share and the time left stay unknown. Off a terminal nothing is shown (see above).
    const std::string results = data.path() + "primes.txt";
    ASSERT_EQ(mkfifo(results.c_str(), 0600), 0);
    int terminal = -1;
    const pid_t pid = forkpty(&terminal, nullptr, nullptr, nullptr);
    ASSERT_GE(pid, 0);
    if (pid == 0) {
        execl(TARN_CLI_PATH, TARN_CLI_PATH, "--folder", data.path().c_str(), "split", "--records",
              "1000", "--into", into.path().c_str(), nullptr);
        _exit(127);
    }
    std::FILE* feed = std::fopen(results.c_str(), "w");
    ASSERT_TRUE(feed);
    std::fputs(enumeratedRecords(1500).c_str(), feed);
    std::fflush(feed);
    usleep(700000);
    std::fclose(feed);
    std::string shown;
    char buffer[256];
    for (ssize_t got; (got = read(terminal, buffer, sizeof buffer)) > 0;) shown.append(buffer, got);
    close(terminal);
    int status = 0;
    waitpid(pid, &status, 0);
    EXPECT_EQ(status, 0);
    EXPECT_THAT(shown, ::testing::StartsWith("\r\x1b[K"));
    EXPECT_THAT(shown, ::testing::ContainsRegex(
                           R"(  0\.0%  [12] files?  0:00:0[0-9] elapsed  -:--:-- left)"));
    EXPECT_THAT(shown, ::testing::EndsWith("\r\x1b[KDone!!! 2 files were created.\r\n"));
}
