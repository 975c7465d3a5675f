// A program started by the holder of a folder's lock does not keep it (POSIX: the lock's
// descriptor is closed on exec), so an editor opened on the results leaves the folder free.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include "core/folder_lock.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;

TEST(FolderLock, AProgramStartedByTheHolderDoesNotKeepIt) {
    test::TempFolder dir;
    int ready[2];
    ASSERT_EQ(::pipe2(ready, O_CLOEXEC), 0);
    const pid_t pid = ::fork();
    if (pid == 0) {
        // The child takes the lock, then runs a shell in its place, which speaks once the exec
        // and its closing of files are over.
        FolderLock lock = FolderLock::tryTake(dir.path());
        ::dup2(ready[1], 1);
        if (lock.held()) ::execl("/bin/sh", "sh", "-c", "echo started; exec sleep 60", nullptr);
        ::_exit(127);
    }
    ::close(ready[1]);
    char told = 0;
    ASSERT_EQ(::read(ready[0], &told, 1), 1) << "the child did not get the lock";
    ::close(ready[0]);
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).held());
    EXPECT_EQ(::waitpid(pid, nullptr, WNOHANG), 0) << "the program still runs";
    ::kill(pid, SIGKILL);
    ::waitpid(pid, nullptr, 0);
}
