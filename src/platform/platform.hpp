// What the core asks of the operating system (the path separator is in path_separator.hpp).
// Each system has one source file, platform_posix.cpp or platform_windows.cpp; the build compiles
// the one for its system.
#pragma once

#include <filesystem>
#include <optional>

namespace tarn::platform {

// The full path of the running program; empty when the system does not tell.
std::filesystem::path programPath();

// The value of an environment variable as a path; nullopt when it is unset.
std::optional<std::filesystem::path> environmentPath(const char* name);

// Whether this process may create files in the folder (effective ids; read-only mounts count).
bool folderWritable(const std::filesystem::path& folder);

// Where this system keeps a user's application data: the variable naming that folder, else the
// variable naming the user's home and the folder under it; and Tarn's folder name there.
struct UserDataConvention {
    const char* dataVariable;
    const char* homeVariable;
    std::filesystem::path dataUnderHome;
    const char* folderName;
};
const UserDataConvention& userDataConvention();

}  // namespace tarn::platform
