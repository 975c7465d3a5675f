// What the program does with the checkpoint file when it starts: makes sure a readable one
// exists, and says whether to tell the user about a job that was stopped below its limit.
#pragma once

#include <string>

namespace tarn {

struct StartupCheck {
    bool showInterruptedPrompt = false;  // show kInterruptedPrompt (generation/texts.hpp)
    // "The file <path> could not be read: <reason>." when the checkpoint is there but could not
    // be read; shown as an "Info" message. Empty otherwise.
    std::string readFailure{};
};

// A missing or malformed checkpoint is replaced by the fresh one (101, 100, 0) without a word.
// One that could not be read is left as it is, since it may still name a job to resume.
StartupCheck checkCheckpointAtStartup(const std::string& folder);

}  // namespace tarn
