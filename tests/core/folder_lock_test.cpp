// The lock of a folder's files: one holder at a time inside one process, and free again as soon
// as its holder releases it (across processes: cli/busy_folder_test.cpp).
#include "core/folder_lock.hpp"

#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>

#include "support/temp_folder.hpp"

using namespace tarn;

TEST(FolderLock, OneHolderAtATimeWithinAProcess) {
    test::TempFolder dir;
    FolderLock first = FolderLock::tryTake(dir.path());
    ASSERT_TRUE(first.held()) << first.error();
    EXPECT_EQ(first.error(), 0);

    // Another attempt on the same folder, spelt with or without the separator, is refused.
    for (const std::string& folder : {dir.path(), dir.path().substr(0, dir.path().size() - 1)}) {
        const FolderLock second = FolderLock::tryTake(folder);
        EXPECT_FALSE(second.held()) << folder;
        EXPECT_TRUE(second.busy()) << folder;
        EXPECT_EQ(second.error(), EWOULDBLOCK) << folder;
    }
    first.release();
    EXPECT_FALSE(first.held());
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).held());
}

TEST(FolderLock, OtherFailuresAreNotABusyFolder) {
    test::TempFolder dir;
    test::writeFile(dir.path() + "primes.txt", "2\r\n");
    const struct {
        std::string folder;
        int error;
    } cases[] = {{dir.path() + "missing/", ENOENT}, {dir.path() + "primes.txt", ENOTDIR}};
    for (const auto& c : cases) {
        const FolderLock lock = FolderLock::tryTake(c.folder);
        EXPECT_FALSE(lock.held()) << c.folder;
        EXPECT_FALSE(lock.busy()) << c.folder;
        EXPECT_EQ(lock.error(), c.error) << c.folder;
    }
}

TEST(FolderLock, BusyMessageNamesTheFolder) {
    EXPECT_EQ(folderBusyMessage("/home/ann/tarn/"),
              "Another Tarn job is working on the files in /home/ann/tarn. Wait until it ends, "
              "then try again.");
    EXPECT_EQ(folderBusyMessage("/"),
              "Another Tarn job is working on the files in /. Wait until it ends, then try again.");
}
