// Reads a results file back before a resume: counts its records, learns their form, and checks
// everything the resume relies on, without trusting the file. The scan stops at the first record
// beyond the checkpoint's candidate; that record and everything after it, like a torn last line
// left by a killed job, are to be cut off and generated again.
// It runs at the speed of the disk, and at gigabytes a second from the page cache.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "core/stop_signal.hpp"
#include "generation/config.hpp"
#include "generation/scan/scan_outcome.hpp"

namespace tarn {

// Checks that the records are numbers in one form, increasing, serially numbered from 1 when
// enumerated, start with the seeds 2, 3, 5, 7, and end with the largest prime at or below
// resumePoint. Reads blocks of `blockBytes` and looks at `stop` before each (tests make blocks
// small, to put their boundaries anywhere in short files). In 1 MiB the bytes stay in the cache
// between the copy from the system and the check; larger blocks measured no faster.
ResultsScan scanResults(const std::string& path, std::int64_t resumePoint, const StopSignal& stop,
                        std::size_t blockBytes = kResultsScanBlockBytes);

}  // namespace tarn
