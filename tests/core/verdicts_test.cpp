// The Test command's verdict messages.
#include "core/verdicts.hpp"

#include <gtest/gtest.h>

#include "core/command_texts.hpp"

using namespace tarn;

TEST(Verdicts, MessagesCarryTheSignedText) {
    EXPECT_EQ(testVerdictMessage(7, true), "Number 7 is prime.");
    EXPECT_EQ(testVerdictMessage(9, false), "Number 9 is not prime.");
    EXPECT_EQ(testVerdictMessage(922337203685277, false), "Number 922337203685277 is not prime.");
    EXPECT_EQ(testVerdictMessage(2, true), kTwoIsPrimeMessage);
}
