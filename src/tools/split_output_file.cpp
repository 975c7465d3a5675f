// The writer of one split output file: pieces below half the staging buffer are gathered, larger
// runs go straight to the system, and every write is repeated until all of it is out, so a
// short write (a signal, a nearly full disk) never loses or reorders a byte.
#include "tools/split_output_file.hpp"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <system_error>
#include <utility>

#include "core/texts.hpp"

namespace tarn {

SplitOutputFile::SplitOutputFile(const SplitWriteFunction& writeSome)
    : writeSome_(writeSome), staging_(kSplitStagingSize) {}

SplitOutputFile::~SplitOutputFile() = default;

bool SplitOutputFile::open(std::string name) {
    name_ = std::move(name);
    size_ = 0;
    int error = 0;
    file_ = platform::File::open(name_, platform::File::Mode::Create, error);
    return error == 0 || fail(error);
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
    if (const int error = file_.close(); error != 0 && ok) ok = fail(error);
    return ok;
}

bool SplitOutputFile::dropLast(std::uint64_t count) {
    if (!flush()) return false;
    size_ -= std::min(size_, count);
    const int error = file_.truncate(size_);
    return error == 0 || fail(error);
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

bool SplitOutputFile::put(const char* bytes, std::size_t count) {
    std::size_t written = 0;
    const int error = writeSome_ ? platform::writeAllWith(
                                       [this](const char* data, std::size_t size, int& err) {
                                           return writeSome_(file_, data, size, err);
                                       },
                                       bytes, count, written)
                                 : file_.writeAll(bytes, count, written);
    size_ += written;
    return error == 0 || fail(error);
}

bool SplitOutputFile::fail(int err) {
    error_ = fileWriteFailure(name_, systemReason(err));
    return false;
}

}  // namespace tarn
