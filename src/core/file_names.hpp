// The names of the files the program keeps in its folder, and their paths in a given folder.
#pragma once

#include <string>

namespace tarn {

inline constexpr const char* kResultsFileName = "primes.txt";
inline constexpr const char* kCheckpointFileName = "primes.ini";
inline constexpr const char* kReadmeFileName = "README.txt";

// `folder` ends in a separator (see app_folder.hpp): the name follows it directly.
inline std::string resultsFilePath(const std::string& folder) { return folder + kResultsFileName; }
inline std::string checkpointFilePath(const std::string& folder) {
    return folder + kCheckpointFileName;
}

}  // namespace tarn
