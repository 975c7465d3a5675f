#include "core/app_folder.hpp"

#include <filesystem>
#include <system_error>

namespace fs = std::filesystem;

namespace tarn {

std::string withTrailingSeparator(std::string folder) {
    if (folder.empty() || folder.back() != kPathSeparator) folder += kPathSeparator;
    return folder;
}

std::string AppFolder() {
    std::error_code ec;
#ifdef _WIN32
    fs::path exe;  // the Windows layer supplies the module path
#else
    fs::path exe = fs::read_symlink("/proc/self/exe", ec);
#endif
    if (ec || exe.empty()) return withTrailingSeparator(fs::current_path(ec).string());
    return withTrailingSeparator(exe.parent_path().string());
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
