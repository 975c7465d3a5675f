// The main window as it opens: icon, states, menus (window_look_test.cpp has its texts).
#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

TEST_F(WindowTest, OpensInItsDesignedState) {
    EXPECT_FALSE(window->windowIcon().isNull());
    // Nothing is ever disabled.
    for (QWidget* w : window->findChildren<QWidget*>())
        EXPECT_TRUE(w->isEnabled()) << w->objectName().toStdString();
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    EXPECT_FALSE(c().Check1->isChecked());
    EXPECT_TRUE(c().Check2->isChecked());
    EXPECT_EQ(c().ProgressBar1->value(), 0);
    // Bold blue frame captions (the screenshot shows the rest of the look).
    EXPECT_TRUE(c().Frame1->font().bold() && c().Frame1->styleSheet().contains("#0000ff"));

    QStringList menus;
    for (QAction* menu : window->menuBar()->actions()) {
        menus << menu->text();
        for (QAction* entry : menu->menu()->actions()) menus << "- " + entry->text();
    }
    EXPECT_EQ(menus, QStringList({"Main", "- Show results", "- Split Result File", "- Exit Tarn",
                                  "Help", "- Readme"}));
}

TEST(ElapsedTime, ShowsTrueHoursMinutesAndSeconds) {
    using std::chrono::seconds;
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(75)), "Elapsed Time: 0:01:15");
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(100LL * 24 * 3600)), "Elapsed Time: 2400:00:00");
}
