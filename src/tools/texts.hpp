// Every text the tools show a user, word for word: the split's count refusals and reports, and
// the question before a large results file is opened in the text editor.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace tarn {

inline constexpr std::string_view kMinimumRecordsMessage = "Minimum value is 1000 records.";
inline constexpr std::string_view kRecordsOutOfRangeMessage =
    "Value out of range. Value must be between 1000 and 922 337 203 685 477.";

// "The results file <path> was not found."
std::string resultsNotFoundMessage(const std::string& resultsPath);
// "Done!!!", the signed text of the file count and " files were created.".
std::string splitDoneMessage(std::int64_t files);
// Says that the bytes after the last line end of the results file were left out.
std::string cutRecordNote(const std::string& resultsPath, std::uint64_t bytes);

// The figure as megabyte text: a point, no blanks and only the decimals needed (10.5, 15, 10.01).
std::string megabyteText(double figure);
// "The file is bigger than 10 MB (11.99 MB). Do you still want to open it with Notepad? ..."
std::string largeFileQuestion(double figure);

}  // namespace tarn
