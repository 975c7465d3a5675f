#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

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

}  // namespace tarn::platform
