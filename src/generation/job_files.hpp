// The two files a generation job writes, behind one interface: tests stand in for it to fail a
// chosen write, flush or checkpoint, or to act on the files between two checkpoints.
#pragma once

#include <memory>
#include <string>

#include "generation/checkpoint_file.hpp"
#include "generation/results_sink.hpp"

namespace tarn {

class JobFiles {
public:
    virtual ~JobFiles() = default;
    // Returns nothing and the error number on failure (see openResultsFile).
    virtual std::unique_ptr<ResultsSink> openResults(const std::string& path, bool append,
                                                     int& error) {
        return openResultsFile(path, append, error);
    }
    // Replaces the checkpoint durably; returns "" or the system's reason (see writeCheckpoint).
    virtual std::string saveCheckpoint(const std::string& path, const Checkpoint& checkpoint) {
        return writeCheckpoint(path, checkpoint);
    }
};

}  // namespace tarn
