#include "generation/results_sink.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <mutex>
#include <optional>

#include "platform/platform.hpp"

namespace tarn {
namespace {

class FileSink final : public ResultsSink {
public:
    FileSink(int fd, std::uint64_t size, std::string path)
        : fd_(fd), size_(size), path_(std::move(path)) {}
    ~FileSink() override {
        if (fd_ >= 0) ::close(fd_);
    }

    int write(const char* data, std::size_t size, std::size_t& written) override {
        const std::lock_guard lock(writing_);
        written = 0;
        while (written < size) {
            const ssize_t n = ::write(fd_, data + written, size - written);
            if (n < 0) {
                if (errno == EINTR) continue;
                return errno;
            }
            if (n == 0) return ENOSPC;
            written += static_cast<std::size_t>(n);
            size_ += static_cast<std::uint64_t>(n);
        }
        unchecked_ += size;
        return 0;
    }

    int sync() override { return ::fdatasync(fd_) == 0 ? 0 : errno; }

    void startWriteback(std::uint64_t offset, std::uint64_t size) override {
#ifdef SYNC_FILE_RANGE_WRITE
        ::sync_file_range(fd_, static_cast<off64_t>(offset), static_cast<off64_t>(size),
                          SYNC_FILE_RANGE_WRITE);
#else
        (void)offset;
        (void)size;
#endif
    }

    // Writes append, so a file cut or grown under the job changes size for good: the bytes
    // written since the last good check may sit past the cut, the ones before are the job's own.
    FileCheck check() override {
        const std::lock_guard lock(writing_);
        platform::FileIdentity open, atPath;
        if (const int error = platform::openFileIdentity(fd_, open); error != 0)
            return {.error = error};
        if (const int error = platform::pathFileIdentity(path_, atPath); error != 0)
            return error == ENOENT ? FileCheck{.change = FileCheck::Change::Gone}
                                   : FileCheck{.error = error};
        if (open.device != atPath.device || open.index != atPath.index)
            return {.change = FileCheck::Change::Replaced};
        if (open.size != size_ && !trusted_) {
            const std::uint64_t before = std::min(open.size, size_);
            trusted_ = before - std::min(before, unchecked_);
        }
        unchecked_ = 0;
        if (trusted_)
            return {.change = FileCheck::Change::Resized, .bytes = open.size, .trusted = *trusted_};
        return {};
    }

    int truncate(std::uint64_t size) override {
        const std::lock_guard lock(writing_);
        if (::ftruncate(fd_, static_cast<off_t>(size)) != 0) return errno;
        size_ = size;
        return ::lseek(fd_, static_cast<off_t>(size), SEEK_SET) < 0 ? errno : 0;
    }

    int close() override {
        const int fd = fd_;
        fd_ = -1;
        return ::close(fd) == 0 ? 0 : errno;
    }

    std::uint64_t size() const override { return size_; }

private:
    int fd_;
    std::uint64_t size_;
    std::string path_;
    std::mutex writing_;
    std::uint64_t unchecked_ = 0;           // written since the last check
    std::optional<std::uint64_t> trusted_;  // once the size was found changed
};

}  // namespace

std::unique_ptr<ResultsSink> openResultsFile(const std::string& path, bool append, int& error) {
    const int flags = O_WRONLY | O_CREAT | O_CLOEXEC | O_APPEND | (append ? 0 : O_TRUNC);
    const int fd = ::open(path.c_str(), flags, 0644);
    if (fd < 0) {
        error = errno;
        return nullptr;
    }
    struct stat info {};
    if (::fstat(fd, &info) != 0) {
        error = errno;
        ::close(fd);
        return nullptr;
    }
    error = 0;
    return std::make_unique<FileSink>(fd, static_cast<std::uint64_t>(info.st_size), path);
}

}  // namespace tarn
