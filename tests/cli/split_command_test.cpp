// tarn-cli split, run as the real program: what the command line adds to the split, its
// arguments, exit codes and the streams its messages go to.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>

#include "cli_child.hpp"

using namespace tarn::test;

namespace {

struct SplitCommand : ::testing::Test {
    TempFolder data, into, scratch;

    // Runs `split --records count` on the data folder's results file into the other folder.
    CliRun split(const std::string& count) {
        return runCli({"--folder", data.path(), "split", "--records", count, "--into",
                       into.path().substr(0, into.path().size() - 1)},
                      scratch.path());
    }
    std::string file(int n) const { return into.path() + "primes" + std::to_string(n) + ".txt"; }
};

}  // namespace

TEST_F(SplitCommand, ExitCodesAndStreams) {
    const std::string missing = "The results file " + data.path() + "primes.txt was not found.\n";
    EXPECT_EQ(split("1000"), (CliRun{1, "", missing}));
    writeFile(data.path() + "primes.txt", enumeratedRecords(2500));
    EXPECT_EQ(split("999.9"), (CliRun{2, "", "Minimum value is 1000 records.\n"}));
    EXPECT_FALSE(std::filesystem::exists(file(1)));
    EXPECT_EQ(split("1000.9"), (CliRun{0, "Done!!! 3 files were created.\n", ""}));
    EXPECT_EQ(readFile(file(1)) + readFile(file(2)) + readFile(file(3)), enumeratedRecords(2500));
    writeFile(data.path() + "primes.txt",
              enumeratedRecords(2500) + "2501;25");  // a record cut short
    EXPECT_EQ(split("1000"), (CliRun{0, "Done!!! 3 files were created.\n",
                                     "The last 7 bytes of " + data.path() +
                                         "primes.txt were left out: they end without CR LF, so "
                                         "they are part of a record cut short.\n"}));
    EXPECT_EQ(readFile(file(1)) + readFile(file(2)) + readFile(file(3)), enumeratedRecords(2500));
}
