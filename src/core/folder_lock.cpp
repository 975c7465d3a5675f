#include "core/folder_lock.hpp"

#include <cerrno>

namespace tarn {

FolderLock FolderLock::tryTake(const std::string& folder) {
    FolderLock lock;
    lock.hold_ = platform::FolderHold::take(folder, lock.error_);
    return lock;
}

bool FolderLock::busy() const { return error_ == EWOULDBLOCK; }

}  // namespace tarn
