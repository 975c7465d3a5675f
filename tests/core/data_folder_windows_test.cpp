// Where a Windows copy keeps primes.txt and primes.ini: beside a portable program, in
// %LOCALAPPDATA%\Tarn for one in a folder the user cannot write (Program Files).
#include <gtest/gtest.h>

#include "core/data_folder.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

TEST(DataFolder, WindowsCopiesUseTheirFolderOrLocalAppData) {
    const auto around = [](bool writable, std::optional<std::string> local) {
        return Surroundings{[writable](const std::string&) { return writable; }, std::move(local),
                            "C:\\Users\\Ann"};
    };
    test::TempFolder portable;
    EXPECT_EQ(chooseDataFolder(portable.path(), around(true, "C:\\Users\\Ann\\AppData\\Local")),
              portable.path());
    const std::string installed = "C:\\Program Files\\Tarn\\";
    EXPECT_EQ(chooseDataFolder(installed, around(false, "D:\\Lokal")), "D:\\Lokal\\Tarn\\");
    // No LOCALAPPDATA: the one under the user's profile.
    EXPECT_EQ(chooseDataFolder(installed, around(false, std::nullopt)),
              "C:\\Users\\Ann\\AppData\\Local\\Tarn\\");
}

}  // namespace
}  // namespace tarn
