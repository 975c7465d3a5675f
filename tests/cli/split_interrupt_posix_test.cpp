// tarn-cli split stopped by Ctrl-C while it waits for a pipe in the results file's place
// (POSIX: named pipes and signals).
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>

#include "cli_child.hpp"

using namespace tarn::test;

namespace {

std::string records(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

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
        std::fputs(more ? ("2;" + std::to_string(more) + "\r\n").c_str() : records(1500).c_str(),
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
