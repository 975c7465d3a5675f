// How a failed file operation is told to the user: the file's full path and the system's own
// reason, in one wording for every part of the program.
#pragma once

#include <string>

namespace tarn {

// The system's text for an error number (an unknown 0 counts as an input/output error).
std::string systemReason(int error);

// "The file <path> could not be written: <reason>."
std::string fileWriteFailure(const std::string& path, const std::string& reason);
// "The file <path> could not be opened for writing: <reason>."
std::string fileCreateFailure(const std::string& path, const std::string& reason);
// "The file <path> could not be read: <reason>."
std::string fileReadFailure(const std::string& path, const std::string& reason);

}  // namespace tarn
