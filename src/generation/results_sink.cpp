#include "generation/results_sink.hpp"

#include <algorithm>
#include <cerrno>
#include <mutex>
#include <optional>

#include "platform/files.hpp"

namespace tarn {
namespace {

class FileSink final : public ResultsSink {
public:
    FileSink(platform::File file, std::uint64_t size, std::string path)
        : file_(std::move(file)), size_(size), path_(std::move(path)) {}

    int write(const char* data, std::size_t size, std::size_t& written) override {
        const std::lock_guard lock(writing_);
        const int error = file_.writeAll(data, size, written);
        size_ += written;
        unchecked_ += written;
        return error;
    }

    int sync() override { return file_.syncData(); }

    void startWriteback(std::uint64_t offset, std::uint64_t size) override {
        file_.startWriteback(offset, size);
    }

    // Writes append, so a file cut or grown under the job changes size for good: the bytes
    // written since the last good check may sit past the cut, the ones before are the job's own.
    FileCheck check() override {
        const std::lock_guard lock(writing_);
        platform::FileIdentity open, atPath;
        if (const int error = file_.identity(open); error != 0) return {.error = error};
        if (const int error = platform::pathIdentity(path_, atPath); error != 0)
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
        const int error = file_.truncate(size);
        if (error == 0) size_ = size;
        return error;
    }

    int close() override { return file_.close(); }

    std::uint64_t size() const override { return size_; }

private:
    platform::File file_;
    std::uint64_t size_;
    std::string path_;
    std::mutex writing_;
    std::uint64_t unchecked_ = 0;           // written since the last check
    std::optional<std::uint64_t> trusted_;  // once the size was found changed
};

}  // namespace

std::unique_ptr<ResultsSink> openResultsFile(const std::string& path, bool append, int& error) {
    // Appending: a file cut under the job shows in its size instead of gaining a hole.
    using Mode = platform::File::Mode;
    platform::File file =
        platform::File::open(path, append ? Mode::Append : Mode::AppendEmptied, error);
    if (error != 0) return nullptr;
    platform::FileIdentity identity;
    if ((error = file.identity(identity)) != 0) return nullptr;
    return std::make_unique<FileSink>(std::move(file), identity.size, path);
}

}  // namespace tarn
