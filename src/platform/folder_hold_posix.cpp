#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <utility>

#include "platform/folder_hold.hpp"

namespace tarn::platform {

FolderHold::FolderHold(FolderHold&& other) noexcept : fd_(std::exchange(other.fd_, -1)) {}

FolderHold& FolderHold::operator=(FolderHold&& other) noexcept {
    if (this != &other) {
        release();
        fd_ = std::exchange(other.fd_, -1);
    }
    return *this;
}

FolderHold FolderHold::take(const std::string& folder, int& error) {
    // The folder itself is locked, not a lock file: nothing is left behind in the user's folder,
    // and a split can lock a folder it may only read. Close-on-exec: a program the window starts
    // (a text editor) must not keep the lock.
    FolderHold hold;
    const int fd =
        ::open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0) {
        error = errno;
        return hold;
    }
    int result;
    do result = ::flock(fd, LOCK_EX | LOCK_NB);
    while (result != 0 && errno == EINTR);
    if (result != 0) {
        error = errno == EAGAIN ? EWOULDBLOCK : errno;
        ::close(fd);
        return hold;
    }
    error = 0;
    hold.fd_ = fd;
    return hold;
}

bool FolderHold::held() const { return fd_ >= 0; }

void FolderHold::release() {
    // Closing the only descriptor of the open file drops the lock.
    if (fd_ >= 0) ::close(std::exchange(fd_, -1));
}

}  // namespace tarn::platform
