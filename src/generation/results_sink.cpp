#include "generation/results_sink.hpp"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

namespace tarn {
namespace {

class FileSink final : public ResultsSink {
public:
    FileSink(int fd, std::uint64_t size) : fd_(fd), size_(size) {}
    ~FileSink() override {
        if (fd_ >= 0) ::close(fd_);
    }

    int write(const char* data, std::size_t size, std::size_t& written) override {
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

    int truncate(std::uint64_t size) override {
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
};

}  // namespace

std::unique_ptr<ResultsSink> openResultsFile(const std::string& path, bool append, int& error) {
    const int flags = O_WRONLY | O_CREAT | O_CLOEXEC | (append ? O_APPEND : O_TRUNC);
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
    return std::make_unique<FileSink>(fd, static_cast<std::uint64_t>(info.st_size));
}

}  // namespace tarn
