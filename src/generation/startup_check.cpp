// Only the checkpoint's three numbers are looked at here; the results file is checked when the
// user actually resumes.
#include "generation/startup_check.hpp"

#include "core/file_names.hpp"
#include "core/texts.hpp"
#include "generation/checkpoint_file.hpp"

namespace tarn {

StartupCheck checkCheckpointAtStartup(const std::string& folder) {
    const std::string path = checkpointFilePath(folder);
    const CheckpointRead read = readCheckpoint(path);
    switch (read.status) {
        case CheckpointRead::Status::Unreadable:
            return {.readFailure = fileReadFailure(path, systemReason(read.error))};
        case CheckpointRead::Status::Missing:
        case CheckpointRead::Status::Malformed:
            // Nothing is reported when this fails too (a read-only folder): start-up goes on,
            // and the next job's checkpoint write reports the problem.
            writeCheckpoint(path, kFreshCheckpoint);
            return {};
        case CheckpointRead::Status::Read:
            break;
    }
    const Checkpoint& checkpoint = *read.checkpoint;
    return {.showInterruptedPrompt =
                checkpoint.interrupted == 1 && checkpoint.candidate < checkpoint.limit};
}

}  // namespace tarn
