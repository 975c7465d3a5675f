#include "cli/entry_batch.hpp"

#include <cerrno>
#include <cstdio>
#include <string_view>

#include "cli/config.hpp"
#include "cli/input_lines.hpp"
#include "cli/standard_output.hpp"
#include "cli/texts.hpp"
#include "core/entry.hpp"
#include "platform/process.hpp"

namespace tarn::cli {
namespace {

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
        if (!result.accepted()) return refuse(result.message);
        if (!work_(result.number->whole(), out_)) return stopped();
        return out_.size() < kFlushSize || flush();
    }

    bool refuse(const std::string& text) {
        if (ctx_.stop.requested()) return stopped();
        if (!flush()) return false;  // keep the message next to the lines it follows
        std::string message = text + '\n';
        platform::writeAll(platform::Stream::Error, message);
        refused_ = true;
        return true;
    }

    bool stopped() {
        stopped_ = true;
        return false;
    }

    // A failed write outranks the rest: the main program tells its reason.
    int exitCode() const {
        return failed_ ? kIoFailure : stopped_ ? kStopped : refused_ ? kRefused : kOk;
    }

    // False when standard output could not take the lines: the batch ends there.
    bool flush() {
        failed_ = !writeStandardOutput(out_);
        out_.clear();
        return !failed_;
    }

private:
    Context& ctx_;
    const EntryWork& work_;
    std::string out_;
    bool refused_ = false;
    bool stopped_ = false;
    bool failed_ = false;
};

// Feeds every line of standard input to the batch: blank lines are passed over, and a line too
// long to be an entry is refused by its number without being held.
void readLines(Batch& batch, Context& ctx) {
    InputLines lines([&batch](std::int64_t number, std::string_view line, bool tooLong) {
        return tooLong ? batch.refuse(longLineRefusal(number, kLongestInputLine))
                       : batch.entry(line);
    });
    char block[kInputBlock];
    for (;;) {
        int error = 0;
        const std::ptrdiff_t got = platform::readInput(block, sizeof block, error);
        if (got < 0) {
            if (error == EINTR && !ctx.stop.requested()) continue;
            if (error == EINTR) batch.stopped();
            return;
        }
        if (got == 0) break;
        if (!lines.feed(std::string_view(block, static_cast<std::size_t>(got)))) return;
    }
    lines.finish();
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
