// Cuts standard input into lines in constant memory. A line longer than any entry is not
// gathered: it is passed over to its newline and reported by its number, so input without
// newlines cannot make the program grow with its size.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace tarn::cli {

// Far beyond any number a user means, and small enough to hold without thought.
inline constexpr std::size_t kLongestInputLine = 1024;

class InputLines {
public:
    // Gets each line that is not empty, without its CR LF or LF, and its number counted from 1
    // over all lines; a line beyond kLongestInputLine comes as `tooLong` with no text. Returns
    // false to end the input.
    using Sink = std::function<bool(std::int64_t number, std::string_view line, bool tooLong)>;

    explicit InputLines(Sink sink);

    // The next bytes of the input; false once the sink has ended it.
    bool feed(std::string_view bytes);
    // The input has ended: a last line without a newline still counts.
    void finish();

private:
    bool endLine();

    Sink sink_;
    std::string pending_;  // the line so far, never more than kLongestInputLine + 1 bytes
    bool tooLong_ = false;
    std::int64_t number_ = 0;
};

}  // namespace tarn::cli
