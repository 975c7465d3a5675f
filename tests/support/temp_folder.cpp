#include "support/temp_folder.hpp"

#include <fstream>
#include <iterator>
#include <random>
#include <stdexcept>

#include "core/path_text.hpp"
#include "platform/path_separator.hpp"

namespace tarn::test {

TempFolder::TempFolder() {
    namespace fs = std::filesystem;
    std::random_device seed;
    std::mt19937_64 random(seed());
    // A new name that no other test or process has taken: create_directory fails on one that is.
    for (int attempt = 0; attempt < 100 && path_.empty(); ++attempt) {
        const fs::path folder =
            fs::temp_directory_path() / ("tarn-test-" + std::to_string(random()));
        std::error_code ec;
        if (fs::create_directory(folder, ec)) {
            fs::permissions(folder, fs::perms::owner_all, fs::perm_options::replace, ec);
            path_ = utf8(folder) + platform::kPathSeparator;
        }
    }
    if (path_.empty()) throw std::runtime_error("no temporary folder");
}

TempFolder::~TempFolder() {
    std::error_code ec;
    const auto folder = pathFromUtf8(path_);
    std::filesystem::permissions(folder, std::filesystem::perms::owner_all,
                                 std::filesystem::perm_options::add, ec);
    std::filesystem::remove_all(folder, ec);
}

std::string readFile(const std::string& path) {
    std::ifstream in(pathFromUtf8(path), std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

void writeFile(const std::string& path, const std::string& bytes) {
    std::ofstream(pathFromUtf8(path), std::ios::binary) << bytes;
}

}  // namespace tarn::test
