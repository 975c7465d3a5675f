// Splits the results file into primes1.txt, primes2.txt ... of a fixed number of records each.
// The copy streams the file through one large buffer: it counts line ends with a vectorised
// pass, finds a file's last record with memchr only where a file ends, and hands whole runs
// of records to the system in single writes, so memory stays constant whatever the file size.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>

#include "core/stop_signal.hpp"
#include "platform/files.hpp"
#include "tools/config.hpp"
#include "tools/texts.hpp"

namespace tarn {

// Writes up to count bytes to the file like the system's write: the bytes taken, or -1 with the
// error number in `error`.
using SplitWriteFunction = std::function<std::ptrdiff_t(platform::File& file, const char* bytes,
                                                        std::size_t count, int& error)>;

// The folder text as shown to the user, a separator and "primes", joined as they stand:
// a root that already ends in the separator gives a doubled one ("/" gives "//primes").
std::string splitNamePrefix(const std::string& folderText);
// The prefix, the file's number in plain digits and ".txt".
std::string splitFileName(const std::string& namePrefix, std::int64_t fileNumber);

enum class SplitStatus { Completed, Stopped, Failed };

struct SplitResult {
    SplitStatus status = SplitStatus::Completed;
    std::int64_t files = 0;      // output files opened, the first one always counting
    std::string message;         // for Failed: the file and the system's reason
    std::uint64_t cutBytes = 0;  // after the input's last line end: a cut record, left out
};

// What a running split has done so far, read by a progress display on another thread.
struct SplitProgress {
    std::atomic<std::int64_t> bytesRead{0};  // of the results file
    std::atomic<std::int64_t> files{0};      // output files opened
};

struct SplitOptions {
    std::size_t blockSize = kSplitBlockSize;  // bytes read at once; small values only in tests
    // Called at every point where the split looks at the stop signal, with the number of
    // records copied so far; lets a caller show progress or raise the stop at an exact record.
    std::function<void(std::int64_t)> onStopPoint;
    // Takes the place of the system's write for the output files (empty: the system's own);
    // lets tests take a few bytes at a time or fail at a chosen byte.
    SplitWriteFunction writeSome;
    SplitProgress* progress = nullptr;  // kept up to date when given
};

// Copies every record of resultsPath unchanged, each line ended by CR LF, into files named
// by splitFileName(namePrefix, n). A new file is opened only when a record is there for it,
// so an evenly divided count leaves no empty last file; an empty results file gives one empty
// first file. The stop is looked at between records only (at block and file boundaries), so
// a stopped split leaves complete records, the last file holding those it had received. Bytes
// after the last line end are a record cut short (a killed job): they are left out and counted.
SplitResult splitResultsFile(const std::string& resultsPath, const std::string& namePrefix,
                             std::int64_t recordsPerFile, const StopSignal& stop,
                             const SplitOptions& options = {});

}  // namespace tarn
