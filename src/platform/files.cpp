// What files do alike on every system: moving an owned file hands the handle over; a file is
// replaced through a synced temporary file and a durable move.
#include "platform/files.hpp"

#include <utility>

namespace tarn::platform {

File::File(File&& other) noexcept
    : handle_(std::exchange(other.handle_, kClosed)), append_(other.append_) {}

File& File::operator=(File&& other) noexcept {
    if (this != &other) {
        close();
        handle_ = std::exchange(other.handle_, kClosed);
        append_ = other.append_;
    }
    return *this;
}

int replaceFileDurably(const std::string& path, std::string_view content) {
    const std::string temporary = path + ".tmp";
    int error = 0;
    File file = File::open(temporary, File::Mode::Create, error);
    if (error != 0) return error;
    std::size_t written = 0;
    error = file.writeAll(content.data(), content.size(), written);
    if (error == 0) error = file.syncData();
    if (const int closed = file.close(); error == 0) error = closed;
    return finishReplace(temporary, path, error);
}

}  // namespace tarn::platform
