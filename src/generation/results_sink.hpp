// Where the generation job puts its records: the results file, or a stand-in that tests make fail
// at a chosen byte. Every call returns 0 or the system's error number. write() and sync() may run
// on different threads at once (the writer and the checkpointer), as they can on one descriptor.
// The sink keeps the file's size itself, so that a job that continues a file knows where each of
// its bytes lands and a failed job can cut the file back without dropping earlier records.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

namespace tarn {

// Whether the file at the results path is still the one the job writes, with every byte of it.
struct FileCheck {
    enum class Change { None, Gone, Replaced, Resized };
    Change change = Change::None;
    std::uint64_t bytes = 0;    // Resized: the open file's size now
    std::uint64_t trusted = 0;  // Resized: the bytes at its start that are surely the job's
    int error = 0;              // the system's error number when the path could not be looked at
};

class ResultsSink {
public:
    virtual ~ResultsSink() = default;
    // Writes all bytes (or fails); `written` receives how many reached the file.
    virtual int write(const char* data, std::size_t size, std::size_t& written) = 0;
    // Makes everything written so far durable (fdatasync).
    virtual int sync() = 0;
    // Asks the system to start writing [offset, offset + size) to the disk without waiting, so
    // that the final sync has little left to do. Optional.
    virtual void startWriteback(std::uint64_t /*offset*/, std::uint64_t /*size*/) {}
    // Cuts the file back to `size` bytes (used to drop a torn record after a failed write).
    virtual int truncate(std::uint64_t size) = 0;
    virtual int close() = 0;
    // Looks whether someone deleted, replaced or resized the file under the job; waits for a
    // write in progress, so the size is compared with every byte written. The job looks after
    // every write, so that little is written past a cut.
    virtual FileCheck check() = 0;
    // The bytes in the file: those it held when opened, plus those written, as cut back.
    // Called by the writer only, or once the writer has finished.
    virtual std::uint64_t size() const = 0;
};

// Opens the results file for appending, emptied first for a fresh job: a file cut under the job
// then shows in its size instead of gaining a hole. Returns nothing and the error number on
// failure.
std::unique_ptr<ResultsSink> openResultsFile(const std::string& path, bool append, int& error);

}  // namespace tarn
