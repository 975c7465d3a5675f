// Start-up with a checkpoint that cannot be read (POSIX: a folder in the file's place, which read
// refuses with EISDIR): it may name a job to resume, so it stays as it was and the reason is told.
#include <gtest/gtest.h>

#include <filesystem>

#include "core/texts.hpp"
#include "generation/startup_check.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

TEST(StartupCheck, AnUnreadableCheckpointIsLeftAsItIsAndReported) {
    test::TempFolder folder;
    const std::string path = folder.path() + "primes.ini";
    std::filesystem::create_directory(path);
    test::writeFile(path + "/inside", " 37  1000  1 \r\n");
    const StartupCheck check = checkCheckpointAtStartup(folder.path());
    EXPECT_FALSE(check.showInterruptedPrompt);
    EXPECT_EQ(check.readFailure, fileReadFailure(path, "Is a directory"));
    EXPECT_EQ(test::readFile(path + "/inside"), " 37  1000  1 \r\n");
    EXPECT_FALSE(std::filesystem::exists(path + ".tmp"));
}

}  // namespace
}  // namespace tarn
