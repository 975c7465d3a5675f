// Test, Factorize and "Cancel all calculations" in the window, through the fake message box.
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>

#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

namespace {

constexpr const char* kLargePrime = "922337203685123";

}  // namespace

class NumberCommandTest : public WindowTest {
protected:
    void test(const QString& entry) {
        c().Text2->setText(entry);
        c().Command2->click();
        ASSERT_TRUE(waitUntil([&] { return !window->numberCommandRunning(); }));
    }
    void factorize(const QString& entry) {
        c().Text2->setText(entry);
        c().Command6->click();
        ASSERT_TRUE(waitUntil([&] { return !window->numberCommandRunning(); }));
    }
    QString status() { return c().Label7->text(); }
};

TEST_F(NumberCommandTest, TestShowsTheVerdictThenDone) {
    const std::pair<const char*, const char*> cases[] = {
        {"7.9", "Number 7 is prime."}, {"9", "Number 9 is not prime."},
        {"2.7", "Number 2 is prime."}, {kLargePrime, "Number 922337203685123 is prime."}};
    for (const auto& [entry, message] : cases) {
        test(entry);
        EXPECT_EQ(messages.last().text, message);
        EXPECT_EQ(messages.last().title, "Results");
        EXPECT_EQ(status(), "Done...");
    }
    EXPECT_EQ(messages.shown.size(), 4u);
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
}

TEST_F(NumberCommandTest, RefusedEntriesLeaveTheStatusAlone) {
    test("1");
    EXPECT_EQ(messages.last().text,
              "Value out of range. Value must be between 2 and 922 337 203 685 277.");
    EXPECT_EQ(messages.last().title, "Info");
    test("abc");
    EXPECT_EQ(messages.last().text, "Invalid entry.");
    EXPECT_EQ(status(), "Press Test or Factorize to Calculate...");
}

TEST_F(NumberCommandTest, CancelStopsALongTest) {
    c().Text2->setText(kLargePrime);
    c().Command2->click();
    EXPECT_EQ(status(), "Working...");
    c().Command5->click();
    EXPECT_EQ(status(), "Calculations stopped...");
    ASSERT_TRUE(waitUntil([&] { return !window->numberCommandRunning(); }));
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, "All calculations were stopped!");
    EXPECT_EQ(messages.last().title, "Command");
    EXPECT_EQ(status(), "Test stopped...");
}

TEST_F(NumberCommandTest, AStopLeftOverFromBeforeHasNoEffect) {
    c().Command5->click();
    EXPECT_EQ(status(), "Calculations stopped...");
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    test(kLargePrime);
    EXPECT_EQ(messages.last().text, "Number 922337203685123 is prime.");
    factorize("360");
    EXPECT_EQ(c().Text4->toPlainText(), "360 = 2^3 * 3^2 * 5");
}

TEST_F(NumberCommandTest, FactorizeWritesTheResultLine) {
    for (const char* entry : {"2.9", "922337203685277"}) factorize(entry);
    EXPECT_EQ(c().Text4->toPlainText(), "922337203685277 = 3 * 47 * 761 * 35527 * 241951");
    EXPECT_EQ(status(), "Done...");
    factorize("18");
    EXPECT_EQ(c().Text4->toPlainText(), "18 = 2 * 3^2");
    EXPECT_TRUE(messages.shown.empty());
}

TEST_F(NumberCommandTest, FactorizeWithARefusedEntryKeepsWorking) {
    factorize("360");
    factorize("x");
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, "Invalid entry.");
    EXPECT_EQ(status(), "Working...");
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
}

TEST_F(NumberCommandTest, CancelRightAfterFactorizeWritesNothing) {
    c().Text2->setText(kLargePrime);
    c().Command6->click();
    c().Command5->click();
    ASSERT_TRUE(waitUntil([&] { return !window->numberCommandRunning(); }));
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    EXPECT_EQ(status(), "Calculations stopped...");
    EXPECT_TRUE(messages.shown.empty());
}

TEST_F(NumberCommandTest, ASecondCommandWhileOneRunsIsRefused) {
    c().Text2->setText(kLargePrime);
    c().Command2->click();
    c().Command6->click();
    ASSERT_GE(messages.shown.size(), 1u);
    EXPECT_EQ(messages.shown[0].title, "Info");
    EXPECT_NE(messages.shown[0].text.find("still running"), std::string::npos);
    ASSERT_TRUE(waitUntil([&] { return !window->numberCommandRunning(); }));
    EXPECT_EQ(messages.last().text, "Number 922337203685123 is prime.");
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
}
