// tarn-cli split, run as the real program: what the command line adds to the split, its
// arguments, exit codes and the streams its messages go to.
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdio>
#include <filesystem>
#include <string>

#include "support/temp_folder.hpp"

using tarn::test::readFile;

namespace {

std::string records(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

struct SplitCommand : ::testing::Test {
    tarn::test::TempFolder data, into, scratch;
    std::string out, err;

    // Runs `split --records count` on the data folder's results file into the other folder.
    int split(const std::string& count) {
        const std::string command = std::string(TARN_CLI_PATH) + " --folder " + data.path() +
                                    " split --records " + count + " --into " +
                                    into.path().substr(0, into.path().size() - 1) + " >" +
                                    scratch.path() + "out 2>" + scratch.path() + "err";
        const int status = std::system(command.c_str());
        out = readFile(scratch.path() + "out");
        err = readFile(scratch.path() + "err");
        return WEXITSTATUS(status);
    }
    std::string file(int n) const { return into.path() + "primes" + std::to_string(n) + ".txt"; }
};

}  // namespace

TEST_F(SplitCommand, ExitCodesAndStreams) {
    EXPECT_EQ(split("1000"), 1);
    EXPECT_EQ(err, "The results file " + data.path() + "primes.txt was not found.\n");
    EXPECT_EQ(out, "");

    tarn::test::writeFile(data.path() + "primes.txt", records(2500));
    EXPECT_EQ(split("999.9"), 2);
    EXPECT_EQ(err, "Minimum value is 1000 records.\n");
    EXPECT_EQ(out, "");
    EXPECT_FALSE(std::filesystem::exists(file(1)));

    EXPECT_EQ(split("1000.9"), 0) << err;
    EXPECT_EQ(out, "Done!!! 3 files were created.\n");
    EXPECT_EQ(err, "");
    EXPECT_EQ(readFile(file(1)) + readFile(file(2)) + readFile(file(3)), records(2500));
}

TEST_F(SplitCommand, CtrlCStopsBetweenRecordsWithExitCodeThree) {
    // The results file is a pipe that this test feeds, so the split is surely running, and
    // waiting for more records, when the interrupt comes.
    const std::string results = data.path() + "primes.txt", outPath = scratch.path() + "out";
    ASSERT_EQ(mkfifo(results.c_str(), 0600), 0);
    const pid_t pid = fork();
    ASSERT_GE(pid, 0);
    if (pid == 0) {
        std::freopen(outPath.c_str(), "w", stdout);
        execl(TARN_CLI_PATH, TARN_CLI_PATH, "--folder", data.path().c_str(), "split", "--records",
              "1000", "--into", into.path().c_str(), static_cast<char*>(nullptr));
        _exit(127);
    }
    const auto oldPipeAction = std::signal(SIGPIPE, SIG_IGN);
    std::FILE* feed = std::fopen(results.c_str(), "w");  // waits for the reader
    int status = 0;
    pid_t done = 0;
    // The interrupt may meet the split just before it waits for the pipe again; more records
    // wake it up until it has seen the stop and left.
    for (int more = 0; feed && done == 0 && more <= 1000; ++more) {
        std::fputs(more ? ("2;" + std::to_string(more) + "\r\n").c_str() : records(1500).c_str(),
                   feed);
        std::fflush(feed);
        if (more == 0) kill(pid, SIGINT);
        usleep(5000);
        done = waitpid(pid, &status, WNOHANG);
    }
    if (done == 0) kill(pid, SIGKILL), waitpid(pid, &status, 0);
    if (feed) std::fclose(feed);
    std::signal(SIGPIPE, oldPipeAction);
    ASSERT_NE(done, 0) << "the split did not stop";
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 3);
    const std::string printed = readFile(outPath);
    EXPECT_TRUE(printed.starts_with("Done!!! ") && printed.ends_with(" files were created.\n"))
        << printed;
}
