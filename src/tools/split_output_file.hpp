// One output file of the split. Whole runs of records go to the system as they stand, and the
// small pieces that mend bare line ends are staged so that they do not cost a write each; a
// short write is offered again until every byte is out or the system gives a reason.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "tools/split_results.hpp"

namespace tarn {

class SplitOutputFile {
public:
    // `writeSome` stands in for the system's write when it is not empty; it must outlive this.
    explicit SplitOutputFile(const SplitWriteFunction& writeSome);
    ~SplitOutputFile();
    SplitOutputFile(const SplitOutputFile&) = delete;
    SplitOutputFile& operator=(const SplitOutputFile&) = delete;

    // Creates (or empties) the file. These return false on a failure, which error() then tells.
    bool open(std::string name);
    // Staged bytes always go out before a run that bypasses the staging, so the order is the
    // input's.
    bool write(const char* bytes, std::size_t count);
    bool close();
    // Takes back the last `count` bytes written (a cut record whose start already went out).
    bool dropLast(std::uint64_t count);
    // Closes the file and removes it.
    bool discard();

    // "The file <name> could not be written: <reason>."
    const std::string& error() const { return error_; }

private:
    bool flush();
    bool put(const char* bytes, std::size_t count);
    bool fail(int err);

    const SplitWriteFunction& writeSome_;
    platform::File file_;
    std::string name_;
    std::string error_;
    std::vector<char> staging_;
    std::size_t used_ = 0;
    std::uint64_t size_ = 0;  // bytes given to the system
};

}  // namespace tarn
