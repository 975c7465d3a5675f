// Windows cannot lock a folder like flock(2) does, and a lock file would be left behind by a
// killed holder. A named kernel object after the folder's final path (the same for every way of
// spelling the folder) exists exactly while a holder has a handle to it, and the system closes
// the handles of a killed process.
#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

#include <cerrno>
#include <cstdint>
#include <utility>

#include "platform/folder_hold.hpp"
#include "platform/windows_text.hpp"

namespace tarn::platform {
namespace {

// The folder's final path, upper-cased, as the file system compares names; empty on failure
// with the errno number in `error`.
std::wstring finalPath(const std::string& folder, int& error) {
    const std::wstring wide = widen(folder.empty() ? "." : folder);
    // Backup semantics open a folder; no access right is needed to ask for its name.
    const HANDLE h =
        CreateFileW(wide.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                    nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (h == INVALID_HANDLE_VALUE) {
        error = lastErrno();
        return {};
    }
    BY_HANDLE_FILE_INFORMATION info{};
    if (!GetFileInformationByHandle(h, &info) ||
        !(info.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY)) {
        error = ENOTDIR;
        CloseHandle(h);
        return {};
    }
    std::wstring path(MAX_PATH, L'\0');
    DWORD length = GetFinalPathNameByHandleW(h, path.data(), static_cast<DWORD>(path.size()), 0);
    if (length >= path.size()) {
        path.resize(length + 1);
        length = GetFinalPathNameByHandleW(h, path.data(), static_cast<DWORD>(path.size()), 0);
    }
    error = length == 0 ? lastErrno() : 0;
    CloseHandle(h);
    path.resize(length < path.size() ? length : 0);
    if (!path.empty()) CharUpperBuffW(path.data(), static_cast<DWORD>(path.size()));
    return path;
}

// Object names cannot hold backslashes and are limited in length: a 64-bit FNV-1a hash of the
// path names the object.
std::wstring objectName(const std::wstring& path) {
    std::uint64_t hash = 14695981039346656037ull;
    for (const wchar_t c : path) {
        hash ^= static_cast<std::uint16_t>(c);
        hash *= 1099511628211ull;
    }
    std::wstring name = L"Local\\Tarn.FolderLock.";
    for (int shift = 60; shift >= 0; shift -= 4) name += L"0123456789abcdef"[(hash >> shift) & 15];
    return name;
}

}  // namespace

FolderHold::FolderHold(FolderHold&& other) noexcept
    : handle_(std::exchange(other.handle_, nullptr)) {}

FolderHold& FolderHold::operator=(FolderHold&& other) noexcept {
    if (this != &other) {
        release();
        handle_ = std::exchange(other.handle_, nullptr);
    }
    return *this;
}

FolderHold FolderHold::take(const std::string& folder, int& error) {
    FolderHold hold;
    const std::wstring path = finalPath(folder, error);
    if (path.empty()) return hold;
    const HANDLE h = CreateEventW(nullptr, TRUE, FALSE, objectName(path).c_str());
    if (h == nullptr) {
        error = lastErrno();
        return hold;
    }
    if (GetLastError() == ERROR_ALREADY_EXISTS) {
        CloseHandle(h);
        error = EWOULDBLOCK;
        return hold;
    }
    error = 0;
    hold.handle_ = h;
    return hold;
}

bool FolderHold::held() const { return handle_ != nullptr; }

void FolderHold::release() {
    if (handle_) CloseHandle(std::exchange(handle_, nullptr));
}

}  // namespace tarn::platform
