// A results sink that passes every call on to the real file: tests override the calls they count,
// fail or act on.
#pragma once

#include <memory>

#include "generation/results_sink.hpp"

namespace tarn::test {

class SinkRelay : public ResultsSink {
public:
    explicit SinkRelay(std::unique_ptr<ResultsSink> file) : file_(std::move(file)) {}
    int write(const char* data, std::size_t size, std::size_t& written) override {
        return file_->write(data, size, written);
    }
    int sync() override { return file_->sync(); }
    int truncate(std::uint64_t size) override { return file_->truncate(size); }
    int close() override { return file_->close(); }
    FileCheck check() override { return file_->check(); }
    std::uint64_t size() const override { return file_->size(); }

protected:
    std::unique_ptr<ResultsSink> file_;
};

}  // namespace tarn::test
