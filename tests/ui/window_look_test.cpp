// The main window and its split window as they open, as a user sees them (window_checks.hpp),
// with their screenshots left in the build folder for people to look at.
#include <QDir>

#include "window_checks.hpp"
#include "window_fixture.hpp"

using namespace tarn::test;

TEST_F(WindowTest, BothWindowsShowTheirTextsWholeAndTabInOrder) {
    window->show();
    window->spllit_Click();
    QWidget* split = window->splitWindow();
    window->spllit_Click();
    EXPECT_EQ(window->splitWindow(), split) << "one split window at a time";
    ASSERT_TRUE(QTest::qWaitForWindowExposed(window.get()) && QTest::qWaitForWindowExposed(split));
    // The split window tabs in reading order.
    QStringList splitOrder;
    for (QWidget* w : controlsIn(split, true))
        if (w->focusPolicy() & Qt::TabFocus) splitOrder << w->objectName();
    const struct {
        QWidget* window;
        QString texts, tabOrder, file;
    } windows[] = {
        {window.get(),
         "Brindle - Tarn - Prime Numbers|Generate Primes |Up to|100|Enumerate results|"
         "Open results when finished|INFO:|Elapsed Time: |Generate|Resume|Test Prime or Factorize|"
         "Number|100|Test|Factorize|Press Test or Factorize to Calculate...|"
         "Cancel all calculations|Click here: Visit Brindle at https://brindle.example",
         // Designed so, not in reading order: each panel's entry and first button, the link,
         // then the rest.
         "Text1 Command1 Text2 Command2 Command4 Check1 Check2 Command5 Command3 Command6 Text4",
         "form1.png"},
        // It shows the folder it splits into, the documents folder ("/tmp" here).
        {split, "Split Results File|Save in|/tmp|1000|records in each file|Split|Close",
         splitOrder.join(' '), "form2.png"},
    };
    QDir().mkpath(TARN_SCREENSHOT_DIR);
    for (const auto& [w, texts, tabOrder, file] : windows) {
        SCOPED_TRACE(file.toStdString());
        EXPECT_EQ(shownTexts(w), texts.toStdString());
        EXPECT_EQ(w->minimumSize(), w->maximumSize()) << "the window's size is fixed";
        checkLayout(w);
        checkTabOrder(w, tabOrder);
        checkScreenshot(w, TARN_SCREENSHOT_DIR "/" + file);
    }
}
