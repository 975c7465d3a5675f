#include "tools/results_size.hpp"

#include <filesystem>

#include "core/number.hpp"

namespace tarn {

double sizeFigure(std::uint64_t bytes) {
    // Whole hundredths of a megabyte, computed in integers so that any 64-bit size is exact.
    const unsigned __int128 hundredths = static_cast<unsigned __int128>(bytes) * 100 / 1048576;
    return static_cast<double>(hundredths) / 100.0;
}

bool isLargeFigure(double figure) { return figure > 10.0; }

std::string megabyteText(double figure) { return doubleText(figure); }

std::string largeFileQuestion(double figure) {
    return "The file is bigger than 10 MB (" + megabyteText(figure) +
           " MB). Do you still want to open it with Notepad? If you cancel, you may choose the "
           "program to open it.";
}

std::optional<std::uint64_t> fileLength(const std::string& path) {
    std::error_code ec;
    const auto size = std::filesystem::file_size(path, ec);
    if (ec) return std::nullopt;
    return size;
}

}  // namespace tarn
