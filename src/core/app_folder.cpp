#include "core/app_folder.hpp"

#include <filesystem>
#include <system_error>

#include "core/path_text.hpp"
#include "platform/platform.hpp"

namespace fs = std::filesystem;

namespace tarn {

std::string withTrailingSeparator(std::string folder) {
    // '/' separates folders on Windows too.
    if (folder.empty() || (folder.back() != kPathSeparator && folder.back() != '/'))
        folder += kPathSeparator;
    return folder;
}

std::string AppFolder() {
    std::error_code ec;
    const fs::path exe = platform::programPath();
    if (exe.empty()) return withTrailingSeparator(utf8(fs::current_path(ec)));
    return withTrailingSeparator(utf8(exe.parent_path()));
}

bool FileExists(const std::string& name) {
    if (name.empty() || name.back() == kPathSeparator || name.back() == '/') return false;
    const fs::path path = pathFromUtf8(name);
    const std::string leaf = utf8(path.filename());
    if (!leaf.empty() && leaf.front() == '.') return false;  // hidden on this system
    std::error_code ec;
    return fs::is_regular_file(path, ec) && !ec;
}

}  // namespace tarn
