// tarn-cli test and factorize, run as a program: numbers as arguments and on standard input,
// refused entries, exit codes.
#include <gtest/gtest.h>
#include <sys/wait.h>

#include <cstdlib>
#include <string>

#include "support/temp_folder.hpp"

using namespace tarn::test;

namespace {

struct CliRun {
    int exitCode;
    std::string out;
    std::string err;
};

// Runs tarn-cli with `arguments` (shell words) and `input` on standard input.
CliRun runCli(const std::string& arguments, const std::string& input = "") {
    TempFolder folder;
    const std::string in = folder.path() + "in.txt";
    const std::string out = folder.path() + "out.txt";
    const std::string err = folder.path() + "err.txt";
    writeFile(in, input);
    const std::string command = std::string("'") + TARN_CLI_PATH + "' " + arguments + " < '" + in +
                                "' > '" + out + "' 2> '" + err + "'";
    const int status = std::system(command.c_str());
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, readFile(out), readFile(err)};
}

const std::string kRange = "Value out of range. Value must be between 2 and 922 337 203 685 277.\n";

}  // namespace

TEST(CliNumbers, ArgumentsGiveOneLineEachAndRefusalsGoToStandardError) {
    const CliRun test = runCli("test 2 2.7 9 1 abc 922337203685123");
    EXPECT_EQ(test.exitCode, 2);
    EXPECT_EQ(test.out,
              "Number 2 is prime.\nNumber 2 is prime.\nNumber 9 is not prime.\n"
              "Number 922337203685123 is prime.\n");
    EXPECT_EQ(test.err, kRange + "Invalid entry.\n");
    const CliRun factorize = runCli("factorize 360 2.9 421053653");
    EXPECT_EQ(factorize.exitCode, 0);
    EXPECT_EQ(factorize.out, "360 = 2^3 * 3^2 * 5\n2 = 2\n421053653 = 20149 * 20897\n");
    EXPECT_EQ(factorize.err, "");
}

TEST(CliNumbers, StandardInputWhenNoNumbersAreGiven) {
    std::string input;
    for (int i = 2; i < 3000; ++i) input += std::to_string(i) + "\n";
    const CliRun all = runCli("factorize", input);
    EXPECT_EQ(all.exitCode, 0);
    EXPECT_EQ(all.out.substr(0, 36), "2 = 2\n3 = 3\n4 = 2^2\n5 = 5\n6 = 2 * 3\n");
    EXPECT_NE(all.out.find("\n2048 = 2^11\n2049 = 3 * 683\n"), std::string::npos);
    // Windows line ends, blank lines, a refused line and a last line without its newline.
    const CliRun mixed = runCli("test", "127\r\n\nx\n9\n0\n922337203685277");
    EXPECT_EQ(mixed.exitCode, 2);
    EXPECT_EQ(mixed.out,
              "Number 127 is prime.\nNumber 9 is not prime.\nNumber 922337203685277 is not "
              "prime.\n");
    EXPECT_EQ(mixed.err, "Invalid entry.\n" + kRange);
}

TEST(CliFactorize, InterruptEndsTheBatchWithExitCodeThree) {
    // Far more hard numbers than a fifth of a second can factorize; SIGINT comes after that.
    TempFolder folder;
    std::string input;
    for (int i = 0; i < 400000; ++i) input += "922335988900189\n";
    writeFile(folder.path() + "in.txt", input);
    const std::string command = std::string("timeout --preserve-status -s INT 0.2 '") +
                                TARN_CLI_PATH + "' factorize < '" + folder.path() + "in.txt' > '" +
                                folder.path() + "out.txt'";
    const int status = std::system(command.c_str());
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 3);
    // Whatever was done is there, in whole lines.
    const std::string out = readFile(folder.path() + "out.txt");
    EXPECT_LT(out.size(), input.size() * 2);
    if (!out.empty()) {
        EXPECT_EQ(out.back(), '\n');
        EXPECT_EQ(out.substr(0, out.find('\n')), "922335988900189 = 30369979 * 30369991");
    }
}
