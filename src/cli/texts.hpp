// The texts only tarn-cli shows, word for word; the engine's own texts are those of its layers.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace tarn::cli {

inline constexpr std::string_view kNothingToResumeNote = "Nothing to resume.";

// "Line 6 is longer than 1024 characters: passed over."
inline std::string longLineRefusal(std::int64_t number, std::size_t longest) {
    return "Line " + std::to_string(number) + " is longer than " + std::to_string(longest) +
           " characters: passed over.";
}

// --folder that names no folder.
inline std::string folderIsAFile(const std::string& name) {
    return "Directory is actually a file: " + name;
}
inline std::string folderMissing(const std::string& name) {
    return "Directory does not exist: " + name;
}

}  // namespace tarn::cli
