// The lock that keeps two jobs off one folder's files: a generation job, a resume and a split
// each hold it for their whole length, so that no two of them (in this program, in another
// window or on the command line) write or read primes.txt and primes.ini at once.
#pragma once

#include <string>

#include "core/texts.hpp"
#include "platform/folder_hold.hpp"

namespace tarn {

// An exclusive hold on the folder, taken without waiting. The system drops it with the last
// holder's handle, so a crashed holder never leaves a stale lock behind.
class FolderLock {
public:
    // Takes the lock of `folder` (with or without a trailing separator). Every attempt stands on
    // its own, so a second one fails while the first is held, even within one process.
    static FolderLock tryTake(const std::string& folder);

    bool held() const { return hold_.held(); }
    // Why the attempt failed (errno); 0 when the lock is held.
    int error() const { return error_; }
    // The attempt failed because another holder has the lock; any other failure (a folder that
    // cannot be opened, a file system without locks) says nothing about other jobs.
    bool busy() const;

    void release() { hold_.release(); }

private:
    platform::FolderHold hold_;
    int error_ = 0;
};

}  // namespace tarn
