// Files as the engines use them: an owned handle with whole writes, reads, data syncs and
// cutting back, and a file replaced durably. Paths are UTF-8 on every system; failures are
// reported as errno numbers on every system (the Windows side translates its own codes), so that
// one set of messages words them.
#pragma once

#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace tarn::platform {

// Writes all of [data, data + size) through `writeSome`, which takes some bytes like the system's
// write: the count taken, or -1 with the error number in its last argument. Interruptions are
// offered again, short writes continue where they stopped; `written` receives the bytes taken.
// A write that takes nothing and gives no reason fails with EIO rather than looping forever.
template <class WriteSome>
int writeAllWith(WriteSome&& writeSome, const char* data, std::size_t size, std::size_t& written) {
    written = 0;
    while (written < size) {
        int error = 0;
        const std::ptrdiff_t done = writeSome(data + written, size - written, error);
        if (done < 0 && error == EINTR) continue;
        if (done <= 0) return done < 0 && error != 0 ? error : EIO;
        written += static_cast<std::size_t>(done);
    }
    return 0;
}

// Which file a handle or a path names, and its size, so that a job can tell whether the file at
// its path is still the one it writes.
struct FileIdentity {
    std::uint64_t device = 0;
    std::uint64_t index = 0;
    std::uint64_t size = 0;
    bool operator==(const FileIdentity&) const = default;
};

class File {
public:
    enum class Mode {
        Read,
        ReadNoWait,     // a pipe or device in the file's place cannot hold up the open
        Create,         // write, created or emptied
        Append,         // every write at the end, created when missing
        AppendEmptied,  // every write at the end, created or emptied
    };
    File() = default;
    ~File() { close(); }
    File(File&& other) noexcept;
    File& operator=(File&& other) noexcept;
    File(const File&) = delete;
    File& operator=(const File&) = delete;

    // The open file, or a closed one with the error number in `error`.
    static File open(const std::string& path, Mode mode, int& error);

    bool isOpen() const;

    // One read: the bytes read (0 at the end), or -1 with the error number (EINTR when a stop
    // signal broke the wait, so that the caller can look at its stop request).
    std::ptrdiff_t read(char* data, std::size_t size, int& error);
    // One write: the bytes taken, or -1 with the error number.
    std::ptrdiff_t writeSome(const char* data, std::size_t size, int& error);
    // Every byte, or the error number; `written` receives how many reached the file.
    int writeAll(const char* data, std::size_t size, std::size_t& written);
    // Makes the data written so far durable.
    int syncData();
    // Asks the system to start writing [offset, offset + size) to the disk without waiting.
    void startWriteback(std::uint64_t offset, std::uint64_t size);
    // Tells the system that the file will be read from start to end.
    void adviseSequential();
    int size(std::uint64_t& bytes) const;
    int identity(FileIdentity& identity) const;
    // Cuts the file to `bytes` and moves the position there.
    int truncate(std::uint64_t bytes);
    int close();

private:
#ifdef _WIN32
    using Handle = std::intptr_t;  // a HANDLE; INVALID_HANDLE_VALUE is -1
#else
    using Handle = int;
#endif
    static constexpr Handle kClosed = -1;
    File(Handle handle, bool append) : handle_(handle), append_(append) {}
    Handle handle_ = kClosed;
    bool append_ = false;  // Windows: every write at the end (POSIX: O_APPEND does it)
};

// Replaces the file with `content` so that a crash at any moment leaves the old file or the new
// one: written to `path` + ".tmp", synced, renamed over `path`, and the rename made durable.
int replaceFileDurably(const std::string& path, std::string_view content);

// The end of replaceFileDurably, one per system: when `error` is 0, moves the synced `temporary`
// over `path` and returns once the new name is on the disk; `temporary` is removed on any failure.
int finishReplace(const std::string& temporary, const std::string& path, int error);

// The identity of the file at `path`; ENOENT when nothing is there.
int pathIdentity(const std::string& path, FileIdentity& identity);

// Cuts the file at `path` to `bytes`.
int truncateFile(const std::string& path, std::uint64_t bytes);

}  // namespace tarn::platform
