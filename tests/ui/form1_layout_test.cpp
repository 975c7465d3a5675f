// The main window as it opens: controls, captions, places, focus order, menus, its look.
#include <QDir>

#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

TEST_F(WindowTest, OpensInItsDesignedState) {
    EXPECT_EQ(window->windowTitle(), "Brindle - Tarn - Prime Numbers");
    EXPECT_FALSE(window->windowIcon().isNull());
    EXPECT_EQ(window->centralWidget()->size(), QSize(287, 419));
    // The caption (a frame's title), then left, top, width and height in twips inside the frame
    // or the window.
    const struct {
        QWidget* w;
        const char* caption;
        QRect twips;
    } controls[] = {
        {c().Frame1, "Generate Primes ", {240, 120, 3855, 2775}},
        {c().Label1, "Up to", {360, 360, 855, 255}},
        {c().Text1, "100", {840, 360, 2415, 285}},
        {c().Check1, nullptr, {360, 720, 135, 195}},
        {c().Label3, "Enumerate results", {720, 720, 2295, 255}},
        {c().Check2, nullptr, {360, 960, 135, 195}},
        {c().Label4, "Open results when finished", {720, 960, 2295, 255}},
        {c().Label5, "INFO:", {360, 1200, 3015, 615}},
        {c().Label6, "Elapsed Time: ", {360, 1800, 2895, 255}},
        {c().Command1, "Generate", {360, 2040, 1575, 255}},
        {c().Command3, "Resume", {2040, 2040, 1335, 255}},
        {c().ProgressBar1, nullptr, {360, 2400, 3015, 255}},
        {c().Frame2, "Test Prime or Factorize", {240, 3000, 3855, 2415}},
        {c().Label2, "Number", {360, 360, 615, 255}},
        {c().Text2, "100", {1080, 360, 2295, 285}},
        {c().Command2, "Test", {360, 840, 1335, 255}},
        {c().Command6, "Factorize", {1800, 840, 1575, 255}},
        {c().Label7, "Press Test or Factorize to Calculate...", {360, 1200, 3015, 255}},
        {c().Text4, nullptr, {120, 1440, 3615, 855}},
        {c().Command5, "Cancel all calculations", {240, 5520, 3855, 255}},
        {c().Command4,
         "Click here: Visit Brindle at https://brindle.example",
         {240, 5880, 3855, 255}},
    };
    for (const auto& [w, caption, twips] : controls) {
        const std::string name = w->objectName().toStdString();
        EXPECT_EQ(w->geometry(),
                  QRect(twips.x() / 15, twips.y() / 15, twips.width() / 15, twips.height() / 15))
            << name;
        if (caption) {
            EXPECT_EQ(w->property(w->inherits("QGroupBox") ? "title" : "text").toString(), caption)
                << name;
        }
        // Nothing is ever disabled or hidden.
        EXPECT_TRUE(w->isEnabled()) << name;
    }
    EXPECT_EQ(c().Text1->parentWidget(), c().Frame1);
    EXPECT_EQ(c().Text4->parentWidget(), c().Frame2);
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

TEST_F(WindowTest, ShownItTabsInTheDesignedOrderAndLooksAsDesigned) {
    window->show();
    ASSERT_TRUE(QTest::qWaitForWindowExposed(window.get()));
    const std::vector<QWidget*> order = {c().Text1,    c().Command1, c().Text2,  c().Command2,
                                         c().Command4, c().Check1,   c().Check2, c().Command5,
                                         c().Command3, c().Command6, c().Text4,  c().Text1};
    QWidget* w = c().Text1;
    for (std::size_t i = 1; i < order.size(); ++i) {
        do w = w->nextInFocusChain();
        while (w->focusPolicy() == Qt::NoFocus || !w->isVisible());
        EXPECT_EQ(w, order[i]) << "after " << order[i - 1]->objectName().toStdString() << " came "
                               << w->objectName().toStdString();
    }
    QDir().mkpath(TARN_SCREENSHOT_DIR);
    EXPECT_TRUE(window->grab().save(QString(TARN_SCREENSHOT_DIR) + "/form1.png"));
}

TEST_F(WindowTest, SplitResultFileShowsOneWindow) {
    window->spllit_Click();
    QWidget* first = window->splitWindow();
    ASSERT_NE(first, nullptr);
    EXPECT_TRUE(first->isVisible());
    EXPECT_EQ(first->windowTitle(), "Split Results File");
    window->spllit_Click();
    EXPECT_EQ(window->splitWindow(), first);
}

TEST(ElapsedTime, ShowsTrueHoursMinutesAndSeconds) {
    using std::chrono::seconds;
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(75)), "Elapsed Time: 0:01:15");
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(100LL * 24 * 3600)), "Elapsed Time: 2400:00:00");
}
