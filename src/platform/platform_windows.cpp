#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <io.h>
#include <windows.h>

#include <cerrno>
#include <cstdlib>

#include "platform/platform.hpp"

namespace fs = std::filesystem;

namespace tarn::platform {

fs::path programPath() {
    // The buffer grows until the path fits.
    std::wstring buffer(MAX_PATH, L'\0');
    for (;;) {
        const DWORD size = static_cast<DWORD>(buffer.size());
        const DWORD n = GetModuleFileNameW(nullptr, buffer.data(), size);
        if (n == 0) return {};
        if (n < buffer.size()) {
            buffer.resize(n);
            return fs::path(buffer);
        }
        buffer.resize(buffer.size() * 2);
    }
}

std::optional<fs::path> environmentPath(const char* name) {
    std::wstring wide;
    for (const char* c = name; *c; ++c) wide += static_cast<wchar_t>(*c);
    const wchar_t* value = _wgetenv(wide.c_str());
    if (!value) return std::nullopt;
    return fs::path(value);
}

bool folderWritable(const fs::path& folder) {
    // Access rights on Windows live in ACLs that _waccess does not read: try a probe file.
    const fs::path probe = folder / L".tarn-write-probe";
    const HANDLE h = CreateFileW(probe.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                 FILE_ATTRIBUTE_TEMPORARY | FILE_FLAG_DELETE_ON_CLOSE, nullptr);
    if (h == INVALID_HANDLE_VALUE) return false;
    CloseHandle(h);
    return true;
}

const UserDataConvention& userDataConvention() {
    static const UserDataConvention convention{"LOCALAPPDATA", "USERPROFILE",
                                               fs::path("AppData") / "Local", "Tarn"};
    return convention;
}

namespace {
int identityOf(HANDLE h, FileIdentity& identity) {
    BY_HANDLE_FILE_INFORMATION info{};
    if (!GetFileInformationByHandle(h, &info)) return EIO;
    identity = {info.dwVolumeSerialNumber,
                (std::uint64_t{info.nFileIndexHigh} << 32) | info.nFileIndexLow,
                (std::uint64_t{info.nFileSizeHigh} << 32) | info.nFileSizeLow};
    return 0;
}
}  // namespace

int openFileIdentity(int descriptor, FileIdentity& identity) {
    const auto h = reinterpret_cast<HANDLE>(_get_osfhandle(descriptor));
    return h == INVALID_HANDLE_VALUE ? EBADF : identityOf(h, identity);
}

int pathFileIdentity(const fs::path& path, FileIdentity& identity) {
    const HANDLE h =
        CreateFileW(path.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                    nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (h == INVALID_HANDLE_VALUE) {
        const DWORD error = GetLastError();
        return error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND ? ENOENT : EIO;
    }
    const int error = identityOf(h, identity);
    CloseHandle(h);
    return error;
}

}  // namespace tarn::platform
