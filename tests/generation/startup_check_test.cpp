// Start-up with every kind of checkpoint: the prompt only for a job stopped below its limit, a
// fresh checkpoint in place of a missing or malformed one (one that cannot be read:
// startup_check_posix_test.cpp).
#include "generation/startup_check.hpp"

#include <gtest/gtest.h>

#include "support/temp_folder.hpp"

namespace tarn {
namespace {

TEST(StartupCheck, PromptOnlyForAJobStoppedBelowItsLimit) {
    auto expect = [](const std::string& line, bool prompt, const std::string& after) {
        test::TempFolder folder;
        if (line != "<none>") test::writeFile(folder.path() + "primes.ini", line);
        const StartupCheck check = checkCheckpointAtStartup(folder.path());
        EXPECT_EQ(check.showInterruptedPrompt, prompt) << line;
        EXPECT_EQ(check.readFailure, "") << line;
        EXPECT_EQ(test::readFile(folder.path() + "primes.ini"), after) << line;
    };
    // Missing or malformed: replaced by the fresh checkpoint without a word.
    for (const std::string line :
         {"<none>", "", " 37  1000 \r\n", "garbage\r\n", " 99999999999999999999  1000  1 \r\n",
          " 37  1000  99999 \r\n", "37;1000;1\r\n", "\r\n\r\n"})
        expect(line, false, " 101  100  0 \r\n");
    // Readable: kept as it is.
    for (const auto& [line, prompt] : {std::pair{" 37  1000  1 \r\n", true},
                                       {" 127  127  1 \r\n", false},
                                       {" 127  105  1 \r\n", false},
                                       {" 37  1000  0 \r\n", false},
                                       {" 37  1000  2 \r\n", false},
                                       {" 37  1000 -1 \r\n", false}})
        expect(line, prompt, line);
}

}  // namespace
}  // namespace tarn
