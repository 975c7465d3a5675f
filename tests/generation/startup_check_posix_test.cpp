// Start-up with a checkpoint that cannot be read: left as it is and reported (POSIX: file
// permissions and the file user).
#include <gtest/gtest.h>
#include <sys/fsuid.h>
#include <sys/stat.h>

#include <filesystem>
#include <functional>

#include "generation/startup_check.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

// Makes files without read permission unreadable for this thread even as root: a file user
// other than 0 drops root's right to override permissions. Undone when it goes.
class WithoutRootsFileRights {
public:
    WithoutRootsFileRights() : before_(::setfsuid(65534)) {}
    ~WithoutRootsFileRights() { ::setfsuid(before_); }

private:
    int before_;
};

// A checkpoint that is there but cannot be read may name a job to resume: it stays as it was,
// and the reason is told. The ways: a folder in the file's place (read gives EISDIR), and a
// file without read permission, read with the file user of nobody so that open gives EACCES
// to root too (chmod alone does not stop root).
TEST(StartupCheck, AnUnreadableCheckpointIsLeftAsItIsAndReported) {
    const std::string line = " 37  1000  1 \r\n";
    struct Case {
        const char* name;
        std::function<void(const std::string& path)> make;  // puts the checkpoint in place
        std::string reason;
        std::string kept;  // the path whose bytes must stay `line`
    };
    const Case cases[] = {
        {"a folder",
         [&](const std::string& path) {
             std::filesystem::create_directory(path);
             test::writeFile(path + "/inside", line);
         },
         "Is a directory", "/inside"},
        {"no read permission",
         [&](const std::string& path) {
             test::writeFile(path, line);
             ::chmod(path.c_str(), 0);
         },
         "Permission denied", ""},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        test::TempFolder folder;
        const std::string path = folder.path() + "primes.ini";
        c.make(path);
        ::chmod(folder.path().c_str(), 0777);  // the folder itself stays open to anyone
        StartupCheck check;
        {
            const WithoutRootsFileRights asNobody;
            if (std::filesystem::is_regular_file(path) && test::readFile(path) == line)
                GTEST_SKIP() << "this process reads files whatever their permissions";
            check = checkCheckpointAtStartup(folder.path());
        }
        std::filesystem::permissions(path, std::filesystem::perms::owner_read,
                                     std::filesystem::perm_options::add);  // for the comparison
        EXPECT_FALSE(check.showInterruptedPrompt);
        EXPECT_EQ(check.readFailure, "The file " + path + " could not be read: " + c.reason + ".");
        EXPECT_EQ(test::readFile(path + c.kept), line);
        EXPECT_EQ(std::filesystem::is_directory(path), c.kept != "");
        EXPECT_FALSE(std::filesystem::exists(path + ".tmp"));
    }
}

}  // namespace
}  // namespace tarn
