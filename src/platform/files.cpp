// What an owned file does alike on every system: moving it hands the handle over.
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

}  // namespace tarn::platform
