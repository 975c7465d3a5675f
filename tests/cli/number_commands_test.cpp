// tarn-cli test and factorize, run as a program: numbers as arguments and on standard input,
// refused entries, exit codes.
#include <gtest/gtest.h>

#include <chrono>
#include <string>
#include <thread>

#include "cli_child.hpp"

using namespace tarn::test;

namespace {

CliRun run(const std::vector<std::string>& args, const std::string& input = "") {
    TempFolder scratch;
    return runCli(args, scratch.path(), input);
}

const std::string kRange = "Value out of range. Value must be between 2 and 922 337 203 685 277.\n";

}  // namespace

TEST(CliNumbers, ArgumentsGiveOneLineEachAndRefusalsGoToStandardError) {
    const CliRun test = run({"test", "2", "2.7", "9", "1", "abc", "922337203685123"});
    EXPECT_EQ(test.code, 2);
    EXPECT_EQ(test.out,
              "Number 2 is prime.\nNumber 2 is prime.\nNumber 9 is not prime.\n"
              "Number 922337203685123 is prime.\n");
    EXPECT_EQ(test.err, kRange + "Invalid entry.\n");
    const CliRun factorize = run({"factorize", "360", "2.9", "421053653"});
    EXPECT_EQ(factorize.code, 0);
    EXPECT_EQ(factorize.out, "360 = 2^3 * 3^2 * 5\n2 = 2\n421053653 = 20149 * 20897\n");
    EXPECT_EQ(factorize.err, "");
}

TEST(CliNumbers, StandardInputWhenNoNumbersAreGiven) {
    std::string input;
    for (int i = 2; i < 3000; ++i) input += std::to_string(i) + "\n";
    const CliRun all = run({"factorize"}, input);
    EXPECT_EQ(all.code, 0);
    EXPECT_EQ(all.out.substr(0, 36), "2 = 2\n3 = 3\n4 = 2^2\n5 = 5\n6 = 2 * 3\n");
    EXPECT_NE(all.out.find("\n2048 = 2^11\n2049 = 3 * 683\n"), std::string::npos);
    // Windows line ends, blank lines, a refused line and a last line without its newline.
    const CliRun mixed = run({"test"}, "127\r\n\nx\n9\n0\n922337203685277");
    EXPECT_EQ(mixed.code, 2);
    EXPECT_EQ(mixed.out,
              "Number 127 is prime.\nNumber 9 is not prime.\nNumber 922337203685277 is not "
              "prime.\n");
    EXPECT_EQ(mixed.err, "Invalid entry.\n" + kRange);
}

TEST(CliNumbers, InterruptEndsTheBatchWithExitCodeThree) {
    // Far more hard numbers than a fifth of a second can factorize; SIGINT comes after that.
    TempFolder folder;
    std::string input;
    for (int i = 0; i < 400000; ++i) input += "922335988900189\n";
    writeFile(folder.path() + "in.txt", input);
    CliChild child({"factorize"}, folder.path(), folder.path() + "in.txt");
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    child.signal(SIGINT);
    EXPECT_EQ(child.wait(), 3);
    // Whatever was done is there, in whole lines.
    const std::string out = child.out();
    EXPECT_LT(out.size(), input.size() * 2);
    if (!out.empty()) {
        EXPECT_EQ(out.back(), '\n');
        EXPECT_EQ(out.substr(0, out.find('\n')), "922335988900189 = 30369979 * 30369991");
    }
}
