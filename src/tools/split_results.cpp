// The split's read loop: the results file streams through one buffer of fixed size, whole
// records go to the RecordCopier block by block, and only the part of a record that a block
// edge cut off is carried over, so memory stays constant whatever the file size.
#include "tools/split_results.hpp"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <string_view>
#include <vector>

#include "core/app_folder.hpp"
#include "core/number.hpp"
#include "core/texts.hpp"
#include "tools/split_records.hpp"
#include "tools/texts.hpp"

namespace tarn {
namespace {

// The smallest buffer that works: a CR kept back from a long record plus one new byte.
constexpr std::size_t kMinimumBlockSize = 2;

SplitResult copyRecords(const std::string& resultsPath, RecordCopier& copier,
                        const SplitOptions& options) {
    int err = 0;
    platform::File in = platform::File::open(resultsPath, platform::File::Mode::Read, err);
    if (err != 0) {
        return {SplitStatus::Failed, 0,
                err == ENOENT ? resultsNotFoundMessage(resultsPath)
                              : fileReadFailure(resultsPath, systemReason(err))};
    }
    if (copier.openFirst() != CopyStep::Go) return copier.finish(SplitStatus::Failed);

    const std::size_t capacity = std::max(options.blockSize, kMinimumBlockSize);
    std::vector<char> buffer(capacity);
    char* const data = buffer.data();
    std::size_t carry = 0;  // bytes of a record whose line end has not been read yet
    bool partial = false;   // that record's beginning already went out (longer than a block)
    for (;;) {
        if (!partial && copier.stopHere()) return copier.finish(SplitStatus::Stopped);
        // One plain read: from a pipe it answers with what is there, so a stop raised while
        // the split waits for more is seen as soon as the read returns.
        const std::ptrdiff_t got = in.read(data + carry, capacity - carry, err);
        if (got < 0) {
            // A signal (the command line's Ctrl-C) broke the wait: look at the stop again.
            if (err == EINTR) continue;
            return copier.finish(SplitStatus::Failed,
                                 fileReadFailure(resultsPath, systemReason(err)));
        }
        if (options.progress) options.progress->bytesRead.fetch_add(got, std::memory_order_relaxed);
        if (got == 0) {
            if (carry > 0 || partial) {
                const CopyStep s = copier.dropCutRecord(carry, partial);
                if (s != CopyStep::Go) return copier.finish(endStatus(s));
            }
            return copier.finish(SplitStatus::Completed);
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
            const std::size_t keep = data[length - 1] == '\r' ? 1 : 0;
            const CopyStep s = copier.copyRecordPiece(data, length - keep, partial);
            if (s != CopyStep::Go) return copier.finish(endStatus(s));
            if (keep) data[0] = '\r';
            carry = keep;
            partial = true;
            continue;
        }
        const std::size_t end = lastLf + 1;
        if (const CopyStep s = copier.copyBlock(data, end); s != CopyStep::Go)
            return copier.finish(endStatus(s));
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
    RecordCopier copier(namePrefix, std::max<std::int64_t>(recordsPerFile, 1), stop, options);
    return copyRecords(resultsPath, copier, options);
}

}  // namespace tarn
