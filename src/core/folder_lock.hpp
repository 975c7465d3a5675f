// The lock that keeps two jobs off one folder's files: a generation job, a resume and a split
// each hold it for their whole length, so that no two of them (in this program, in another
// window or on the command line) write or read primes.txt and primes.ini at once.
#pragma once

#include <string>

namespace tarn {

// An advisory, exclusive flock(2) on the folder, taken without waiting. The kernel drops it with
// the last holder's file, so a crashed holder never leaves a stale lock behind.
class FolderLock {
public:
    FolderLock() = default;  // holds nothing
    ~FolderLock() { release(); }
    FolderLock(FolderLock&& other) noexcept;
    FolderLock& operator=(FolderLock&& other) noexcept;
    FolderLock(const FolderLock&) = delete;
    FolderLock& operator=(const FolderLock&) = delete;

    // Takes the lock of `folder` (with or without a trailing separator). Every attempt stands on
    // its own, so a second one fails while the first is held, even within one process.
    static FolderLock tryTake(const std::string& folder);

    bool held() const { return fd_ >= 0; }
    // Why the attempt failed (errno); 0 when the lock is held.
    int error() const { return error_; }
    // The attempt failed because another holder has the lock; any other failure (a folder that
    // cannot be opened, a file system without locks) says nothing about other jobs.
    bool busy() const;

    void release();

private:
    int fd_ = -1;
    int error_ = 0;
};

// "Another Tarn job is working on the files in <folder>. Wait until it ends, then try again."
std::string folderBusyMessage(const std::string& folder);

}  // namespace tarn
