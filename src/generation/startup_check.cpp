// Only the checkpoint's three numbers are looked at here; the results file is checked when the
// user actually resumes.
#include "generation/startup_check.hpp"

#include "core/app_folder.hpp"
#include "generation/checkpoint_file.hpp"
#include "generation/file_names.hpp"

namespace tarn {

StartupCheck checkCheckpointAtStartup(const std::string& folder) {
    const std::string path = folder + kCheckpointFileName;
    const auto checkpoint = FileExists(path) ? readCheckpoint(path) : std::nullopt;
    if (!checkpoint) {
        // Nothing is reported when this fails too (a read-only folder): start-up goes on, and
        // the next job's checkpoint write reports the problem.
        writeCheckpoint(path, kFreshCheckpoint);
        return {};
    }
    return {checkpoint->interrupted == 1 && checkpoint->candidate < checkpoint->limit};
}

}  // namespace tarn
