// Where the program keeps its files, and whether a file is there.
// Every file the program owns is named as the folder (with one trailing separator) followed
// directly by the file's name; the engines take that folder as a parameter.
#pragma once

#include <string>

#include "platform/path_separator.hpp"

namespace tarn {

inline constexpr char kPathSeparator = platform::kPathSeparator;

// The folder of the running program with exactly one trailing separator.
std::string AppFolder();

// A folder name with exactly one trailing separator (a root keeps its own).
std::string withTrailingSeparator(std::string folder);

// True only for a normal, visible file: empty names, names ending in a separator, folders,
// hidden files and failed queries count as missing.
bool FileExists(const std::string& name);

}  // namespace tarn
