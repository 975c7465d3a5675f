#include "core/app_folder.hpp"

#include <filesystem>
#include <system_error>

#ifdef _WIN32
#include <windows.h>
#endif

namespace fs = std::filesystem;

namespace tarn {

#ifdef _WIN32
namespace {

// The full path of the running program; the buffer grows until the path fits.
fs::path modulePath() {
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

std::string utf8(const fs::path& path) {
    const std::u8string text = path.u8string();
    return std::string(reinterpret_cast<const char*>(text.data()), text.size());
}

}  // namespace
#endif

std::string withTrailingSeparator(std::string folder) {
    if (folder.empty() || folder.back() != kPathSeparator) folder += kPathSeparator;
    return folder;
}

std::string AppFolder() {
    std::error_code ec;
#ifdef _WIN32
    const fs::path exe = modulePath();
    if (exe.empty()) return withTrailingSeparator(utf8(fs::current_path(ec)));
    return withTrailingSeparator(utf8(exe.parent_path()));
#else
    fs::path exe = fs::read_symlink("/proc/self/exe", ec);
    if (ec || exe.empty()) return withTrailingSeparator(fs::current_path(ec).string());
    return withTrailingSeparator(exe.parent_path().string());
#endif
}

bool FileExists(const std::string& name) {
    if (name.empty() || name.back() == kPathSeparator || name.back() == '/') return false;
    const fs::path path(name);
    const std::string leaf = path.filename().string();
    if (!leaf.empty() && leaf.front() == '.') return false;  // hidden on this system
    std::error_code ec;
    return fs::is_regular_file(path, ec) && !ec;
}

}  // namespace tarn
