// What the program does with the checkpoint file when it starts: makes sure a readable one
// exists, and says whether to tell the user about a job that was stopped below its limit.
#pragma once

#include <string>

namespace tarn {

struct StartupCheck {
    bool showInterruptedPrompt = false;  // show kInterruptedPrompt (resume_texts.hpp)
};

// A missing or unreadable checkpoint is replaced by the fresh one (101, 100, 0) without a word.
StartupCheck checkCheckpointAtStartup(const std::string& folder);

}  // namespace tarn
