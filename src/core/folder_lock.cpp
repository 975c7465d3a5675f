#include "core/folder_lock.hpp"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

namespace tarn {

FolderLock::FolderLock(FolderLock&& other) noexcept
    : fd_(std::exchange(other.fd_, -1)), error_(std::exchange(other.error_, 0)) {}

FolderLock& FolderLock::operator=(FolderLock&& other) noexcept {
    if (this != &other) {
        release();
        fd_ = std::exchange(other.fd_, -1);
        error_ = std::exchange(other.error_, 0);
    }
    return *this;
}

FolderLock FolderLock::tryTake(const std::string& folder) {
    // The folder itself is locked, not a lock file: nothing is left behind in the user's folder,
    // and a split can lock a folder it may only read.
    FolderLock lock;
    // Close-on-exec: a program the window starts (a text editor) must not keep the lock.
    const int fd =
        ::open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0) {
        lock.error_ = errno;
        return lock;
    }
    int result;
    do result = ::flock(fd, LOCK_EX | LOCK_NB);
    while (result != 0 && errno == EINTR);
    if (result != 0) {
        lock.error_ = errno;
        ::close(fd);
        return lock;
    }
    lock.fd_ = fd;
    return lock;
}

bool FolderLock::busy() const { return error_ == EWOULDBLOCK || error_ == EAGAIN; }

void FolderLock::release() {
    // Closing the only descriptor of the open file drops the lock.
    if (fd_ >= 0) ::close(std::exchange(fd_, -1));
}

std::string folderBusyMessage(const std::string& folder) {
    std::string shown = folder;
    while (shown.size() > 1 && shown.back() == '/') shown.pop_back();
    return "Another Tarn job is working on the files in " + shown +
           ". Wait until it ends, then try again.";
}

}  // namespace tarn
