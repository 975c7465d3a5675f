// tarn-cli while another job holds the folder's files: generate, resume and split are refused
// with exit code 2 and leave every file as it was; once the lock is free they run, also after its
// holder was killed.
#include <gtest/gtest.h>

#include <filesystem>
#include <iterator>

#include "cli/cli_child.hpp"
#include "core/folder_lock.hpp"
#include "generation/results_oracle.hpp"

namespace tarn {
namespace {

using namespace test;

TEST(BusyFolder, JobResumeAndSplitAreRefusedWhileAnotherHolderHasTheLock) {
    const std::string records = oracleResults(97, true), checkpoint = oracleCheckpoint(97, 1000, 1);
    for (const std::string command : {"generate", "resume", "split"}) {
        TempFolder folder, into, output;
        const std::string results = folder.path() + "primes.txt";
        const std::string ini = folder.path() + "primes.ini";
        writeFile(results, records);
        writeFile(ini, checkpoint);
        std::vector<std::string> args{"--folder", folder.path(), command};
        if (command == "generate") args.push_back("1000");
        if (command == "split")
            args.insert(args.end(), {"--records", "1000", "--into", into.path()});

        FolderLock held = FolderLock::tryTake(folder.path());
        ASSERT_TRUE(held.held()) << held.error();
        const std::string name = folder.path().substr(0, folder.path().size() - 1);
        EXPECT_EQ(runCli(args, output.path()),
                  (CliRun{2, "",
                          "Another Tarn job is working on the files in " + name +
                              ". Wait until it ends, then try again.\n"}))
            << command;
        EXPECT_EQ(readFile(results), records) << command;
        EXPECT_EQ(readFile(ini), checkpoint) << command;
        EXPECT_TRUE(std::filesystem::is_empty(into.path())) << command;
        EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path()), {}), 2)
            << "nothing but the two files";

        held.release();
        EXPECT_EQ(runCli(args, output.path()).code, 0) << command;
    }
}

TEST(BusyFolder, AKilledHolderLeavesNoStaleLock) {
    TempFolder folder, output;
    CliChild job({"--folder", folder.path(), "generate", "900000000000"}, output.path());
    waitForGrowth(folder.path() + "primes.txt", 0);
    EXPECT_TRUE(FolderLock::tryTake(folder.path()).busy()) << "the job holds it";
    job.kill();
    EXPECT_EQ(job.wait(), kKilledExitCode);
    EXPECT_TRUE(FolderLock::tryTake(folder.path()).held());
}

}  // namespace
}  // namespace tarn
