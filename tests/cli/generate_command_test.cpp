// tarn-cli generate: the real program's output, refusals, exit codes and its stop by SIGTERM.
#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <thread>

#include "generation/checkpoint_file.hpp"
#include "support/temp_folder.hpp"

using tarn::test::readFile;
using tarn::test::TempFolder;

namespace {

struct Outcome {
    int code = -1;
    std::string out;
    std::string err;
};

Outcome runCli(const TempFolder& folder, const std::string& args) {
    const std::string out = folder.path() + "out.log";
    const std::string err = folder.path() + "err.log";
    const std::string command = std::string(TARN_CLI_PATH) + " --folder " + folder.path() + " " +
                                args + " >" + out + " 2>" + err;
    const int status = std::system(command.c_str());
    Outcome o{WIFEXITED(status) ? WEXITSTATUS(status) : -1, readFile(out), readFile(err)};
    std::filesystem::remove(out);
    std::filesystem::remove(err);
    return o;
}

}  // namespace

TEST(GenerateCommand, CompletesAndPrintsTheReport) {
    TempFolder folder;
    const Outcome o = runCli(folder, "generate 100.9 --enumerate");
    EXPECT_EQ(o.code, 0);
    EXPECT_EQ(o.out, "Done!!! The results were saved in the file " + folder.path() +
                         "primes.txt. 25 primes found up to number 100... Save the file to other "
                         "location.\n");
    EXPECT_EQ(readFile(folder.path() + "primes.ini"), " 101  100  0 \r\n");
    const std::string results = readFile(folder.path() + "primes.txt");
    EXPECT_EQ(results.substr(results.size() - 7), "25;97\r\n");
}

TEST(GenerateCommand, RefusesBadEntriesWithoutTouchingFiles) {
    TempFolder folder;
    for (const auto& [arg, message] :
         {std::pair{"99.9", "Minimum value is 100\n"}, std::pair{"abc", "Invalid entry.\n"},
          std::pair{"1.5",
                    "Value out of range. Value must be between 2 and 922 337 203 685 "
                    "277.\n"}}) {
        const Outcome o = runCli(folder, std::string("generate ") + arg);
        EXPECT_EQ(o.code, 2) << arg;
        EXPECT_EQ(o.err, message);
        EXPECT_EQ(o.out, "");
    }
    EXPECT_FALSE(std::filesystem::exists(folder.path() + "primes.txt"));
}

TEST(GenerateCommand, WriteFailureExitsWithOne) {
    if (!std::filesystem::exists("/dev/full")) GTEST_SKIP();
    TempFolder folder;
    std::filesystem::create_symlink("/dev/full", folder.path() + "primes.txt");
    const Outcome o = runCli(folder, "generate 1000");
    EXPECT_EQ(o.code, 1);
    EXPECT_EQ(o.err.rfind("The file " + folder.path() + "primes.txt could not be written: ", 0), 0u)
        << o.err;
}

TEST(GenerateCommand, TerminationStopsAtAWholeTurn) {
    TempFolder folder;
    const std::string err = folder.path() + "err.log";
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        std::freopen("/dev/null", "w", stdout);
        std::freopen(err.c_str(), "w", stderr);
        const std::string dir = folder.path();
        execl(TARN_CLI_PATH, TARN_CLI_PATH, "--folder", dir.c_str(), "generate", "100000000000",
              static_cast<char*>(nullptr));
        _exit(127);
    }
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    kill(child, SIGTERM);
    int status = 0;
    waitpid(child, &status, 0);
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 3);
    EXPECT_EQ(readFile(err), "All calculations were stopped!\n");
    const auto checkpoint = tarn::readCheckpoint(folder.path() + "primes.ini");
    ASSERT_TRUE(checkpoint.has_value());
    EXPECT_EQ(checkpoint->interrupted, 1);
    EXPECT_EQ(checkpoint->candidate % 30, 7);
    EXPECT_EQ(checkpoint->limit, 100000000000);
    const std::string results = readFile(folder.path() + "primes.txt");
    const std::string tail = results.substr(results.rfind('\n', results.size() - 3) + 1);
    // The last record is the largest prime up to the checkpoint's candidate.
    const long long last = std::stoll(tail);
    EXPECT_LE(last, checkpoint->candidate);
    for (long long n = last + 1; n <= checkpoint->candidate; ++n) {
        bool prime = n > 1;
        for (long long d = 2; prime && d * d <= n; ++d) prime = n % d != 0;
        EXPECT_FALSE(prime) << n << " is missing";
    }
}
