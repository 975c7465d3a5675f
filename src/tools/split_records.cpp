// The record copier of the split: counts line ends with one vectorised pass per block and walks
// records with memchr only where a file ends or a line end needs its CR, so most blocks cost one
// pass and one write.
#include "tools/split_records.hpp"

#include <cstring>
#include <utility>

namespace tarn {
namespace {

// Line ends in data[0, end), and how many of them lack the CR before them. Written as a plain
// loop so that the compiler vectorises it: this is the pass every byte goes through.
struct LineCount {
    std::size_t lines = 0;
    std::size_t bare = 0;
};

LineCount countLines(const char* data, std::size_t end) {
    if (end == 0) return {};
    // A line end at the very start of the buffer has nothing before it in this block; the
    // split never leaves a CR behind it (see copyRecordPiece), so it counts as bare.
    const bool first = data[0] == '\n';
    std::size_t lines = first, bare = first;
    for (std::size_t i = 1; i < end; ++i) {
        const bool lf = data[i] == '\n';
        lines += lf;
        bare += lf & (data[i - 1] != '\r');
    }
    return {lines, bare};
}

}  // namespace

RecordCopier::RecordCopier(std::string namePrefix, std::int64_t recordsPerFile,
                           const StopSignal& stop, const SplitOptions& options)
    : prefix_(std::move(namePrefix)),
      perFile_(recordsPerFile),
      stop_(stop),
      options_(options),
      out_(options.writeSome) {}

bool RecordCopier::stopHere() {
    if (options_.onStopPoint) options_.onStopPoint(copied_);
    return stop_.requested();
}

CopyStep RecordCopier::openNext() {
    if (files_ > 0 && !out_.close()) return CopyStep::Fail;
    ++files_;
    inFile_ = 0;
    if (options_.progress) options_.progress->files.store(files_, std::memory_order_relaxed);
    return out_.open(splitFileName(prefix_, files_)) ? CopyStep::Go : CopyStep::Fail;
}

// Before a record goes out: when the current file is full, the next one is opened, but only
// after the stop was looked at, so a stopped split opens no file it cannot fill.
CopyStep RecordCopier::makeRoom() {
    if (inFile_ < perFile_) return CopyStep::Go;
    if (stopHere()) return CopyStep::Stop;
    return openNext();
}

CopyStep RecordCopier::copyBlock(const char* data, std::size_t end) {
    const LineCount c = countLines(data, end);
    const auto room = static_cast<std::uint64_t>(perFile_ - inFile_);
    if (c.bare == 0 && c.lines <= room && inFile_ < perFile_) {
        // The usual case: the whole block belongs to the current file as it stands.
        if (!out_.write(data, end)) return CopyStep::Fail;
        inFile_ += static_cast<std::int64_t>(c.lines);
        copied_ += static_cast<std::int64_t>(c.lines);
        return CopyStep::Go;
    }
    return copyLineByLine(data, end);
}

// Used where a file ends inside the block or a line end needs its CR: walks the records one
// by one but still writes the runs between those points at once.
CopyStep RecordCopier::copyLineByLine(const char* data, std::size_t end) {
    std::size_t p = 0;
    std::size_t run = 0;
    while (p < end) {
        if (inFile_ >= perFile_) {
            if (run < p && !out_.write(data + run, p - run)) return CopyStep::Fail;
            run = p;
            if (const CopyStep s = makeRoom(); s != CopyStep::Go) return s;
        }
        const auto* lf = static_cast<const char*>(std::memchr(data + p, '\n', end - p));
        const std::size_t e = static_cast<std::size_t>(lf - data);
        if (e == 0 || data[e - 1] != '\r') {
            if (!out_.write(data + run, e - run) || !out_.write("\r\n", 2)) return CopyStep::Fail;
            run = e + 1;
        }
        p = e + 1;
        ++inFile_;
        ++copied_;
    }
    if (run < end && !out_.write(data + run, end - run)) return CopyStep::Fail;
    return CopyStep::Go;
}

CopyStep RecordCopier::copyRecordPiece(const char* data, std::size_t count, bool continued) {
    if (!continued) {
        if (const CopyStep s = makeRoom(); s != CopyStep::Go) return s;
        pieceBytes_ = 0;
    }
    pieceBytes_ += count;
    return out_.write(data, count) ? CopyStep::Go : CopyStep::Fail;
}

CopyStep RecordCopier::dropCutRecord(std::size_t count, bool continued) {
    cutBytes_ = count + (continued ? pieceBytes_ : 0);
    if (!continued) return CopyStep::Go;
    // A file opened for the cut record alone holds none of the split's records.
    if (inFile_ == 0 && files_ > 1) {
        --files_;
        if (options_.progress) options_.progress->files.store(files_, std::memory_order_relaxed);
        return out_.discard() ? CopyStep::Go : CopyStep::Fail;
    }
    return out_.dropLast(pieceBytes_) ? CopyStep::Go : CopyStep::Fail;
}

SplitResult RecordCopier::finish(SplitStatus status, const std::string& failure) {
    SplitResult r{status, files_, {}, cutBytes_};
    if (status == SplitStatus::Failed) {
        r.message = failure.empty() ? out_.error() : failure;
        out_.close();
    } else if (!out_.close()) {
        r.status = SplitStatus::Failed;
        r.message = out_.error();
    }
    return r;
}

}  // namespace tarn
