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
    struct Case {
        const char* entry;
        const char* message;
    };
    for (const Case& k : {Case{"7", "Number 7 is prime."}, Case{"7.9", "Number 7 is prime."},
                          Case{"9", "Number 9 is not prime."}, Case{"97", "Number 97 is prime."},
                          Case{"2", "Number 2 is prime."}, Case{"2.7", "Number 2 is prime."},
                          Case{"1681", "Number 1681 is not prime."},
                          Case{kLargePrime, "Number 922337203685123 is prime."}}) {
        messages.shown.clear();
        test(k.entry);
        ASSERT_EQ(messages.shown.size(), 1u) << k.entry;
        EXPECT_EQ(messages.last().text, k.message);
        EXPECT_EQ(messages.last().title, "Results");
        EXPECT_EQ(status(), "Done...");
    }
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
}

TEST_F(NumberCommandTest, RefusedEntriesLeaveTheStatusAlone) {
    test("1");
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text,
              "Value out of range. Value must be between 2 and 922 337 203 685 277.");
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_EQ(status(), "Press Test or Factorize to Calculate...");
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
    for (const auto& [entry, line] : std::vector<std::pair<QString, QString>>{
             {"2", "2 = 2"},
             {"2.9", "2 = 2"},
             {"18", "18 = 2 * 3^2"},
             {"1001", "1001 = 7 * 11 * 13"},
             {"421053653", "421053653 = 20149 * 20897"},
             {"922337203685277", "922337203685277 = 3 * 47 * 761 * 35527 * 241951"}}) {
        factorize(entry);
        EXPECT_EQ(c().Text4->toPlainText(), line);
        EXPECT_EQ(status(), "Done...");
    }
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
