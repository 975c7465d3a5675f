// The reader of standard input's lines, fed in pieces of a size the first byte picks, against a
// plain cut of the whole text: the same lines under the same numbers, the long ones refused.
#include <algorithm>
#include <tuple>
#include <vector>

#include "cli/input_lines.hpp"
#include "fuzz_check.hpp"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const std::size_t piece = 1 + data[0] * 8;
    const std::string_view text(reinterpret_cast<const char*>(data) + 1, size - 1);
    std::vector<std::tuple<std::int64_t, std::string, bool>> got, expected;
    tarn::cli::InputLines lines([&got](std::int64_t number, std::string_view line, bool tooLong) {
        got.emplace_back(number, line, tooLong);
        return true;
    });
    for (std::size_t at = 0; at < text.size(); at += piece) lines.feed(text.substr(at, piece));
    lines.finish();

    std::int64_t number = 0;
    for (std::size_t start = 0, end; start < text.size(); start = end + 1) {
        end = std::min(text.find('\n', start), text.size());
        std::string line(text.substr(start, end - start));
        if (line.ends_with('\r')) line.pop_back();
        ++number;
        if (line.size() > tarn::cli::kLongestInputLine)
            expected.emplace_back(number, "", true);
        else if (!line.empty())
            expected.emplace_back(number, line, false);
    }
    FUZZ_CHECK(got == expected);
    return 0;
}
