// Every text of the windows that the designed forms do not hold, word for word; other tests use
// the constants.
#include "ui/texts.hpp"

#include <gtest/gtest.h>

#include "ui/form1.hpp"

using namespace tarn::ui;

TEST(WindowTexts, WordForWord) {
    const std::pair<std::string_view, std::string_view> texts[] = {
        {kStatusIdle, "Press Test or Factorize to Calculate..."},
        {kStatusWorking, "Working..."},
        {kStatusDone, "Done..."},
        {kStatusTestStopped, "Test stopped..."},
        {kStatusCalculationsStopped, "Calculations stopped..."},
        {kResultsTitle, "Results"},
        {kCommandTitle, "Command"},
        {kInfoTitle, "Info"},
        {kNumberCommandBusy,
         "A test or factorization is still running. Wait for its result, or stop it with \"Cancel "
         "all calculations\"."},
        {kJobBusy,
         "A calculation is already running. Stop it with \"Cancel all calculations\" first."},
        {kSplitAlreadyRunningMessage,
         "A split is already running. Wait until it has finished, or press Cancel."},
        {kMakerWebAddress, "https://brindle.example"},
        {kWebLinkCaption, "Click here: Visit Brindle at "},
        {kSplitCancelCaption, "Cancel"},
        {kSplitCloseCaption, "Close"},
    };
    for (const auto& [text, expected] : texts) EXPECT_EQ(text, expected);
    // Hours without a bound.
    EXPECT_EQ(elapsedTimeText(std::chrono::seconds(75)), "Elapsed Time: 0:01:15");
    EXPECT_EQ(elapsedTimeText(std::chrono::seconds(100LL * 24 * 3600)), "Elapsed Time: 2400:00:00");
}
