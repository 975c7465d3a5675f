// Deals whole records out to primes1.txt, primes2.txt ... and mends bare line ends to CR LF.
// A block whose records all fit the current file and need no mending goes out in one write;
// only a block where a file ends or a line end lacks its CR is walked record by record.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "core/stop_signal.hpp"
#include "tools/split_output_file.hpp"
#include "tools/split_results.hpp"

namespace tarn {

enum class CopyStep { Go, Stop, Fail };

// The status a split ends with after a step that did not go on.
inline SplitStatus endStatus(CopyStep step) {
    return step == CopyStep::Stop ? SplitStatus::Stopped : SplitStatus::Failed;
}

class RecordCopier {
public:
    RecordCopier(std::string namePrefix, std::int64_t recordsPerFile, const StopSignal& stop,
                 const SplitOptions& options);

    // Opens the first output file; an empty input still leaves it behind.
    CopyStep openFirst() { return openNext(); }
    // Tells the caller of the records copied so far and looks at the stop. The stop is looked at
    // only between records.
    bool stopHere();

    // The whole records in data[0, end): `end` is just past a line end.
    CopyStep copyBlock(const char* data, std::size_t end);
    // A piece of a record longer than the read buffer; `continued` when an earlier piece of the
    // same record already went out.
    CopyStep copyRecordPiece(const char* data, std::size_t count, bool continued);
    // The input ended inside a record: a cut record is no record, so what of it already went out
    // (`continued`) is taken back. `count` bytes of it were still held.
    CopyStep dropCutRecord(std::size_t count, bool continued);

    // Closes the current file and gives the result; `failure` is the message of a failure that
    // was not the output's own (a read that failed).
    SplitResult finish(SplitStatus status, const std::string& failure = {});

private:
    CopyStep openNext();
    CopyStep makeRoom();
    CopyStep copyLineByLine(const char* data, std::size_t end);

    std::string prefix_;
    std::int64_t perFile_;
    const StopSignal& stop_;
    const SplitOptions& options_;
    SplitOutputFile out_;
    std::int64_t files_ = 0;
    std::int64_t inFile_ = 0;
    std::int64_t copied_ = 0;
    std::uint64_t pieceBytes_ = 0;  // of a record longer than a block, already out
    std::uint64_t cutBytes_ = 0;    // of a cut last record, left out
};

}  // namespace tarn
