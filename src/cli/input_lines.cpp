#include "cli/input_lines.hpp"

#include <utility>

namespace tarn::cli {

InputLines::InputLines(Sink sink) : sink_(std::move(sink)) {
    pending_.reserve(kLongestInputLine + 1);
}

bool InputLines::feed(std::string_view bytes) {
    while (!bytes.empty()) {
        const std::size_t newline = bytes.find('\n');
        const std::string_view piece = bytes.substr(0, newline);
        // One byte of room for the CR before the newline.
        if (!tooLong_ && pending_.size() + piece.size() > kLongestInputLine + 1) {
            tooLong_ = true;
            pending_.clear();
        }
        if (!tooLong_) pending_.append(piece);
        if (newline == std::string_view::npos) return true;
        bytes.remove_prefix(newline + 1);
        if (!endLine()) return false;
    }
    return true;
}

void InputLines::finish() {
    if (!pending_.empty() || tooLong_) endLine();
}

bool InputLines::endLine() {
    ++number_;
    std::string_view line = pending_;
    if (!line.empty() && line.back() == '\r') line.remove_suffix(1);
    const bool tooLong = tooLong_ || line.size() > kLongestInputLine;
    const bool goOn =
        tooLong ? sink_(number_, {}, true) : line.empty() || sink_(number_, line, false);
    pending_.clear();
    tooLong_ = false;
    return goOn;
}

}  // namespace tarn::cli
