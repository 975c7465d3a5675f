#include "core/texts.hpp"

#include <cerrno>
#include <system_error>

#include "core/number.hpp"
#include "platform/path_separator.hpp"

namespace tarn {

std::string testVerdictMessage(std::int64_t n, bool prime) {
    return "Number" + signedText(Number::fromWhole(n)) + (prime ? " is prime." : " is not prime.");
}

std::string systemReason(int error) {
    return std::generic_category().message(error != 0 ? error : EIO);
}

std::string fileWriteFailure(const std::string& path, const std::string& reason) {
    return "The file " + path + " could not be written: " + reason + ".";
}

std::string fileCreateFailure(const std::string& path, const std::string& reason) {
    return "The file " + path + " could not be opened for writing: " + reason + ".";
}

std::string fileReadFailure(const std::string& path, const std::string& reason) {
    return "The file " + path + " could not be read: " + reason + ".";
}

std::string folderBusyMessage(const std::string& folder) {
    std::string shown = folder;
    while (shown.size() > 1 && (shown.back() == '/' || shown.back() == platform::kPathSeparator))
        shown.pop_back();
    return "Another Tarn job is working on the files in " + shown +
           ". Wait until it ends, then try again.";
}

}  // namespace tarn
