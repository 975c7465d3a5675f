// Start-up with every kind of checkpoint: the prompt only for a job stopped below its limit, and a
// fresh checkpoint in place of a missing or unreadable one.
#include "generation/startup_check.hpp"

#include <gtest/gtest.h>

#include "support/temp_folder.hpp"

namespace tarn {
namespace {

TEST(StartupCheck, PromptOnlyForAJobStoppedBelowItsLimit) {
    const std::string fresh = " 101  100  0 \r\n";
    struct Case {
        std::string line;  // "<none>": no checkpoint
        bool prompt;
        bool replaced;  // by the fresh checkpoint
    };
    const Case cases[] = {
        {"<none>", false, true},
        {"", false, true},
        {" 37 ", false, true},
        {" 37  1000 \r\n", false, true},
        {" 99999999999999999999  1000  1 \r\n", false, true},
        {" 37  1000  99999 \r\n", false, true},
        {"garbage\r\n", false, true},
        {"37;1000;1\r\n", false, true},
        {"\r\n\r\n", false, true},
        {" 37  1000  1 \r\n", true, false},
        {" 997  1000  1 \r\n", true, false},
        {" 127  127  1 \r\n", false, false},
        {" 127  105  1 \r\n", false, false},
        {" 1001  1000  0 \r\n", false, false},
        {" 37  1000  0 \r\n", false, false},
        {" 37  1000  2 \r\n", false, false},
        {" 37  1000 -1 \r\n", false, false},
    };
    for (const Case& c : cases) {
        test::TempFolder folder;
        if (c.line != "<none>") test::writeFile(folder.path() + "primes.ini", c.line);
        EXPECT_EQ(checkCheckpointAtStartup(folder.path()).showInterruptedPrompt, c.prompt)
            << c.line;
        EXPECT_EQ(test::readFile(folder.path() + "primes.ini"), c.replaced ? fresh : c.line)
            << c.line;
    }
}

}  // namespace
}  // namespace tarn
