// Files on Windows through the wide APIs, so that any folder name works; handles are not
// inherited, so a program the window starts keeps none of them.
#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

#include <algorithm>
#include <utility>

#include "platform/files.hpp"
#include "platform/windows_read.hpp"
#include "platform/windows_text.hpp"

namespace tarn::platform {
namespace {

bool isFolder(const std::wstring& path) {
    const DWORD attributes = GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY);
}

// A folder in the file's place is refused as "access denied", a file in the place of its folder
// as "path not found"; say what POSIX says.
int openErrno(const std::wstring& path) {
    const DWORD error = GetLastError();
    if (error == ERROR_ACCESS_DENIED && isFolder(path)) return EISDIR;
    if (error == ERROR_PATH_NOT_FOUND) {
        const std::size_t cut = path.find_last_of(L"\\/");
        const std::wstring parent = cut == std::wstring::npos ? L"" : path.substr(0, cut);
        if (!parent.empty() && GetFileAttributesW(parent.c_str()) != INVALID_FILE_ATTRIBUTES &&
            !isFolder(parent))
            return ENOTDIR;
    }
    return errnoOf(error);
}

HANDLE native(std::intptr_t handle) { return reinterpret_cast<HANDLE>(handle); }

// ReadFile and WriteFile take a 32-bit count.
DWORD chunk(std::size_t size) { return static_cast<DWORD>(std::min<std::size_t>(size, 1u << 30)); }

}  // namespace

File File::open(const std::string& path, Mode mode, int& error) {
    const std::wstring wide = widen(path);
    const bool reads = mode == Mode::Read || mode == Mode::ReadNoWait;
    const DWORD access = reads ? GENERIC_READ : GENERIC_WRITE;
    const bool append = mode == Mode::Append || mode == Mode::AppendEmptied;
    const DWORD creation = reads                  ? OPEN_EXISTING
                           : mode == Mode::Append ? OPEN_ALWAYS
                                                  : CREATE_ALWAYS;
    // Others may read and write, as on POSIX. A file being appended to (the results of a job) is
    // kept from being deleted or renamed over: Windows would only mark it for deletion, and the
    // job would write on into a file that vanishes when it closes.
    const DWORD share = FILE_SHARE_READ | FILE_SHARE_WRITE | (append ? 0 : FILE_SHARE_DELETE);
    const HANDLE h =
        CreateFileW(wide.c_str(), access, share, nullptr, creation, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (h == INVALID_HANDLE_VALUE) {
        error = openErrno(wide);
        return File();
    }
    error = 0;
    return File(reinterpret_cast<std::intptr_t>(h), append);
}

bool File::isOpen() const { return handle_ != kClosed; }

std::ptrdiff_t readHandle(void* handle, char* data, std::size_t size, int& error) {
    DWORD got = 0;
    if (!ReadFile(handle, data, chunk(size), &got, nullptr)) {
        const DWORD code = GetLastError();
        // The writing end of a pipe has closed: the end of the input.
        if (code == ERROR_BROKEN_PIPE || code == ERROR_HANDLE_EOF) return error = 0, 0;
        error = errnoOf(code);
        return -1;
    }
    error = 0;
    return static_cast<std::ptrdiff_t>(got);
}

std::ptrdiff_t File::read(char* data, std::size_t size, int& error) {
    return readHandle(native(handle_), data, size, error);
}

std::ptrdiff_t File::writeSome(const char* data, std::size_t size, int& error) {
    DWORD done = 0;
    // An offset of all ones writes at the end of the file, wherever others have put it.
    OVERLAPPED atEnd{};
    atEnd.Offset = atEnd.OffsetHigh = 0xFFFFFFFF;
    if (!WriteFile(native(handle_), data, chunk(size), &done, append_ ? &atEnd : nullptr)) {
        error = lastErrno();
        return -1;
    }
    error = 0;
    return static_cast<std::ptrdiff_t>(done);
}

int File::writeAll(const char* data, std::size_t size, std::size_t& written) {
    return writeAllWith(
        [this](const char* d, std::size_t n, int& error) { return writeSome(d, n, error); }, data,
        size, written);
}

int File::syncData() { return FlushFileBuffers(native(handle_)) ? 0 : lastErrno(); }

// Windows writes back on its own; FlushFileBuffers does the rest.
void File::startWriteback(std::uint64_t, std::uint64_t) {}

void File::adviseSequential() {}

int File::size(std::uint64_t& bytes) const {
    LARGE_INTEGER size{};
    if (!GetFileSizeEx(native(handle_), &size)) return lastErrno();
    bytes = static_cast<std::uint64_t>(size.QuadPart);
    return 0;
}

namespace {
int identityOf(HANDLE h, FileIdentity& identity) {
    BY_HANDLE_FILE_INFORMATION info{};
    if (!GetFileInformationByHandle(h, &info)) return lastErrno();
    identity = {info.dwVolumeSerialNumber,
                (std::uint64_t{info.nFileIndexHigh} << 32) | info.nFileIndexLow,
                (std::uint64_t{info.nFileSizeHigh} << 32) | info.nFileSizeLow};
    return 0;
}
}  // namespace

int File::identity(FileIdentity& identity) const { return identityOf(native(handle_), identity); }

int pathIdentity(const std::string& path, FileIdentity& identity) {
    const std::wstring wide = widen(path);
    const HANDLE h =
        CreateFileW(wide.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                    nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (h == INVALID_HANDLE_VALUE) return openErrno(wide);
    const int error = identityOf(h, identity);
    CloseHandle(h);
    return error;
}

int File::truncate(std::uint64_t bytes) {
    LARGE_INTEGER at{};
    at.QuadPart = static_cast<LONGLONG>(bytes);
    if (!SetFilePointerEx(native(handle_), at, nullptr, FILE_BEGIN) ||
        !SetEndOfFile(native(handle_)))
        return lastErrno();
    return 0;
}

int File::close() {
    if (handle_ == kClosed) return 0;
    return CloseHandle(native(std::exchange(handle_, kClosed))) ? 0 : lastErrno();
}

int finishReplace(const std::string& temporary, const std::string& path, int error) {
    const std::wstring from = widen(temporary);
    // Write-through: the call returns once the new name is on the disk.
    if (error == 0 && !MoveFileExW(from.c_str(), widen(path).c_str(),
                                   MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH))
        error = lastErrno();
    if (error != 0) DeleteFileW(from.c_str());
    return error;
}

int truncateFile(const std::string& path, std::uint64_t bytes) {
    const std::wstring wide = widen(path);
    const HANDLE h = CreateFileW(wide.c_str(), GENERIC_WRITE,
                                 FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                 OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (h == INVALID_HANDLE_VALUE) return openErrno(wide);
    LARGE_INTEGER at{};
    at.QuadPart = static_cast<LONGLONG>(bytes);
    int error = SetFilePointerEx(h, at, nullptr, FILE_BEGIN) && SetEndOfFile(h) ? 0 : lastErrno();
    if (!CloseHandle(h) && error == 0) error = lastErrno();
    return error;
}

}  // namespace tarn::platform
