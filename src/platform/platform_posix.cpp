#include <fcntl.h>
#include <unistd.h>

#include <cstdlib>
#include <system_error>

#include "platform/platform.hpp"

namespace fs = std::filesystem;

namespace tarn::platform {

fs::path programPath() {
    std::error_code ec;
    fs::path exe = fs::read_symlink("/proc/self/exe", ec);
    return ec ? fs::path() : exe;
}

std::optional<fs::path> environmentPath(const char* name) {
    const char* value = std::getenv(name);
    if (!value) return std::nullopt;
    return fs::path(value);
}

bool folderWritable(const fs::path& folder) {
    return faccessat(AT_FDCWD, folder.c_str(), W_OK | X_OK, AT_EACCESS) == 0;
}

const UserDataConvention& userDataConvention() {
    // The XDG base directory rules.
    static const UserDataConvention convention{"XDG_DATA_HOME", "HOME",
                                               fs::path(".local") / "share", "tarn"};
    return convention;
}

}  // namespace tarn::platform
