// Test, Factorize and "Cancel all calculations" in the window, through the fake message box.
#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

class NumberCommandTest : public WindowTest {
protected:
    void run(QPushButton* command, const QString& entry) {
        c().Text2->setText(entry);
        press(command);
    }
    QString status() { return c().Label7->text(); }

    static constexpr const char* kLargePrime = "922337203685123";
};

TEST_F(NumberCommandTest, TestAndFactorizeShowTheirResults) {
    run(c().Command2, "abc");
    EXPECT_EQ(messages.last().text, "Invalid entry.");
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_EQ(status(), "Press Test or Factorize to Calculate...");
    for (const auto& [entry, verdict] :
         {std::pair{"9", "Number 9 is not prime."}, std::pair{"2.7", "Number 2 is prime."}}) {
        run(c().Command2, entry);
        EXPECT_EQ(messages.last().text, verdict);
        EXPECT_EQ(messages.last().title, "Results");
        EXPECT_EQ(status(), "Done...");
    }
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());

    // A stop pressed while nothing runs does not reach the next command.
    c().Command5->click();
    EXPECT_EQ(status(), "Calculations stopped...");
    run(c().Command2, kLargePrime);
    EXPECT_EQ(messages.last().text, "Number 922337203685123 is prime.");
    run(c().Command6, "360.9");
    EXPECT_EQ(c().Text4->toPlainText(), "360 = 2^3 * 3^2 * 5");
    EXPECT_EQ(status(), "Done...");
    EXPECT_EQ(messages.shown.size(), 4u);
    // A refused entry clears the line and leaves "Working..." behind.
    run(c().Command6, "x");
    ASSERT_EQ(messages.shown.size(), 5u);
    EXPECT_EQ(messages.last().text, "Invalid entry.");
    EXPECT_EQ(status(), "Working...");
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    // A factorization stopped right after it started writes nothing.
    c().Text2->setText(kLargePrime);
    c().Command6->click();
    c().Command5->click();
    ASSERT_TRUE(idle());
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    EXPECT_EQ(status(), "Calculations stopped...");
    EXPECT_EQ(messages.shown.size(), 5u);
}

TEST_F(NumberCommandTest, ASecondCommandIsRefusedAndCancelStopsALongTest) {
    c().Text2->setText(kLargePrime);
    c().Command2->click();
    EXPECT_EQ(status(), "Working...");
    c().Command6->click();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_NE(messages.last().text.find("still running"), std::string::npos);
    c().Command5->click();
    EXPECT_EQ(status(), "Calculations stopped...");
    ASSERT_TRUE(idle());
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.last().text, "All calculations were stopped!");
    EXPECT_EQ(messages.last().title, "Command");
    EXPECT_EQ(status(), "Test stopped...");
}
