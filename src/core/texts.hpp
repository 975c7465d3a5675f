// Every text the core shows a user, word for word: the entry rule's refusals, the Test command's
// verdicts, failed file operations and a folder held by another job. The window and the command
// line both show them.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace tarn {

inline constexpr std::string_view kInvalidEntryMessage = "Invalid entry.";
inline constexpr std::string_view kOutOfRangeMessage =
    "Value out of range. Value must be between 2 and 922 337 203 685 277.";
inline constexpr std::string_view kTwoIsPrimeMessage = "Number 2 is prime.";

// "Number" and the signed text of the number (which begins with a blank), then " is prime." or
// " is not prime.": testVerdictMessage(7, true) is "Number 7 is prime.".
std::string testVerdictMessage(std::int64_t n, bool prime);

// The system's text for an error number (an unknown 0 counts as an input/output error).
std::string systemReason(int error);
// "The file <path> could not be written: <reason>."
std::string fileWriteFailure(const std::string& path, const std::string& reason);
// "The file <path> could not be opened for writing: <reason>."
std::string fileCreateFailure(const std::string& path, const std::string& reason);
// "The file <path> could not be read: <reason>."
std::string fileReadFailure(const std::string& path, const std::string& reason);

// "Another Tarn job is working on the files in <folder>. Wait until it ends, then try again."
std::string folderBusyMessage(const std::string& folder);

}  // namespace tarn
