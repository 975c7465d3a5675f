// The system's side of the folder lock: an exclusive hold on a folder that the system itself
// drops with the holder's last handle, so a killed holder never leaves a stale lock. POSIX takes
// an flock(2) on the folder; Windows creates a named object after the folder's final path, which
// vanishes with the last handle to it.
#pragma once

#include <string>

namespace tarn::platform {

class FolderHold {
public:
    FolderHold() = default;  // holds nothing
    ~FolderHold() { release(); }
    FolderHold(FolderHold&& other) noexcept;
    FolderHold& operator=(FolderHold&& other) noexcept;
    FolderHold(const FolderHold&) = delete;
    FolderHold& operator=(const FolderHold&) = delete;

    // Takes the hold of `folder` (UTF-8, empty for the current folder) without waiting. Every
    // attempt stands on its own, so a second one fails while the first is held, even within one
    // process. On failure nothing is held and `error` is EWOULDBLOCK when another holder has it.
    static FolderHold take(const std::string& folder, int& error);

    bool held() const;
    void release();

private:
#ifdef _WIN32
    void* handle_ = nullptr;
#else
    int fd_ = -1;
#endif
};

}  // namespace tarn::platform
