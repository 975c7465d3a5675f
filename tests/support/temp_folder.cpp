#include "support/temp_folder.hpp"

#include <fstream>
#include <iterator>
#include <random>

#include "core/path_text.hpp"
#include "platform/path_separator.hpp"

namespace tarn::test {

namespace fs = std::filesystem;

TempFolder::TempFolder() {
    std::mt19937_64 random(std::random_device{}());
    fs::path folder;
    // A name no other test or process has taken: create_directory fails on one that is.
    do folder = fs::temp_directory_path() / ("tarn-test-" + std::to_string(random()));
    while (!fs::create_directory(folder));
    fs::permissions(folder, fs::perms::owner_all, fs::perm_options::replace);
    path_ = utf8(folder) + platform::kPathSeparator;
}

TempFolder::~TempFolder() {
    std::error_code ec;  // a test may have taken the owner's rights away
    fs::permissions(pathFromUtf8(path_), fs::perms::owner_all, fs::perm_options::add, ec);
    fs::remove_all(pathFromUtf8(path_), ec);
}

std::string readFile(const std::string& path) {
    std::ifstream in(pathFromUtf8(path), std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

void writeFile(const std::string& path, const std::string& bytes) {
    std::ofstream(pathFromUtf8(path), std::ios::binary) << bytes;
}

}  // namespace tarn::test
