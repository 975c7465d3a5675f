#include "tools/split_results.hpp"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string_view>
#include <utility>
#include <vector>

#include "core/app_folder.hpp"
#include "core/file_messages.hpp"
#include "core/number.hpp"

namespace tarn {
namespace {

// One output file. Runs of whole records go to the system as they stand; the small pieces
// that mend bare line ends are gathered first so that they do not cost a write each. Staged
// bytes always go out before a run that bypasses the staging, so the order is the input's.
class OutputFile {
public:
    explicit OutputFile(const SplitWriteFunction& writeSome)
        : writeSome_(writeSome), staging_(kSplitStagingSize) {}
    ~OutputFile() {
        if (fd_ >= 0) ::close(fd_);
    }
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    bool open(std::string name) {
        name_ = std::move(name);
        errno = 0;
        fd_ = ::open(name_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
        return fd_ >= 0 || fail(errno);
    }

    bool write(const char* bytes, std::size_t count) {
        if (count >= staging_.size() / 2) return flush() && put(bytes, count);
        if (used_ + count > staging_.size() && !flush()) return false;
        std::memcpy(staging_.data() + used_, bytes, count);
        used_ += count;
        return true;
    }

    bool close() {
        bool ok = flush();
        if (fd_ >= 0) {
            errno = 0;
            if (::close(fd_) != 0 && ok) ok = fail(errno);
            fd_ = -1;
        }
        return ok;
    }

    const std::string& error() const { return error_; }

private:
    bool flush() {
        const std::size_t count = used_;
        used_ = 0;
        return count == 0 || put(staging_.data(), count);
    }
    // The system may take less than asked (a full disk, a signal): the rest is offered again
    // until it is all written or the system refuses with a reason.
    bool put(const char* bytes, std::size_t count) {
        while (count > 0) {
            errno = 0;
            const ssize_t done =
                writeSome_ ? writeSome_(fd_, bytes, count) : ::write(fd_, bytes, count);
            if (done < 0 && errno == EINTR) continue;
            // A write that takes nothing would be offered again forever.
            if (done <= 0) return fail(done < 0 ? errno : 0);
            bytes += done;
            count -= static_cast<std::size_t>(done);
        }
        return true;
    }
    bool fail(int err) {
        error_ = fileWriteFailure(name_, systemReason(err));
        return false;
    }

    const SplitWriteFunction& writeSome_;
    int fd_ = -1;
    std::string name_;
    std::string error_;
    std::vector<char> staging_;
    std::size_t used_ = 0;
};

struct InputFile {
    explicit InputFile(int descriptor) : fd(descriptor) {}
    ~InputFile() {
        if (fd >= 0) ::close(fd);
    }
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;
    int fd;
};

// Line ends in [begin, end), and how many of them lack the CR before them. Written as plain
// loops so that the compiler vectorises them: this is the pass every byte goes through.
struct LineCount {
    std::size_t lines = 0;
    std::size_t bare = 0;
};

LineCount countLines(const char* data, std::size_t begin, std::size_t end) {
    LineCount c;
    if (begin == end) return c;
    // A line end at the very start of the buffer has nothing before it in this block; the
    // split never leaves a CR behind it (see the long-record path), so it counts as bare.
    std::size_t i = begin;
    if (i == 0) {
        const bool lf = data[0] == '\n';
        c.lines += lf;
        c.bare += lf;
        i = 1;
    }
    std::size_t lines = 0, bare = 0;
    for (; i < end; ++i) {
        const bool lf = data[i] == '\n';
        lines += lf;
        bare += lf & (data[i - 1] != '\r');
    }
    c.lines += lines;
    c.bare += bare;
    return c;
}

// The copy itself; holds the state that crosses block boundaries.
class Splitter {
public:
    Splitter(std::string prefix, std::int64_t recordsPerFile, const StopSignal& stop,
             const SplitOptions& options)
        : prefix_(std::move(prefix)),
          perFile_(recordsPerFile),
          stop_(stop),
          options_(options),
          out_(options.writeSome) {}

    SplitResult run(const std::string& resultsPath);

private:
    enum class Step { Go, Stop, Fail };

    // The stop is looked at only between records.
    bool stopHere() {
        if (options_.onCheckpoint) options_.onCheckpoint(copied_);
        return stop_.requested();
    }
    Step openNext() {
        if (files_ > 0 && !out_.close()) return Step::Fail;
        ++files_;
        inFile_ = 0;
        return out_.open(splitFileName(prefix_, files_)) ? Step::Go : Step::Fail;
    }
    // Before a record goes out: when the current file is full, the next one is opened, but
    // only after the stop was looked at, so a stopped split opens no file it cannot fill.
    Step makeRoom() {
        if (inFile_ < perFile_) return Step::Go;
        if (stopHere()) return Step::Stop;
        return openNext();
    }
    Step copyBlock(const char* data, std::size_t end);
    Step copyLineByLine(const char* data, std::size_t p, std::size_t end);
    Step copyLastFragment(const char* data, std::size_t count);

    SplitResult finish(SplitStatus status) {
        SplitResult r{status, files_, {}};
        if (status == SplitStatus::Failed) {
            r.message = failure_.empty() ? out_.error() : failure_;
            out_.close();
        } else if (!out_.close()) {
            r.status = SplitStatus::Failed;
            r.message = out_.error();
        }
        return r;
    }

    std::string prefix_;
    std::int64_t perFile_;
    const StopSignal& stop_;
    const SplitOptions& options_;
    OutputFile out_;
    std::int64_t files_ = 0;
    std::int64_t inFile_ = 0;
    std::int64_t copied_ = 0;
    std::string failure_;
};

Splitter::Step Splitter::copyBlock(const char* data, std::size_t end) {
    const LineCount c = countLines(data, 0, end);
    const auto room = static_cast<std::uint64_t>(perFile_ - inFile_);
    if (c.bare == 0 && c.lines <= room && inFile_ < perFile_) {
        // The usual case: the whole block belongs to the current file as it stands.
        if (!out_.write(data, end)) return Step::Fail;
        inFile_ += static_cast<std::int64_t>(c.lines);
        copied_ += static_cast<std::int64_t>(c.lines);
        return Step::Go;
    }
    return copyLineByLine(data, 0, end);
}

// Used where a file ends inside the block or a line end needs its CR: walks the records one
// by one but still writes the runs between those points at once.
Splitter::Step Splitter::copyLineByLine(const char* data, std::size_t p, std::size_t end) {
    std::size_t run = p;
    while (p < end) {
        if (inFile_ >= perFile_) {
            if (run < p && !out_.write(data + run, p - run)) return Step::Fail;
            run = p;
            if (const Step s = makeRoom(); s != Step::Go) return s;
        }
        const auto* lf = static_cast<const char*>(std::memchr(data + p, '\n', end - p));
        const std::size_t e = static_cast<std::size_t>(lf - data);
        if (e == 0 || data[e - 1] != '\r') {
            if (!out_.write(data + run, e - run) || !out_.write("\r\n", 2)) return Step::Fail;
            run = e + 1;
        }
        p = e + 1;
        ++inFile_;
        ++copied_;
    }
    if (run < end && !out_.write(data + run, end - run)) return Step::Fail;
    return Step::Go;
}

// A last record without a line end gets one, like every other line of the output.
Splitter::Step Splitter::copyLastFragment(const char* data, std::size_t count) {
    if (const Step s = makeRoom(); s != Step::Go) return s;
    if (!out_.write(data, count)) return Step::Fail;
    const bool endsInCr = count > 0 && data[count - 1] == '\r';
    if (!out_.write(endsInCr ? "\n" : "\r\n", endsInCr ? 1 : 2)) return Step::Fail;
    ++inFile_;
    ++copied_;
    return Step::Go;
}

SplitResult Splitter::run(const std::string& resultsPath) {
    errno = 0;
    const InputFile in(::open(resultsPath.c_str(), O_RDONLY | O_CLOEXEC));
    if (in.fd < 0) {
        const int err = errno;
        failure_ = err == ENOENT ? "The results file " + resultsPath + " was not found."
                                 : fileReadFailure(resultsPath, systemReason(err));
        return {SplitStatus::Failed, 0, failure_};
    }
    if (openNext() != Step::Go) return finish(SplitStatus::Failed);

    const std::size_t capacity = std::max<std::size_t>(options_.blockSize, 2);
    std::vector<char> buffer(capacity);
    char* const data = buffer.data();
    std::size_t carry = 0;  // bytes of a record whose line end has not been read yet
    bool partial = false;   // that record's beginning already went out (longer than a block)
    for (;;) {
        if (!partial && stopHere()) return finish(SplitStatus::Stopped);
        // One plain read: from a pipe it answers with what is there, so a stop raised while
        // the split waits for more is seen as soon as the read returns.
        const ssize_t got = ::read(in.fd, data + carry, capacity - carry);
        if (got < 0) {
            // A signal (the command line's Ctrl-C) broke the wait: look at the stop again.
            if (errno == EINTR) continue;
            failure_ = fileReadFailure(resultsPath, systemReason(errno));
            return finish(SplitStatus::Failed);
        }
        if (got == 0) {
            if (carry > 0 || partial) {
                const Step s = copyLastFragment(data, carry);
                if (s != Step::Go)
                    return finish(s == Step::Stop ? SplitStatus::Stopped : SplitStatus::Failed);
            }
            return finish(SplitStatus::Completed);
        }
        const std::size_t length = carry + static_cast<std::size_t>(got);
        const std::size_t lastLf = std::string_view(data, length).rfind('\n');
        if (lastLf == std::string_view::npos) {
            if (length < capacity) {
                carry = length;
                continue;
            }
            // A record longer than the whole buffer: pass its beginning on now. A trailing CR
            // stays behind so that a CR LF torn apart by the block edge is still one line end.
            if (!partial) {
                if (const Step s = makeRoom(); s != Step::Go)
                    return finish(s == Step::Stop ? SplitStatus::Stopped : SplitStatus::Failed);
            }
            const std::size_t keep = data[length - 1] == '\r' ? 1 : 0;
            if (!out_.write(data, length - keep)) return finish(SplitStatus::Failed);
            if (keep) data[0] = '\r';
            carry = keep;
            partial = true;
            continue;
        }
        const std::size_t end = lastLf + 1;
        if (const Step s = copyBlock(data, end); s != Step::Go)
            return finish(s == Step::Stop ? SplitStatus::Stopped : SplitStatus::Failed);
        partial = false;
        carry = length - end;
        std::memmove(data, data + end, carry);
    }
}

}  // namespace

std::string splitNamePrefix(const std::string& folderText) {
    return folderText + kPathSeparator + "primes";
}

std::string splitFileName(const std::string& namePrefix, std::int64_t fileNumber) {
    return namePrefix + trimmedText(Number::fromWhole(fileNumber)) + ".txt";
}

SplitResult splitResultsFile(const std::string& resultsPath, const std::string& namePrefix,
                             std::int64_t recordsPerFile, const StopSignal& stop,
                             const SplitOptions& options) {
    Splitter splitter(namePrefix, std::max<std::int64_t>(recordsPerFile, 1), stop, options);
    return splitter.run(resultsPath);
}

std::string splitDoneMessage(std::int64_t files) {
    return "Done!!!" + signedText(Number::fromWhole(files)) + " files were created.";
}

}  // namespace tarn
