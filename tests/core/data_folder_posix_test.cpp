// Where a copy keeps primes.txt and primes.ini, and which README.txt "Readme" opens, with the XDG
// folders of a POSIX desktop (Windows: data_folder_windows_test.cpp). The install test runs the
// installed and portable programs themselves.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <optional>

#include "core/data_folder.hpp"
#include "support/temp_folder.hpp"

using namespace tarn;
namespace fs = std::filesystem;

namespace {

// A prefix as `cmake --install` lays it out: bin/ beside share/doc/tarn/.
struct Prefix {
    test::TempFolder root;
    std::string bin = root.path() + "bin/", doc = root.path() + "share/doc/tarn/";
    Prefix() { fs::create_directories(bin), fs::create_directories(doc); }
};

// Sets an environment variable for one test and puts the old value back.
struct ScopedEnv {
    const char* name;
    std::optional<std::string> old;
    ScopedEnv(const char* n, const char* value) : name(n) {
        if (const char* was = std::getenv(n)) old = was;
        value ? setenv(n, value, 1) : unsetenv(n);
    }
    ~ScopedEnv() { old ? setenv(name, old->c_str(), 1) : unsetenv(name); }
};

}  // namespace

TEST(DataFolder, PortableCopyHereInstalledOrReadOnlyCopyInTheUsersDataFolder) {
    test::TempFolder dir;
    Prefix prefix;
    fs::create_directory(dir.path() + "bin");  // called bin, no share/ beside it: portable
    const std::string ro = "/opt/ro/", home = "/home/u/.local/share/tarn/";
    const struct {
        std::string program;
        bool writable;
        std::optional<std::string> xdg, home;
        std::string folder;
    } cases[] = {
        {dir.path() + "bin/", true, "/x/data", "/home/u", dir.path() + "bin/"},
        {dir.path(), false, "/x/data", "/home/u", "/x/data/tarn/"},
        // An installed copy stays out of its prefix even where it may write.
        {prefix.bin, true, "/x/data/", "/home/u", "/x/data/tarn/"},
        {ro, false, std::nullopt, "/home/u", home},
        // Empty or relative XDG_DATA_HOME is invalid and ignored.
        {ro, false, "", "/home/u", home},
        {ro, false, "data", "/home/u/", home},
        // Nowhere to go: the program folder, where writing then fails and is reported.
        {ro, false, std::nullopt, std::nullopt, ro},
        {ro, false, "rel", "", ro},
    };
    for (const auto& c : cases) {
        const Surroundings env{[&c](const std::string&) { return c.writable; }, c.xdg, c.home};
        EXPECT_EQ(chooseDataFolder(c.program, env), c.folder) << c.program << c.xdg.value_or("-");
    }
    EXPECT_TRUE(isFolderWritable(dir.path()));
    EXPECT_FALSE(isFolderWritable(dir.path() + "missing/"));
}

TEST(DataFolder, RunningProcessCreatesTheMissingUserFolderPrivately) {
    Prefix prefix;
    test::TempFolder data;
    const ScopedEnv xdg("XDG_DATA_HOME", (data.path() + "deep/er").c_str());
    const std::string folder = dataFolder(prefix.bin);
    EXPECT_EQ(folder, data.path() + "deep/er/tarn/");
    EXPECT_EQ(fs::status(folder).permissions() & fs::perms::all, fs::perms::owner_all);
    EXPECT_EQ(dataFolder(prefix.bin), folder);  // an existing folder is simply used
    const ScopedEnv unset("XDG_DATA_HOME", nullptr), home("HOME", data.path().c_str());
    EXPECT_EQ(dataFolder(prefix.bin), data.path() + ".local/share/tarn/");
    EXPECT_TRUE(fs::is_directory(data.path() + ".local/share/tarn"));
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
