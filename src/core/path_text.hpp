// Paths as the program's texts: the program keeps every name in UTF-8, whatever the system's own
// encoding of paths.
#pragma once

#include <filesystem>
#include <string>

namespace tarn {

std::string utf8(const std::filesystem::path& path);
std::filesystem::path pathFromUtf8(const std::string& text);

}  // namespace tarn
