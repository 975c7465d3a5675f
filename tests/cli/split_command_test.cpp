// tarn-cli split, run as the real program: messages, streams and exit codes.
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <string>

#include "support/temp_folder.hpp"

using tarn::test::readFile;
using tarn::test::TempFolder;
using tarn::test::writeFile;

namespace {

struct CliRun {
    int exitCode;
    std::string out, err;
};

CliRun runCli(const std::string& arguments, const TempFolder& scratch) {
    const std::string outPath = scratch.path() + "stdout.txt";
    const std::string errPath = scratch.path() + "stderr.txt";
    const std::string command =
        std::string(TARN_CLI_PATH) + " " + arguments + " >" + outPath + " 2>" + errPath;
    const int status = std::system(command.c_str());
    return {WEXITSTATUS(status), readFile(outPath), readFile(errPath)};
}

std::string records(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

struct SplitCommand : ::testing::Test {
    TempFolder data, into, scratch;
    std::string split(const std::string& count) {
        return "--folder " + data.path() + " split --records " + count + " --into " +
               into.path().substr(0, into.path().size() - 1);
    }
};

}  // namespace

TEST_F(SplitCommand, SplitsAndPrintsTheFinalMessage) {
    writeFile(data.path() + "primes.txt", records(2500));
    const CliRun r = runCli(split("1000.9"), scratch);
    EXPECT_EQ(r.exitCode, 0) << r.err;
    EXPECT_EQ(r.out, "Done!!! 3 files were created.\n");
    EXPECT_EQ(r.err, "");
    EXPECT_EQ(readFile(into.path() + "primes1.txt") + readFile(into.path() + "primes2.txt") +
                  readFile(into.path() + "primes3.txt"),
              records(2500));
}

TEST_F(SplitCommand, RefusesCountsWithTheWindowsMessages) {
    writeFile(data.path() + "primes.txt", records(10));
    for (const auto& [count, message] : std::array<std::pair<const char*, const char*>, 3>{{
             {"999.9", "Minimum value is 1000 records.\n"},
             {"abc", "Invalid entry.\n"},
             {"1e300", "Value out of range. Value must be between 1000 and 922 337 203 685 477.\n"},
         }}) {
        const CliRun r = runCli(split(count), scratch);
        EXPECT_EQ(r.exitCode, 2) << count;
        EXPECT_EQ(r.err, message);
        EXPECT_EQ(r.out, "");
    }
    EXPECT_FALSE(std::filesystem::exists(into.path() + "primes1.txt"));
}

TEST_F(SplitCommand, ReportsFileFailuresWithExitCodeOne) {
    const CliRun missing = runCli(split("1000"), scratch);
    EXPECT_EQ(missing.exitCode, 1);
    EXPECT_EQ(missing.err, "The results file " + data.path() + "primes.txt was not found.\n");

    writeFile(data.path() + "primes.txt", records(10));
    const CliRun unwritable = runCli(
        "--folder " + data.path() + " split --records 1000 --into " + data.path() + "primes.txt",
        scratch);
    EXPECT_EQ(unwritable.exitCode, 1);
    EXPECT_NE(unwritable.err.find("primes.txt/primes1.txt"), std::string::npos) << unwritable.err;
}

TEST_F(SplitCommand, CtrlCStopsBetweenRecordsWithExitCodeThree) {
    // The results file is a pipe that this test feeds, so the split is surely running, and
    // waiting for more records, when the interrupt comes.
    const std::string results = data.path() + "primes.txt";
    ASSERT_EQ(mkfifo(results.c_str(), 0600), 0);
    const std::string outPath = scratch.path() + "stdout.txt";
    const pid_t pid = fork();
    ASSERT_GE(pid, 0);
    if (pid == 0) {
        std::freopen(outPath.c_str(), "w", stdout);
        const std::string intoFolder = into.path();
        execl(TARN_CLI_PATH, TARN_CLI_PATH, "--folder", data.path().c_str(), "split", "--records",
              "1000", "--into", intoFolder.c_str(), static_cast<char*>(nullptr));
        _exit(127);
    }
    std::string sent = records(1500);
    {
        std::FILE* feed = std::fopen(results.c_str(), "w");  // waits for the reader
        ASSERT_NE(feed, nullptr);
        std::fwrite(sent.data(), 1, sent.size(), feed);
        std::fflush(feed);
        kill(pid, SIGINT);
        // The interrupt may meet the split just before it waits for the pipe again; more
        // records wake it up until it has seen the stop and left.
        const auto oldPipeAction = std::signal(SIGPIPE, SIG_IGN);
        int status = 0;
        pid_t done = 0;
        for (int more = 1; done == 0 && more <= 1000; ++more) {
            done = waitpid(pid, &status, WNOHANG);
            if (done != 0) break;
            const std::string batch = "2;" + std::to_string(more) + "\r\n";
            if (std::fwrite(batch.data(), 1, batch.size(), feed) == batch.size() &&
                std::fflush(feed) == 0)
                sent += batch;
            usleep(5000);
        }
        if (done == 0) {
            kill(pid, SIGKILL);
            waitpid(pid, &status, 0);
        }
        std::fclose(feed);
        std::signal(SIGPIPE, oldPipeAction);
        ASSERT_NE(done, 0) << "the split did not stop";
        ASSERT_TRUE(WIFEXITED(status));
        EXPECT_EQ(WEXITSTATUS(status), 3);
    }
    const std::string out = readFile(outPath);
    EXPECT_TRUE(out.starts_with("Done!!! ") && out.ends_with(" files were created.\n")) << out;
    std::string copied;
    for (int n = 1; std::filesystem::exists(into.path() + "primes" + std::to_string(n) + ".txt");
         ++n)
        copied += readFile(into.path() + "primes" + std::to_string(n) + ".txt");
    // Whatever moment the interrupt met, only whole records went out.
    EXPECT_TRUE(sent.starts_with(copied));
    EXPECT_TRUE(copied.empty() || copied.ends_with("\r\n"));
}
