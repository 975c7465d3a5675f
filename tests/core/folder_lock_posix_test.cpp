// A program started by the holder of a folder's lock does not keep it (POSIX: the lock's
// descriptor is closed on exec).
#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include "core/folder_lock.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;

namespace {

// A child process that takes the lock of `folder`, tells the parent whether it holds it, then
// runs another program (which must not inherit the lock).
struct Child {
    pid_t pid = -1;
    bool held = false;
};

Child startHolder(const std::string& folder) {
    int ready[2];
    if (::pipe2(ready, O_CLOEXEC) != 0) return {};
    const pid_t pid = ::fork();
    if (pid == 0) {
        ::close(ready[0]);
        FolderLock lock = FolderLock::tryTake(folder);
        const char held = lock.held() ? 'y' : 'n';
        (void)!::write(ready[1], &held, 1);
        // The shell speaks once the exec is over and its closing of files is done.
        ::dup2(ready[1], 1);
        ::execl("/bin/sh", "sh", "-c", "echo started; exec sleep 60", nullptr);
        ::_exit(127);
    }
    ::close(ready[1]);
    char held = 'n';
    const bool told = ::read(ready[0], &held, 1) == 1;
    char started = 0;
    while (::read(ready[0], &started, 1) == 1 && started != '\n') continue;
    ::close(ready[0]);
    return {pid, told && held == 'y'};
}

}  // namespace

TEST(FolderLock, AProgramStartedByTheHolderDoesNotKeepIt) {
    test::TempFolder dir;
    // The child takes the lock, then runs a shell in its place: the lock goes with the exec.
    const Child child = startHolder(dir.path());
    ASSERT_GT(child.pid, 0);
    EXPECT_TRUE(child.held);
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).held());
    EXPECT_EQ(::waitpid(child.pid, nullptr, WNOHANG), 0) << "the program still runs";
    ::kill(child.pid, SIGKILL);
    ::waitpid(child.pid, nullptr, 0);
}
