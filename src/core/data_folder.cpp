#include "core/data_folder.hpp"

#include <filesystem>
#include <system_error>

#include "core/app_folder.hpp"
#include "core/file_names.hpp"
#include "core/path_text.hpp"
#include "platform/platform.hpp"

// Set by the build from the install layout; these are the GNU defaults.
#ifndef TARN_DOC_FROM_BIN
#define TARN_DOC_FROM_BIN "../share/doc/tarn"
#endif
#ifndef TARN_DATAROOT_FROM_BIN
#define TARN_DATAROOT_FROM_BIN "../share"
#endif

namespace fs = std::filesystem;

namespace tarn {
namespace {

// The folder without its trailing separator, so that filename() names it.
fs::path folderPath(const std::string& folder) {
    fs::path path = pathFromUtf8(folder);
    if (!path.has_filename() && path.has_relative_path()) path = path.parent_path();
    return path;
}

std::optional<std::string> environment(const char* name) {
    const std::optional<fs::path> value = platform::environmentPath(name);
    if (!value) return std::nullopt;
    return utf8(*value);
}

bool usableBase(const std::optional<std::string>& folder) {
    return folder && !folder->empty() && pathFromUtf8(*folder).is_absolute();
}

}  // namespace

bool isFolderWritable(const std::string& folder) {
    return platform::folderWritable(folderPath(folder));
}

bool isInstalledLayout(const std::string& programFolder) {
    const fs::path bin = folderPath(programFolder);
    std::error_code ec;
    return bin.filename() == "bin" && fs::is_directory(bin / TARN_DATAROOT_FROM_BIN, ec);
}

Surroundings currentSurroundings() {
    const platform::UserDataConvention& convention = platform::userDataConvention();
    return {isFolderWritable, environment(convention.dataVariable),
            environment(convention.homeVariable)};
}

std::string userDataFolder(const Surroundings& env) {
    const platform::UserDataConvention& convention = platform::userDataConvention();
    fs::path base;
    if (usableBase(env.xdgDataHome)) {
        base = pathFromUtf8(*env.xdgDataHome);
    } else if (usableBase(env.home)) {
        base = pathFromUtf8(*env.home) / convention.dataUnderHome;
    } else {
        return {};
    }
    return withTrailingSeparator(utf8((base / convention.folderName).lexically_normal()));
}

std::string chooseDataFolder(const std::string& programFolder, const Surroundings& env) {
    const bool writable = env.folderWritable && env.folderWritable(programFolder);
    if (writable && !isInstalledLayout(programFolder)) return programFolder;
    const std::string user = userDataFolder(env);
    return user.empty() ? programFolder : user;
}

std::string dataFolder(const std::string& programFolder) {
    const std::string folder = chooseDataFolder(programFolder, currentSurroundings());
    if (folder == programFolder) return folder;
    const fs::path path = folderPath(folder);
    std::error_code ec;
    fs::create_directories(path.parent_path(), ec);
    // The data of one user: the base directory rules ask for 0700 on a new folder.
    if (fs::create_directory(path, ec)) fs::permissions(path, fs::perms::owner_all, ec);
    return folder;
}

std::string readmePath(const std::string& programFolder) {
    const std::string beside = programFolder + kReadmeFileName;
    if (FileExists(beside)) return beside;
    const std::string installed =
        utf8((folderPath(programFolder) / TARN_DOC_FROM_BIN / kReadmeFileName).lexically_normal());
    if (FileExists(installed)) return installed;
    return beside;
}

}  // namespace tarn
