#include "core/folder_lock.hpp"

#include <cerrno>

#include "platform/path_separator.hpp"

namespace tarn {

FolderLock FolderLock::tryTake(const std::string& folder) {
    FolderLock lock;
    lock.hold_ = platform::FolderHold::take(folder, lock.error_);
    return lock;
}

bool FolderLock::busy() const { return error_ == EWOULDBLOCK; }

std::string folderBusyMessage(const std::string& folder) {
    std::string shown = folder;
    while (shown.size() > 1 && (shown.back() == '/' || shown.back() == platform::kPathSeparator))
        shown.pop_back();
    return "Another Tarn job is working on the files in " + shown +
           ". Wait until it ends, then try again.";
}

}  // namespace tarn
