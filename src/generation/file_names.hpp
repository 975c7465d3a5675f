// The names of the files the program keeps in its folder.
#pragma once

namespace tarn {

inline constexpr const char* kResultsFileName = "primes.txt";
inline constexpr const char* kCheckpointFileName = "primes.ini";
inline constexpr const char* kReadmeFileName = "README.txt";

}  // namespace tarn
