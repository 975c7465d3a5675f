// Ctrl-C while tarn-cli waits on a pipe: split reading one in the results file's place, factorize
// reading one on standard input; and the split's progress line on a terminal (POSIX: named pipes,
// signals, pseudo-terminals).
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <pty.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>

#include "support/child_process.hpp"

using namespace tarn::test;

TEST(CtrlC, StopsASplitBetweenRecordsWithExitCodeThree) {
    TempFolder data, into, scratch;
    const std::string results = data.path() + "primes.txt";
    ASSERT_EQ(mkfifo(results.c_str(), 0600), 0);
    ChildProcess child(
        {"--folder", data.path(), "split", "--records", "1000", "--into", into.path()},
        scratch.path());
    const auto oldPipeAction = std::signal(SIGPIPE, SIG_IGN);
    std::FILE* feed = std::fopen(results.c_str(), "w");  // waits for the reader
    // The interrupt may meet the split just before it waits for the pipe again; more records
    // wake it up until it has seen the stop and left.
    for (int more = 0; feed && !child.finished() && more <= 1000; ++more) {
        std::fputs(more ? "2;2\r\n" : enumeratedRecords(1500).c_str(), feed);
        std::fflush(feed);
        if (more == 0) child.stop(ChildProcess::Stop::Interrupt);
        usleep(5000);
    }
    if (feed) std::fclose(feed);
    std::signal(SIGPIPE, oldPipeAction);
    ASSERT_TRUE(child.finished()) << "the split did not stop";
    EXPECT_EQ(child.wait(), 3);
    EXPECT_THAT(child.out(), ::testing::MatchesRegex("Done!!! [0-9]+ files were created\\.\n"));
}

TEST(CtrlC, EndsABatchWaitingForStandardInputWithExitCodeThree) {
    TempFolder scratch;
    const std::string input = scratch.path() + "in";
    ASSERT_EQ(mkfifo(input.c_str(), 0600), 0);
    // Open for both, so that neither this open nor the child's waits for the other end.
    const int feed = open(input.c_str(), O_RDWR);
    ChildProcess child({"factorize"}, scratch.path(), input);
    // Answers that just fill a block of output (64 KiB), so that all show before it waits.
    std::string lines, factors;
    for (int i = 0; i < 3277; ++i) lines += "360\n", factors += "360 = 2^3 * 3^2 * 5\n";
    ASSERT_EQ(write(feed, lines.data(), lines.size()), static_cast<ssize_t>(lines.size()));
    waitForGrowth(scratch.path() + "cli.out", factors.size() - 1);
    for (int tries = 0; tries < 100 && !child.finished(); ++tries) {
        if (tries % 10 == 0) child.stop(ChildProcess::Stop::Interrupt);
        usleep(10000);
    }
    close(feed);
    EXPECT_EQ(child.wait(), 3);
    EXPECT_EQ(child.out(), factors);
}

// Fed through a pipe, the split runs long enough for a progress line; a pipe has no size, so the
// share and the time left stay unknown. Off a terminal nothing is shown (see above).
TEST(SplitProgress, ShowsOnATerminal) {
    TempFolder data, into;
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
    EXPECT_THAT(shown, ::testing::MatchesRegex("\r\x1b\\[K.*  0\\.0%  [12] files?  0:00:0[0-9] "
                                               "elapsed  -:--:-- left.*\r\x1b\\[KDone!!! 2 files "
                                               "were created\\.\r\n"));
}
