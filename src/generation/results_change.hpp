// A results file cut or grown under a running job: what of it a resume can still continue (what
// to tell the user: texts.hpp).
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "generation/checkpoint_file.hpp"
#include "generation/results_sink.hpp"

namespace tarn {

struct KeptRecords {
    std::uint64_t bytes = 0;  // where the last whole record ends
    Checkpoint checkpoint;    // nothing to continue unless the seeds are all there
};

// Of the first `trusted` bytes of the file (the job's own), the whole records, and the checkpoint
// of the last whole turn before the last of them: a resume cuts that turn's records and writes
// them again. Nothing when the file cannot be read back.
std::optional<KeptRecords> keptRecords(const std::string& path, std::uint64_t trusted,
                                       std::int64_t limit);

}  // namespace tarn
