#include "core/file_messages.hpp"

#include <cerrno>
#include <system_error>

namespace tarn {

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

}  // namespace tarn
