// The program folder and the existence test for the files it holds.
#include "core/app_folder.hpp"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "support/temp_folder.hpp"

using namespace tarn;

TEST(AppFolder, EndsWithExactlyOneSeparator) {
    const std::string folder = AppFolder();
    ASSERT_FALSE(folder.empty());
    EXPECT_EQ(folder.back(), kPathSeparator);
    EXPECT_NE(folder.substr(folder.size() - 2), std::string(2, kPathSeparator));
    EXPECT_TRUE(std::filesystem::is_directory(folder));
    EXPECT_EQ(withTrailingSeparator("/tmp/x"), "/tmp/x" + std::string(1, kPathSeparator));
    EXPECT_EQ(withTrailingSeparator("/tmp/x/"), "/tmp/x/");
    EXPECT_EQ(withTrailingSeparator("/"), "/");
}

TEST(FileExists, OnlyNormalVisibleFilesCount) {
    test::TempFolder dir;
    const std::string file = dir.path() + "primes.txt";
    std::ofstream(file) << "2\r\n";
    std::ofstream(dir.path() + ".hidden") << "x";
    std::filesystem::create_directory(dir.path() + "sub");

    EXPECT_TRUE(FileExists(file));
    EXPECT_FALSE(FileExists(""));
    EXPECT_FALSE(FileExists(dir.path()));          // trailing separator
    EXPECT_FALSE(FileExists(dir.path() + "sub"));  // a folder
    EXPECT_FALSE(FileExists(dir.path() + "missing.txt"));
    EXPECT_FALSE(FileExists(dir.path() + ".hidden"));
    EXPECT_FALSE(FileExists(dir.path() + "primes.txt/x"));  // a query that fails
}
