#include "core/data_folder.hpp"

#include <cstdlib>
#include <filesystem>
#include <system_error>

#include "core/app_folder.hpp"
#include "core/file_names.hpp"

#ifdef _WIN32
#include <windows.h>
#else
#include <fcntl.h>
#include <unistd.h>
#endif

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

std::string utf8(const fs::path& path) {
    const std::u8string text = path.u8string();
    return std::string(reinterpret_cast<const char*>(text.data()), text.size());
}

fs::path fromUtf8(const std::string& text) {
    return fs::path(std::u8string(reinterpret_cast<const char8_t*>(text.data()), text.size()));
}

// The folder without its trailing separator, so that filename() names it.
fs::path folderPath(const std::string& folder) {
    fs::path path = fromUtf8(folder);
    if (!path.has_filename() && path.has_relative_path()) path = path.parent_path();
    return path;
}

std::optional<std::string> environment(const char* name) {
#ifdef _WIN32
    std::wstring wide;
    for (const char* c = name; *c; ++c) wide += static_cast<wchar_t>(*c);
    const wchar_t* value = _wgetenv(wide.c_str());
    if (!value) return std::nullopt;
    return utf8(fs::path(value));
#else
    const char* value = std::getenv(name);
    if (!value) return std::nullopt;
    return std::string(value);
#endif
}

bool usableBase(const std::optional<std::string>& folder) {
    return folder && !folder->empty() && fromUtf8(*folder).is_absolute();
}

}  // namespace

bool FolderWritable(const std::string& folder) {
#ifdef _WIN32
    // Access rights on Windows live in ACLs that _waccess does not read: try a probe file.
    const fs::path probe = folderPath(folder) / L".tarn-write-probe";
    const HANDLE h = CreateFileW(probe.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                 FILE_ATTRIBUTE_TEMPORARY | FILE_FLAG_DELETE_ON_CLOSE, nullptr);
    if (h == INVALID_HANDLE_VALUE) return false;
    CloseHandle(h);
    return true;
#else
    return faccessat(AT_FDCWD, folderPath(folder).c_str(), W_OK | X_OK, AT_EACCESS) == 0;
#endif
}

bool InstalledLayout(const std::string& programFolder) {
    const fs::path bin = folderPath(programFolder);
    std::error_code ec;
    return bin.filename() == "bin" && fs::is_directory(bin / TARN_DATAROOT_FROM_BIN, ec);
}

Surroundings currentSurroundings() {
#ifdef _WIN32
    return {FolderWritable, environment("LOCALAPPDATA"), environment("USERPROFILE")};
#else
    return {FolderWritable, environment("XDG_DATA_HOME"), environment("HOME")};
#endif
}

std::string userDataFolder(const Surroundings& env) {
    fs::path base;
    if (usableBase(env.xdgDataHome)) {
        base = fromUtf8(*env.xdgDataHome);
    } else if (usableBase(env.home)) {
#ifdef _WIN32
        base = fromUtf8(*env.home) / "AppData" / "Local";
#else
        base = fromUtf8(*env.home) / ".local" / "share";
#endif
    } else {
        return {};
    }
#ifdef _WIN32
    const char* name = "Tarn";
#else
    const char* name = "tarn";
#endif
    return withTrailingSeparator(utf8((base / name).lexically_normal()));
}

std::string chooseDataFolder(const std::string& programFolder, const Surroundings& env) {
    const bool writable = env.folderWritable && env.folderWritable(programFolder);
    if (writable && !InstalledLayout(programFolder)) return programFolder;
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
