// tarn-cli while another job holds the folder's files: generate, resume and split are refused
// with exit code 2 and leave every file as it was; once the lock is free they run. (A killed
// holder leaves no stale lock: the kill-and-resume test resumes after kills.)
#include <gtest/gtest.h>

#include <filesystem>
#include <iterator>

#include "core/folder_lock.hpp"
#include "generation/results_oracle.hpp"
#include "support/child_process.hpp"

namespace tarn {
namespace {

using namespace test;

TEST(BusyFolder, JobResumeAndSplitAreRefusedWhileAnotherHolderHasTheLock) {
    const std::string records = oracleResults(97, true), checkpoint = oracleCheckpoint(97, 1000, 1);
    for (const std::string command : {"generate", "resume", "split"}) {
        TempFolder folder, into, output;
        writeFile(folder.path() + "primes.txt", records);
        writeFile(folder.path() + "primes.ini", checkpoint);
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
        EXPECT_EQ(readFile(folder.path() + "primes.txt") + readFile(folder.path() + "primes.ini"),
                  records + checkpoint)
            << command;
        EXPECT_TRUE(std::filesystem::is_empty(into.path())) << command;
        EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path()), {}), 2);

        held.release();
        EXPECT_EQ(runCli(args, output.path()).code, 0) << command;
    }
}

}  // namespace
}  // namespace tarn
