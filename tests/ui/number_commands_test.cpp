// Test, Factorize and "Cancel all calculations" in the window, through the fake message box.
#include "core/texts.hpp"
#include "generation/texts.hpp"
#include "ui/texts.hpp"
#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

class NumberCommandTest : public WindowTest {
protected:
    void run(QPushButton* command, const QString& entry) {
        c().Text2->setText(entry);
        press(command);
    }
    std::string status() { return c().Label7->text().toStdString(); }

    static constexpr const char* kLargePrime = "922337203685123";
};

TEST_F(NumberCommandTest, TestAndFactorizeShowTheirResultsRefuseASecondCommandAndStop) {
    run(c().Command2, "abc");
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, kInvalidEntryMessage));
    EXPECT_EQ(status(), ui::kStatusIdle);
    for (const auto& [entry, verdict] : {std::pair{"9", testVerdictMessage(9, false)},
                                         std::pair{"2.7", std::string(kTwoIsPrimeMessage)}}) {
        run(c().Command2, entry);
        EXPECT_EQ(messages.lastSaid(), messages.said(ui::kResultsTitle, verdict));
        EXPECT_EQ(status(), ui::kStatusDone);
    }
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());

    // A stop pressed while nothing runs does not reach the next command.
    c().Command5->click();
    EXPECT_EQ(status(), ui::kStatusCalculationsStopped);
    run(c().Command2, kLargePrime);
    EXPECT_EQ(messages.last().text, testVerdictMessage(922337203685123, true));
    run(c().Command6, "360.9");
    EXPECT_EQ(c().Text4->toPlainText(), "360 = 2^3 * 3^2 * 5");
    EXPECT_EQ(status(), ui::kStatusDone);
    EXPECT_EQ(messages.shown.size(), 4u);
    // A refused entry clears the line and leaves "Working..." behind.
    run(c().Command6, "x");
    ASSERT_EQ(messages.shown.size(), 5u);
    EXPECT_EQ(messages.last().text, kInvalidEntryMessage);
    EXPECT_EQ(status(), ui::kStatusWorking);
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    // A factorization stopped right after it started writes nothing.
    c().Text2->setText(kLargePrime);
    c().Command6->click();
    c().Command5->click();
    ASSERT_TRUE(idle());
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    EXPECT_EQ(status(), ui::kStatusCalculationsStopped);
    EXPECT_EQ(messages.shown.size(), 5u);
    // While a long test runs a second command is refused; Cancel stops the test.
    c().Command2->click();
    EXPECT_EQ(status(), ui::kStatusWorking);
    c().Command6->click();
    ASSERT_EQ(messages.shown.size(), 6u);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, ui::kNumberCommandBusy));
    c().Command5->click();
    EXPECT_EQ(status(), ui::kStatusCalculationsStopped);
    ASSERT_TRUE(idle());
    ASSERT_EQ(messages.shown.size(), 7u);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kCommandTitle, kAllStoppedMessage));
    EXPECT_EQ(status(), ui::kStatusTestStopped);
}
