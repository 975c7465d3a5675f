// Files on POSIX systems: descriptors opened close-on-exec, so that a program the window starts
// (a text editor) keeps none of them.
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <utility>

#include "platform/files.hpp"

namespace tarn::platform {

File File::open(const std::string& path, Mode mode, int& error) {
    int flags = O_CLOEXEC;
    switch (mode) {
        case Mode::Read:
            flags |= O_RDONLY;
            break;
        case Mode::ReadNoWait:
            flags |= O_RDONLY | O_NONBLOCK;
            break;
        case Mode::Create:
            flags |= O_WRONLY | O_CREAT | O_TRUNC;
            break;
        case Mode::Append:
            flags |= O_WRONLY | O_CREAT | O_APPEND;
            break;
        case Mode::AppendEmptied:
            flags |= O_WRONLY | O_CREAT | O_APPEND | O_TRUNC;
            break;
    }
    const int fd = ::open(path.c_str(), flags, 0644);
    error = fd < 0 ? errno : 0;
    return File(fd, mode == Mode::Append || mode == Mode::AppendEmptied);
}

bool File::isOpen() const { return handle_ >= 0; }

std::ptrdiff_t File::read(char* data, std::size_t size, int& error) {
    const ssize_t got = ::read(handle_, data, size);
    error = got < 0 ? errno : 0;
    return got;
}

std::ptrdiff_t File::writeSome(const char* data, std::size_t size, int& error) {
    const ssize_t done = ::write(handle_, data, size);
    error = done < 0 ? errno : 0;
    return done;
}

int File::writeAll(const char* data, std::size_t size, std::size_t& written) {
    return writeAllWith(
        [this](const char* d, std::size_t n, int& error) { return writeSome(d, n, error); }, data,
        size, written);
}

int File::syncData() { return ::fdatasync(handle_) == 0 ? 0 : errno; }

void File::startWriteback(std::uint64_t offset, std::uint64_t size) {
#ifdef SYNC_FILE_RANGE_WRITE
    ::sync_file_range(handle_, static_cast<off64_t>(offset), static_cast<off64_t>(size),
                      SYNC_FILE_RANGE_WRITE);
#else
    (void)offset;
    (void)size;
#endif
}

void File::adviseSequential() { ::posix_fadvise(handle_, 0, 0, POSIX_FADV_SEQUENTIAL); }

int File::size(std::uint64_t& bytes) const {
    struct stat info {};
    if (::fstat(handle_, &info) != 0) return errno;
    bytes = static_cast<std::uint64_t>(info.st_size);
    return 0;
}

namespace {
FileIdentity identityOf(const struct stat& info) {
    return {static_cast<std::uint64_t>(info.st_dev), static_cast<std::uint64_t>(info.st_ino),
            static_cast<std::uint64_t>(info.st_size)};
}
}  // namespace

int File::identity(FileIdentity& identity) const {
    struct stat info {};
    if (::fstat(handle_, &info) != 0) return errno;
    identity = identityOf(info);
    return 0;
}

int pathIdentity(const std::string& path, FileIdentity& identity) {
    struct stat info {};
    if (::stat(path.c_str(), &info) != 0) return errno;
    identity = identityOf(info);
    return 0;
}

int File::truncate(std::uint64_t bytes) {
    if (::ftruncate(handle_, static_cast<off_t>(bytes)) != 0) return errno;
    return ::lseek(handle_, static_cast<off_t>(bytes), SEEK_SET) < 0 ? errno : 0;
}

int File::close() {
    if (handle_ < 0) return 0;
    return ::close(std::exchange(handle_, kClosed)) == 0 ? 0 : errno;
}

namespace {

// Makes a rename in the folder durable; a file system that cannot sync folders (EINVAL) has
// nothing more to do.
int syncFolderOf(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    const std::string folder = slash == std::string::npos ? "." : path.substr(0, slash + 1);
    const int fd = ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0) return errno;
    const int error = ::fsync(fd) == 0 || errno == EINVAL ? 0 : errno;
    ::close(fd);
    return error;
}

}  // namespace

int finishReplace(const std::string& temporary, const std::string& path, int error) {
    if (error == 0 && ::rename(temporary.c_str(), path.c_str()) != 0) error = errno;
    if (error != 0) {
        ::unlink(temporary.c_str());
        return error;
    }
    return syncFolderOf(path);
}

int truncateFile(const std::string& path, std::uint64_t bytes) {
    return ::truncate(path.c_str(), static_cast<off_t>(bytes)) == 0 ? 0 : errno;
}

}  // namespace tarn::platform
