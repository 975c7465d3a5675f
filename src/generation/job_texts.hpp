// The messages of the generation job, word for word, and the job's own lower bound.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "core/number.hpp"

namespace tarn {

inline constexpr std::int64_t kGenerationMinimum = 100;
inline constexpr std::string_view kMinimumMessage = "Minimum value is 100";
// Told when the user stops a job (or the Test command, which shares the window's stop).
inline constexpr std::string_view kAllStoppedMessage = "All calculations were stopped!";

// "Minimum value is 100" for a whole number below 100, nothing otherwise.
std::optional<std::string> checkGenerationMinimum(std::int64_t whole);
std::optional<std::string> checkGenerationMinimum(const Number& number);

}  // namespace tarn
