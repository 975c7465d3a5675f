// The checkpoint file: one line " Candidate  Limit  Interrupted " ended by CR LF, saying where
// the last job stood, its limit, and whether it was stopped (1) or ran to its end (0).
// It is always written to a temporary file that is then renamed over the real one, so a
// crash at any moment leaves either the old line or the new one, never a torn file.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

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

// What reading the checkpoint found. Only a missing or malformed file may be replaced: one that
// could not be read may still hold a job that can be resumed.
struct CheckpointRead {
    enum class Status {
        Read,        // `checkpoint` holds the three numbers
        Missing,     // no file of that name
        Malformed,   // fewer than three numbers, or a number too large for its field
        Unreadable,  // the file is there but could not be read: `error` says why
    };
    Status status = Status::Missing;
    std::optional<Checkpoint> checkpoint{};  // set exactly when Read
    int error = 0;                           // the system's error number when Unreadable
};

// A checkpoint line is a few dozen bytes. Only this much of a file is read, so a damaged one of
// any size costs no more; three numbers that do not stand within it make the file malformed.
inline constexpr std::size_t kCheckpointReadLimit = 4096;
CheckpointRead readCheckpoint(const std::string& path);

// The three numbers at the start of `text`, or nothing when they are not there; `cut` when the
// file goes on beyond `text`.
std::optional<Checkpoint> parseCheckpoint(std::string_view text, bool cut = false);

// Writes the line durably through a temporary file and a rename. Returns an empty text on
// success, otherwise the system's reason.
std::string writeCheckpoint(const std::string& path, const Checkpoint& checkpoint);

}  // namespace tarn
