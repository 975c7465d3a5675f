// Start-up with every kind of checkpoint: the prompt only for a job stopped below its limit,
// and a fresh checkpoint in place of a missing or unreadable one.
#include "generation/startup_check.hpp"

#include <gtest/gtest.h>

#include "generation/resume_texts.hpp"
#include "results_oracle.hpp"
#include "support/temp_folder.hpp"

namespace tarn {
namespace {

using test::readFile;
using test::writeFile;

constexpr const char* kFresh = " 101  100  0 \r\n";

TEST(StartupCheck, MissingCheckpointIsCreatedFresh) {
    test::TempFolder folder;
    EXPECT_FALSE(checkCheckpointAtStartup(folder.path()).showInterruptedPrompt);
    EXPECT_EQ(readFile(folder.path() + "primes.ini"), kFresh);
}

TEST(StartupCheck, UnreadableCheckpointIsReplacedWithoutPrompt) {
    for (const std::string content :
         {"", " 37 ", " 37  1000 \r\n", " 99999999999999999999  1000  1 \r\n",
          " 37  1000  99999 \r\n", "garbage\r\n", "37;1000;1\r\n", "\r\n\r\n"}) {
        test::TempFolder folder;
        writeFile(folder.path() + "primes.ini", content);
        EXPECT_FALSE(checkCheckpointAtStartup(folder.path()).showInterruptedPrompt) << content;
        EXPECT_EQ(readFile(folder.path() + "primes.ini"), kFresh) << content;
    }
}

TEST(StartupCheck, PromptOnlyForAJobStoppedBelowItsLimit) {
    struct Case {
        std::string line;
        bool prompt;
    };
    const Case cases[] = {
        {test::oracleCheckpoint(37, 1000, 1), true},
        {test::oracleCheckpoint(997, 1000, 1), true},
        {test::oracleCheckpoint(127, 127, 1), false},
        {test::oracleCheckpoint(127, 105, 1), false},
        {test::oracleCheckpoint(1001, 1000, 0), false},
        {test::oracleCheckpoint(37, 1000, 0), false},
        {test::oracleCheckpoint(37, 1000, 2), false},
        {test::oracleCheckpoint(37, 1000, -1), false},
    };
    for (const Case& c : cases) {
        test::TempFolder folder;
        writeFile(folder.path() + "primes.ini", c.line);
        EXPECT_EQ(checkCheckpointAtStartup(folder.path()).showInterruptedPrompt, c.prompt)
            << c.line;
        EXPECT_EQ(readFile(folder.path() + "primes.ini"), c.line) << "a readable file stays";
    }
}

TEST(StartupCheck, PromptTextIsTheProgramsOwn) {
    EXPECT_EQ(kInterruptedPrompt,
              "You've interrupted the calculations the last time you used the program. If you "
              "wish, you can continue by pressing Resume.");
}

}  // namespace
}  // namespace tarn
