// The writer of one split output file: pieces below half the staging buffer are gathered, larger
// runs go straight to the system, and every write is repeated until all of it is out, so a
// short write (a signal, a nearly full disk) never loses or reorders a byte.
#include "tools/split_output_file.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <utility>

#include "core/file_messages.hpp"

namespace tarn {

SplitOutputFile::SplitOutputFile(const SplitWriteFunction& writeSome)
    : writeSome_(writeSome), staging_(kSplitStagingSize) {}

SplitOutputFile::~SplitOutputFile() {
    if (fd_ >= 0) ::close(fd_);
}

bool SplitOutputFile::open(std::string name) {
    name_ = std::move(name);
    size_ = 0;
    errno = 0;
    fd_ = ::open(name_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    return fd_ >= 0 || fail(errno);
}

bool SplitOutputFile::write(const char* bytes, std::size_t count) {
    if (count >= staging_.size() / 2) return flush() && put(bytes, count);
    if (used_ + count > staging_.size() && !flush()) return false;
    std::memcpy(staging_.data() + used_, bytes, count);
    used_ += count;
    return true;
}

bool SplitOutputFile::close() {
    bool ok = flush();
    if (fd_ >= 0) {
        errno = 0;
        if (::close(fd_) != 0 && ok) ok = fail(errno);
        fd_ = -1;
    }
    return ok;
}

bool SplitOutputFile::dropLast(std::uint64_t count) {
    if (!flush()) return false;
    std::error_code error;
    size_ -= std::min(size_, count);
    std::filesystem::resize_file(name_, size_, error);
    return !error || fail(error.value());
}

bool SplitOutputFile::discard() {
    used_ = 0;
    if (!close()) return false;
    std::error_code error;
    std::filesystem::remove(name_, error);
    return !error || fail(error.value());
}

bool SplitOutputFile::flush() {
    const std::size_t count = used_;
    used_ = 0;
    return count == 0 || put(staging_.data(), count);
}

// The system may take less than asked (a full disk, a signal): the rest is offered again
// until it is all written or the system refuses with a reason.
bool SplitOutputFile::put(const char* bytes, std::size_t count) {
    while (count > 0) {
        errno = 0;
        const ssize_t done =
            writeSome_ ? writeSome_(fd_, bytes, count) : ::write(fd_, bytes, count);
        if (done < 0 && errno == EINTR) continue;
        // A write that takes nothing would be offered again forever.
        if (done <= 0) return fail(done < 0 ? errno : 0);
        bytes += done;
        count -= static_cast<std::size_t>(done);
        size_ += static_cast<std::uint64_t>(done);
    }
    return true;
}

bool SplitOutputFile::fail(int err) {
    error_ = fileWriteFailure(name_, systemReason(err));
    return false;
}

}  // namespace tarn
