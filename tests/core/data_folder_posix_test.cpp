// Where a portable and an installed copy keep primes.txt and primes.ini, and which README.txt
// "Readme" opens, with the XDG folders of a POSIX desktop (Windows: data_folder_windows_test.cpp).
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <optional>

#include "core/data_folder.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;
namespace fs = std::filesystem;

namespace {

Surroundings surroundings(bool writable, std::optional<std::string> xdg,
                          std::optional<std::string> home) {
    return {[writable](const std::string&) { return writable; }, std::move(xdg), std::move(home)};
}

// A prefix as `cmake --install` lays it out: bin/ beside share/doc/tarn/.
struct Prefix {
    test::TempFolder root;
    std::string bin = root.path() + "bin/";
    std::string doc = root.path() + "share/doc/tarn/";
    Prefix() {
        fs::create_directories(bin);
        fs::create_directories(doc);
    }
};

// Sets an environment variable for one test and puts the old value back.
class ScopedEnv {
public:
    ScopedEnv(const char* name, const char* value) : name_(name) {
        if (const char* old = std::getenv(name)) old_ = old;
        value ? setenv(name, value, 1) : unsetenv(name);
    }
    ~ScopedEnv() { old_ ? setenv(name_, old_->c_str(), 1) : unsetenv(name_); }

private:
    const char* name_;
    std::optional<std::string> old_;
};

}  // namespace

TEST(DataFolder, PortableCopyKeepsItsFilesBesideTheProgram) {
    test::TempFolder dir;
    EXPECT_EQ(chooseDataFolder(dir.path(), surroundings(true, "/x/data", "/home/u")), dir.path());
    // A folder that happens to be called bin, without share/ beside it, is still portable.
    const std::string bin = dir.path() + "bin/";
    fs::create_directory(bin);
    EXPECT_EQ(chooseDataFolder(bin, surroundings(true, "/x/data", "/home/u")), bin);
}

TEST(DataFolder, ReadOnlyOrInstalledCopyUsesTheUsersDataFolder) {
    test::TempFolder dir;
    EXPECT_EQ(chooseDataFolder(dir.path(), surroundings(false, "/x/data", "/home/u")),
              "/x/data/tarn/");

    // An installed copy stays out of its prefix even where it may write (root, a user prefix).
    Prefix prefix;
    EXPECT_TRUE(InstalledLayout(prefix.root.path() + "bin"));
    EXPECT_EQ(chooseDataFolder(prefix.bin, surroundings(true, "/x/data", "/home/u")),
              "/x/data/tarn/");
}

TEST(DataFolder, FollowsXdgDataHomeElseHome) {
    const std::string program = "/opt/ro/";
    EXPECT_EQ(chooseDataFolder(program, surroundings(false, "/x/data/", "/home/u")),
              "/x/data/tarn/");
    EXPECT_EQ(chooseDataFolder(program, surroundings(false, std::nullopt, "/home/u")),
              "/home/u/.local/share/tarn/");
    // Empty or relative XDG_DATA_HOME is invalid and ignored.
    EXPECT_EQ(chooseDataFolder(program, surroundings(false, "", "/home/u")),
              "/home/u/.local/share/tarn/");
    EXPECT_EQ(chooseDataFolder(program, surroundings(false, "data", "/home/u/")),
              "/home/u/.local/share/tarn/");
    // Nowhere to go: the program folder, where writing then fails and is reported.
    EXPECT_EQ(chooseDataFolder(program, surroundings(false, std::nullopt, std::nullopt)), program);
    EXPECT_EQ(chooseDataFolder(program, surroundings(false, "rel", "")), program);
}

TEST(DataFolder, RunningProcessCreatesTheMissingUserFolderPrivately) {
    Prefix prefix;
    test::TempFolder data;
    const std::string xdg = data.path() + "deep/er";
    ScopedEnv env("XDG_DATA_HOME", xdg.c_str());

    const std::string folder = dataFolder(prefix.bin);
    EXPECT_EQ(folder, xdg + "/tarn/");
    ASSERT_TRUE(fs::is_directory(folder));
    EXPECT_EQ(fs::status(folder).permissions() & fs::perms::all, fs::perms::owner_all);
    EXPECT_EQ(dataFolder(prefix.bin), folder);  // an existing folder is simply used

    ScopedEnv unset("XDG_DATA_HOME", nullptr);
    ScopedEnv home("HOME", data.path().c_str());
    EXPECT_EQ(dataFolder(prefix.bin), data.path() + ".local/share/tarn/");
    EXPECT_TRUE(fs::is_directory(data.path() + ".local/share/tarn"));
}

TEST(DataFolder, WritabilityComesFromTheFileSystem) {
    test::TempFolder dir;
    EXPECT_TRUE(FolderWritable(dir.path()));
    EXPECT_FALSE(FolderWritable(dir.path() + "missing/"));
    // Read-only folders are covered by the install test, as an unprivileged user.
}

TEST(ReadmePath, ProgramFolderFirstThenInstalledDocumentation) {
    Prefix prefix;
    // Neither: the program folder's name, which does not exist, so "Readme" does nothing.
    EXPECT_EQ(readmePath(prefix.bin), prefix.bin + "README.txt");

    test::writeFile(prefix.doc + "README.txt", "installed\n");
    EXPECT_EQ(readmePath(prefix.bin), prefix.doc + "README.txt");  // no "bin/.." left in it

    test::writeFile(prefix.bin + "README.txt", "portable\n");
    EXPECT_EQ(readmePath(prefix.bin), prefix.bin + "README.txt");
}
