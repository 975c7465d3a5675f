#include "generation/results_change.hpp"

#include <algorithm>
#include <fstream>
#include <optional>

#include "core/path_text.hpp"
#include "core/texts.hpp"
#include "core/wheel.hpp"

namespace tarn {
namespace {
constexpr std::uint64_t kLongestRecord = 32;  // 14-digit serial, ';', 15-digit prime, CR LF
}

std::optional<KeptRecords> keptRecords(const std::string& path, std::uint64_t trusted,
                                       std::int64_t limit) {
    const std::uint64_t from = trusted - std::min(trusted, 2 * kLongestRecord);
    std::string tail(trusted - from, '\0');
    std::ifstream in(pathFromUtf8(path), std::ios::binary);
    if (!in.seekg(static_cast<std::streamoff>(from)) ||
        !in.read(tail.data(), static_cast<std::streamsize>(tail.size())))
        return std::nullopt;
    KeptRecords kept{0, {kFirstTurnStart, limit, 0}};
    const std::size_t end = tail.rfind('\n');
    if (end == std::string::npos) return kept;
    kept.bytes = from + end + 1;
    const std::size_t start = end == 0 ? std::string::npos : tail.rfind('\n', end - 1);
    if (start == std::string::npos && from > 0) return kept;
    std::string record = tail.substr(start + 1, end - start - 1);  // npos + 1 is 0
    if (record.ends_with('\r')) record.pop_back();
    if (const std::size_t semicolon = record.find(';'); semicolon != std::string::npos)
        record.erase(0, semicolon + 1);
    std::int64_t prime = 0;
    for (const char c : record) {
        if (c < '0' || c > '9' || prime > limit) return kept;
        prime = prime * 10 + (c - '0');
    }
    // 7 ends the seeds; a later prime's turn may lack records after it.
    if (prime == kTurnEndResidue)
        kept.checkpoint = {prime, limit, 1};
    else if (prime >= kFirstTurnStart && prime <= limit)
        kept.checkpoint = {prime - (prime - kFirstTurnStart) % kWheelPeriod - kLastToNextTurn,
                           limit, 1};
    return kept;
}

}  // namespace tarn
