// The program folder and the existence test for the files it holds.
#include "core/app_folder.hpp"

#include <gtest/gtest.h>

#include <filesystem>

#include "support/temp_folder.hpp"

using namespace tarn;

TEST(AppFolder, EndsWithExactlyOneSeparator) {
    const std::string folder = AppFolder();
    EXPECT_EQ(folder, withTrailingSeparator(folder));
    EXPECT_TRUE(std::filesystem::is_directory(folder));
    EXPECT_EQ(withTrailingSeparator("/tmp/x"), "/tmp/x" + std::string(1, kPathSeparator));
    EXPECT_EQ(withTrailingSeparator("/tmp/x/"), "/tmp/x/");
    EXPECT_EQ(withTrailingSeparator("/"), "/");
}

TEST(FileExists, OnlyNormalVisibleFilesCount) {
    test::TempFolder dir;
    test::writeFile(dir.path() + "primes.txt", "2\r\n");
    test::writeFile(dir.path() + ".hidden", "x");
    std::filesystem::create_directory(dir.path() + "sub");
    EXPECT_TRUE(FileExists(dir.path() + "primes.txt"));
    // Nothing, the folder with its separator, a folder, a missing file, a hidden file, a query
    // that fails.
    for (const std::string& path :
         {std::string(), dir.path(), dir.path() + "sub", dir.path() + "missing.txt",
          dir.path() + ".hidden", dir.path() + "primes.txt/x"})
        EXPECT_FALSE(FileExists(path)) << path;
}
