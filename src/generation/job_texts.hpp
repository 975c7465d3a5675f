// The messages of the generation job, word for word, and the job's own lower bound. Kept in one
// place so that the window, the command line and the tests show the same words.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace tarn {

inline constexpr std::int64_t kGenerationMinimum = 100;
inline constexpr std::string_view kMinimumMessage = "Minimum value is 100";
// Told when the user stops a job (or the Test command, which shares the window's stop).
inline constexpr std::string_view kAllStoppedMessage = "All calculations were stopped!";

}  // namespace tarn
