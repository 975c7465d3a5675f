#include "generation/results_sink.hpp"

#include "platform/files.hpp"

namespace tarn {
namespace {

class FileSink final : public ResultsSink {
public:
    FileSink(platform::File file, std::uint64_t size) : file_(std::move(file)), size_(size) {}

    int write(const char* data, std::size_t size, std::size_t& written) override {
        const int error = file_.writeAll(data, size, written);
        size_ += written;
        return error;
    }

    int sync() override { return file_.syncData(); }

    void startWriteback(std::uint64_t offset, std::uint64_t size) override {
        file_.startWriteback(offset, size);
    }

    int truncate(std::uint64_t size) override {
        const int error = file_.truncate(size);
        if (error == 0) size_ = size;
        return error;
    }

    int close() override { return file_.close(); }

    std::uint64_t size() const override { return size_; }

private:
    platform::File file_;
    std::uint64_t size_;
};

}  // namespace

std::unique_ptr<ResultsSink> openResultsFile(const std::string& path, bool append, int& error) {
    using Mode = platform::File::Mode;
    platform::File file = platform::File::open(path, append ? Mode::Append : Mode::Create, error);
    if (error != 0) return nullptr;
    std::uint64_t size = 0;
    if ((error = file.size(size)) != 0) return nullptr;
    return std::make_unique<FileSink>(std::move(file), size);
}

}  // namespace tarn
