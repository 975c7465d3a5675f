// Reads and writes the checkpoint line. The reader refuses a number that does not fit its field
// instead of wrapping it; the writer goes through a synced temporary file and a rename, so a
// crash leaves the old line or the new one.
#include "generation/checkpoint_file.hpp"

#include <cerrno>
#include <climits>
#include <cstring>

#include "core/number.hpp"
#include "core/texts.hpp"
#include "platform/files.hpp"

namespace tarn {
namespace {

// One number as the reader takes it: blanks and line ends before it are skipped; it ends at a
// blank, a comma or the end of a line. One that runs into the cut of a longer file may go on.
std::optional<std::int64_t> nextNumber(std::string_view text, bool cut, std::size_t& pos,
                                       std::int64_t low, std::int64_t high) {
    while (pos < text.size() &&
           (text[pos] == ' ' || text[pos] == '\t' || text[pos] == '\r' || text[pos] == '\n'))
        ++pos;
    bool negative = false;
    if (pos < text.size() && (text[pos] == '-' || text[pos] == '+')) negative = text[pos++] == '-';
    std::size_t digits = 0;
    __int128 value = 0;
    while (pos < text.size() && text[pos] >= '0' && text[pos] <= '9') {
        value = value * 10 + (text[pos++] - '0');
        if (value > static_cast<__int128>(INT64_MAX) + 1) return std::nullopt;
        ++digits;
    }
    if (digits == 0 || (cut && pos == text.size())) return std::nullopt;
    if (pos < text.size() && !(text[pos] == ' ' || text[pos] == ',' || text[pos] == '\r' ||
                               text[pos] == '\n' || text[pos] == '\t'))
        return std::nullopt;
    if (pos < text.size() && text[pos] == ',') ++pos;
    if (negative) value = -value;
    if (value < low || value > high) return std::nullopt;
    return static_cast<std::int64_t>(value);
}

// Up to kCheckpointReadLimit bytes of the file into `text`, and whether the file goes on beyond
// them; the system's error number, or 0 once it is read. Opened without waiting, so that a pipe in
// the file's place cannot hold up the program.
int readFileStart(const std::string& path, std::string& text, bool& cut) {
    int error = 0;
    platform::File file = platform::File::open(path, platform::File::Mode::ReadNoWait, error);
    if (error != 0) return error;
    char block[kCheckpointReadLimit + 1];
    std::size_t size = 0;
    while (size < sizeof block) {
        const std::ptrdiff_t got = file.read(block + size, sizeof block - size, error);
        if (got > 0) {
            size += static_cast<std::size_t>(got);
        } else if (got == 0) {
            break;
        } else if (error != EINTR) {
            return error;  // a folder in the file's place gives EISDIR here
        }
    }
    cut = size > kCheckpointReadLimit;
    text.assign(block, cut ? kCheckpointReadLimit : size);
    return 0;
}

}  // namespace

std::string checkpointLine(const Checkpoint& c) {
    std::string line;
    for (const std::int64_t v : {c.candidate, c.limit, static_cast<std::int64_t>(c.interrupted)}) {
        if (v >= 0) line += ' ';  // the blank stands where a minus sign would
        line += std::to_string(v);
        line += ' ';
    }
    line += "\r\n";
    return line;
}

CheckpointRead readCheckpoint(const std::string& path) {
    using Status = CheckpointRead::Status;
    std::string text;
    bool cut = false;
    const int error = readFileStart(path, text, cut);
    if (error == ENOENT) return {.status = Status::Missing};
    if (error != 0) return {.status = Status::Unreadable, .error = error};
    const std::optional<Checkpoint> checkpoint = parseCheckpoint(text, cut);
    if (!checkpoint) return {.status = Status::Malformed};
    return {.status = Status::Read, .checkpoint = checkpoint};
}

std::optional<Checkpoint> parseCheckpoint(std::string_view text, bool cut) {
    // Candidate and Limit are whole Numbers; Interrupted is a 16-bit integer.
    constexpr std::int64_t kMaxWhole = Number::kMaxWhole;
    std::size_t pos = 0;
    const auto candidate = nextNumber(text, cut, pos, -kMaxWhole - 1, kMaxWhole);
    if (!candidate) return std::nullopt;
    const auto limit = nextNumber(text, cut, pos, -kMaxWhole - 1, kMaxWhole);
    if (!limit) return std::nullopt;
    const auto interrupted = nextNumber(text, cut, pos, SHRT_MIN, SHRT_MAX);
    if (!interrupted) return std::nullopt;
    return Checkpoint{*candidate, *limit, static_cast<int>(*interrupted)};
}

std::string writeCheckpoint(const std::string& path, const Checkpoint& checkpoint) {
    const int error = platform::replaceFileDurably(path, checkpointLine(checkpoint));
    return error == 0 ? std::string() : systemReason(error);
}

}  // namespace tarn
