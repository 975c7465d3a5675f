#include "cli/entry_batch.hpp"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <string_view>

#include "core/entry.hpp"

namespace tarn::cli {
namespace {

constexpr std::size_t kFlushSize = 1 << 16;

void writeAll(int fd, std::string_view data) {
    while (!data.empty()) {
        const ssize_t written = ::write(fd, data.data(), data.size());
        if (written < 0) {
            if (errno == EINTR) continue;
            return;  // a closed pipe: nothing more can be said
        }
        data.remove_prefix(static_cast<std::size_t>(written));
    }
}

class Batch {
public:
    Batch(Context& ctx, const EntryWork& work) : ctx_(ctx), work_(work) {
        out_.reserve(2 * kFlushSize);
    }
    ~Batch() { flush(); }

    // False when the batch has to end.
    bool entry(std::string_view text) {
        if (ctx_.stop.requested()) return stopped();
        const EntryResult result = ReadNumberEntry(text, '.');
        if (!result.accepted()) {
            flush();  // keep the message next to the lines it follows
            std::string message = result.message + '\n';
            writeAll(STDERR_FILENO, message);
            refused_ = true;
            return true;
        }
        if (!work_(result.number->whole(), out_)) return stopped();
        if (out_.size() >= kFlushSize) flush();
        return true;
    }

    bool stopped() {
        stopped_ = true;
        return false;
    }

    int exitCode() const { return stopped_ ? kStopped : refused_ ? kRefused : kOk; }

    void flush() {
        writeAll(STDOUT_FILENO, out_);
        out_.clear();
    }

private:
    Context& ctx_;
    const EntryWork& work_;
    std::string out_;
    bool refused_ = false;
    bool stopped_ = false;
};

// Feeds every line of standard input to the batch. Blank lines are passed over; a carriage
// return before the newline is dropped.
void readLines(Batch& batch, Context& ctx) {
    std::string pending;
    char block[1 << 16];
    for (;;) {
        const ssize_t got = ::read(STDIN_FILENO, block, sizeof block);
        if (got < 0) {
            if (errno == EINTR && !ctx.stop.requested()) continue;
            if (errno == EINTR) batch.stopped();
            return;
        }
        if (got == 0) break;
        std::string_view data(block, static_cast<std::size_t>(got));
        while (!data.empty()) {
            const std::size_t newline = data.find('\n');
            if (newline == std::string_view::npos) {
                pending.append(data);
                break;
            }
            std::string_view line = data.substr(0, newline);
            data.remove_prefix(newline + 1);
            if (!pending.empty()) {
                pending.append(line);
                line = pending;
            }
            if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
            const bool goOn = line.empty() || batch.entry(line);
            pending.clear();
            if (!goOn) return;
        }
    }
    std::string_view last = pending;
    if (!last.empty() && last.back() == '\r') last.remove_suffix(1);
    if (!last.empty()) batch.entry(last);
}

}  // namespace

int runEntryBatch(Context& ctx, const std::vector<std::string>& arguments, const EntryWork& work) {
    Batch batch(ctx, work);
    if (arguments.empty()) {
        readLines(batch, ctx);
    } else {
        for (const std::string& text : arguments) {
            if (!batch.entry(text)) break;
        }
    }
    batch.flush();
    return batch.exitCode();
}

}  // namespace tarn::cli
