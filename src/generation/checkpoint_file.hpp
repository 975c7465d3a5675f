// The checkpoint file: one line " Candidate  Limit  Interrupted " ended by CR LF, saying where
// the last job stood, its limit, and whether it was stopped (1) or ran to its end (0).
// It is always written to a temporary file that is then renamed over the real one, so a
// crash at any moment leaves either the old line or the new one, never a torn file.
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace tarn {

struct Checkpoint {
    std::int64_t candidate = 101;
    std::int64_t limit = 100;
    int interrupted = 0;  // a 16-bit field: readers accept -32768 to 32767

    bool operator==(const Checkpoint&) const = default;
};

// What start-up writes when there is no checkpoint: a finished job with the smallest limit.
inline constexpr Checkpoint kFreshCheckpoint{101, 100, 0};

// The exact bytes of the line: " 101  100  0 \r\n".
std::string checkpointLine(const Checkpoint& checkpoint);

// Reads the three numbers; nothing when the file is missing, unreadable, has fewer than three
// numbers, or a number too large for its field.
std::optional<Checkpoint> readCheckpoint(const std::string& path);

// Writes the line durably through a temporary file and a rename. Returns an empty text on
// success, otherwise the system's reason.
std::string writeCheckpoint(const std::string& path, const Checkpoint& checkpoint);

}  // namespace tarn
