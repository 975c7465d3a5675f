// Start-up with every kind of checkpoint: the prompt only for a job stopped below its limit, and a
// fresh checkpoint in place of a missing or unreadable one.
#include "generation/startup_check.hpp"

#include <gtest/gtest.h>

#include "support/temp_folder.hpp"

namespace tarn {
namespace {

TEST(StartupCheck, PromptOnlyForAJobStoppedBelowItsLimit) {
    auto expect = [](const std::string& line, bool prompt, const std::string& after) {
        test::TempFolder folder;
        if (line != "<none>") test::writeFile(folder.path() + "primes.ini", line);
        EXPECT_EQ(checkCheckpointAtStartup(folder.path()).showInterruptedPrompt, prompt) << line;
        EXPECT_EQ(test::readFile(folder.path() + "primes.ini"), after) << line;
    };
    // Missing or unreadable: replaced by the fresh checkpoint without a word.
    for (const std::string line : {"<none>", "", " 37 ", " 37  1000 \r\n", "garbage\r\n",
                                   " 99999999999999999999  1000  1 \r\n", " 37  1000  99999 \r\n",
                                   "37;1000;1\r\n", "\r\n\r\n"})
        expect(line, false, " 101  100  0 \r\n");
    // Readable: kept as it is.
    for (const auto& [line, prompt] : {std::pair{" 37  1000  1 \r\n", true},
                                       {" 997  1000  1 \r\n", true},
                                       {" 127  127  1 \r\n", false},
                                       {" 127  105  1 \r\n", false},
                                       {" 1001  1000  0 \r\n", false},
                                       {" 37  1000  0 \r\n", false},
                                       {" 37  1000  2 \r\n", false},
                                       {" 37  1000 -1 \r\n", false}})
        expect(line, prompt, line);
}

}  // namespace
}  // namespace tarn
