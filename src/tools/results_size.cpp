// The size figure of the results file, counted in whole hundredths in 128-bit integers so that
// it is cut (never rounded) exactly for any 64-bit size.
#include "tools/results_size.hpp"

#include <filesystem>

#include "core/path_text.hpp"

namespace tarn {
namespace {

constexpr std::uint64_t kBytesPerMegabyte = 1048576;
constexpr unsigned kHundredths = 100;  // the figure keeps two decimals
// Above this many megabytes the window asks before it opens the file in the text editor; the
// question quotes the same figure ("bigger than 10 MB").
constexpr double kLargeFigure = 10.0;

}  // namespace

double sizeFigure(std::uint64_t bytes) {
    const unsigned __int128 hundredths =
        static_cast<unsigned __int128>(bytes) * kHundredths / kBytesPerMegabyte;
    return static_cast<double>(hundredths) / kHundredths;
}

bool isLargeFigure(double figure) { return figure > kLargeFigure; }

std::optional<std::uint64_t> fileLength(const std::string& path) {
    std::error_code ec;
    const auto size = std::filesystem::file_size(pathFromUtf8(path), ec);
    if (ec) return std::nullopt;
    return size;
}

}  // namespace tarn
