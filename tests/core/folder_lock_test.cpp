// The lock of a folder's files: one holder at a time, inside one process as well as across
// processes, and free again as soon as its holder releases it, dies or is killed.
#include "core/folder_lock.hpp"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>

#include "support/temp_folder.hpp"

using namespace tarn;

namespace {

// A child process that takes the lock of `folder`, tells the parent whether it holds it, then
// either waits to be killed or runs another program (which must not inherit the lock).
enum class ChildEnd { Killed, Execs };

struct Child {
    pid_t pid = -1;
    bool held = false;
};

Child startHolder(const std::string& folder, ChildEnd end) {
    int ready[2];
    if (::pipe2(ready, O_CLOEXEC) != 0) return {};
    const pid_t pid = ::fork();
    if (pid == 0) {
        ::close(ready[0]);
        FolderLock lock = FolderLock::tryTake(folder);
        const char held = lock.held() ? 'y' : 'n';
        (void)!::write(ready[1], &held, 1);
        if (end == ChildEnd::Execs) {
            // The shell speaks once the exec is over and its closing of files is done.
            ::dup2(ready[1], 1);
            ::execl("/bin/sh", "sh", "-c", "echo started; exec sleep 60", nullptr);
        }
        ::pause();
        ::_exit(0);
    }
    ::close(ready[1]);
    char held = 'n';
    const bool told = ::read(ready[0], &held, 1) == 1;
    char started = 0;
    if (end == ChildEnd::Execs)
        while (::read(ready[0], &started, 1) == 1 && started != '\n') continue;
    ::close(ready[0]);
    return {pid, told && held == 'y'};
}

}  // namespace

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

TEST(FolderLock, AHolderThatIsKilledLeavesNoStaleLock) {
    test::TempFolder dir;
    const Child child = startHolder(dir.path(), ChildEnd::Killed);
    ASSERT_GT(child.pid, 0);
    EXPECT_TRUE(child.held);
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).busy()) << "the child holds it";
    ::kill(child.pid, SIGKILL);
    ASSERT_EQ(::waitpid(child.pid, nullptr, 0), child.pid);
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).held());
}

TEST(FolderLock, AProgramStartedByTheHolderDoesNotKeepIt) {
    test::TempFolder dir;
    // The child takes the lock, then runs a shell in its place: the lock goes with the exec.
    const Child child = startHolder(dir.path(), ChildEnd::Execs);
    ASSERT_GT(child.pid, 0);
    EXPECT_TRUE(child.held);
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).held());
    EXPECT_EQ(::waitpid(child.pid, nullptr, WNOHANG), 0) << "the program still runs";
    ::kill(child.pid, SIGKILL);
    ::waitpid(child.pid, nullptr, 0);
}

TEST(FolderLock, BusyMessageNamesTheFolder) {
    EXPECT_EQ(folderBusyMessage("/home/ann/tarn/"),
              "Another Tarn job is working on the files in /home/ann/tarn. Wait until it ends, "
              "then try again.");
    EXPECT_EQ(folderBusyMessage("/"),
              "Another Tarn job is working on the files in /. Wait until it ends, then try again.");
}
