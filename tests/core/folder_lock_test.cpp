// The lock of a folder's files: one holder at a time, also within one process, and free again
// as soon as its holder releases it (across processes: cli/busy_folder_test.cpp).
#include "core/folder_lock.hpp"

#include <gtest/gtest.h>

#include "support/temp_folder.hpp"

using namespace tarn;

TEST(FolderLock, OneHolderAtATimeAndOnlyAHolderMakesItBusy) {
    test::TempFolder dir;
    FolderLock first = FolderLock::tryTake(dir.path());
    ASSERT_TRUE(first.held()) << first.error();
    // Spelt without the separator it is the same folder.
    const FolderLock second = FolderLock::tryTake(dir.path().substr(0, dir.path().size() - 1));
    EXPECT_TRUE(!second.held() && second.busy());
    // A folder that cannot be locked says nothing about other jobs.
    const FolderLock missing = FolderLock::tryTake(dir.path() + "missing/");
    EXPECT_TRUE(!missing.held() && !missing.busy() && missing.error() != 0);
    first.release();
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).held());
}
