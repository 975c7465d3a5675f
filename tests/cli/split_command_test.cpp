// tarn-cli split, run as the real program: what the command line adds to the split, its
// arguments, exit codes and the streams its messages go to.
#include <gtest/gtest.h>

#include "support/child_process.hpp"

using namespace tarn::test;

TEST(SplitCommand, ExitCodesAndStreams) {
    TempFolder data, into, scratch;
    const auto split = [&](const std::string& count) {
        return runCli({"--folder", data.path(), "split", "--records", count, "--into",
                       into.path().substr(0, into.path().size() - 1)},
                      scratch.path());
    };
    const std::string results = data.path() + "primes.txt";
    EXPECT_EQ(split("1000"), (CliRun{1, "", "The results file " + results + " was not found.\n"}));
    writeFile(results, enumeratedRecords(2500) + "2501;25");  // a record cut short
    EXPECT_EQ(split("999.9"), (CliRun{2, "", "Minimum value is 1000 records.\n"}));
    EXPECT_EQ(split("1000.9"), (CliRun{0, "Done!!! 3 files were created.\n",
                                       "The last 7 bytes of " + results +
                                           " were left out: they end without CR LF, so they are "
                                           "part of a record cut short.\n"}));
    std::string joined;
    for (const char* n : {"1", "2", "3"}) joined += readFile(into.path() + "primes" + n + ".txt");
    EXPECT_EQ(joined, enumeratedRecords(2500));
}
