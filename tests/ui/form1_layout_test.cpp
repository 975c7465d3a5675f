// The main window as it opens: controls, captions, places, focus order, menus, links.
#include <QAbstractButton>
#include <QCheckBox>
#include <QLabel>
#include <QLineEdit>
#include <QMenuBar>
#include <QPlainTextEdit>
#include <QProgressBar>

#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

namespace {

// Place of a control inside its container, in pixels (designed in twips, 15 to a pixel).
QRect designed(int left, int top, int width, int height) {
    return QRect(left / 15, top / 15, width / 15, height / 15);
}

}  // namespace

TEST_F(WindowTest, OpensInItsDesignedState) {
    EXPECT_EQ(window->windowTitle(), "Brindle - Tarn - Prime Numbers");
    EXPECT_FALSE(window->windowIcon().isNull());
    EXPECT_EQ(window->centralWidget()->size(), QSize(287, 419));

    EXPECT_EQ(c().Frame1->title(), "Generate Primes ");
    EXPECT_EQ(c().Frame2->title(), "Test Prime or Factorize");
    EXPECT_TRUE(c().Frame1->font().bold());
    EXPECT_TRUE(c().Frame1->styleSheet().contains("#0000ff"));
    EXPECT_FALSE(c().Label1->font().bold());
    EXPECT_EQ(c().Label1->text(), "Up to");
    EXPECT_EQ(c().Text1->text(), "100");
    EXPECT_EQ(c().Text2->text(), "100");
    EXPECT_FALSE(c().Check1->isChecked());
    EXPECT_TRUE(c().Check2->isChecked());
    EXPECT_EQ(c().Label3->text(), "Enumerate results");
    EXPECT_EQ(c().Label4->text(), "Open results when finished");
    EXPECT_EQ(c().Label5->text(), "INFO:");
    EXPECT_TRUE(c().Label5->styleSheet().contains("#ff0000"));
    EXPECT_EQ(c().Label6->text(), "Elapsed Time: ");
    EXPECT_EQ(c().Command1->text(), "Generate");
    EXPECT_EQ(c().Command3->text(), "Resume");
    EXPECT_EQ(c().ProgressBar1->minimum(), 0);
    EXPECT_EQ(c().ProgressBar1->value(), 0);
    EXPECT_EQ(c().Label2->text(), "Number");
    EXPECT_EQ(c().Command2->text(), "Test");
    EXPECT_EQ(c().Command6->text(), "Factorize");
    EXPECT_EQ(c().Label7->text(), "Press Test or Factorize to Calculate...");
    EXPECT_TRUE(c().Text4->toPlainText().isEmpty());
    EXPECT_EQ(c().Text4->verticalScrollBarPolicy(), Qt::ScrollBarAlwaysOn);
    EXPECT_EQ(c().Command5->text(), "Cancel all calculations");
    EXPECT_TRUE(c().Command5->font().bold());
    EXPECT_EQ(c().Command4->text(),
              QString("Click here: Visit Brindle at ") + ui::kMakerWebAddress);
    EXPECT_TRUE(QString(ui::kMakerWebAddress).startsWith("https://"));

    // Nothing is ever disabled or hidden.
    for (QWidget* w : window->centralWidget()->findChildren<QWidget*>()) {
        EXPECT_TRUE(w->isEnabled()) << w->objectName().toStdString();
    }
}

TEST_F(WindowTest, ControlsStandWhereDesigned) {
    const std::vector<std::pair<QWidget*, QRect>> places = {
        {c().Frame1, designed(240, 120, 3855, 2775)},  {c().Label1, designed(360, 360, 855, 255)},
        {c().Text1, designed(840, 360, 2415, 285)},    {c().Check1, designed(360, 720, 135, 195)},
        {c().Label3, designed(720, 720, 2295, 255)},   {c().Check2, designed(360, 960, 135, 195)},
        {c().Label4, designed(720, 960, 2295, 255)},   {c().Label5, designed(360, 1200, 3015, 615)},
        {c().Label6, designed(360, 1800, 2895, 255)},  {c().Command1, designed(360, 2040, 1575, 255)},
        {c().Command3, designed(2040, 2040, 1335, 255)},
        {c().ProgressBar1, designed(360, 2400, 3015, 255)},
        {c().Frame2, designed(240, 3000, 3855, 2415)}, {c().Label2, designed(360, 360, 615, 255)},
        {c().Text2, designed(1080, 360, 2295, 285)},   {c().Command2, designed(360, 840, 1335, 255)},
        {c().Command6, designed(1800, 840, 1575, 255)},
        {c().Label7, designed(360, 1200, 3015, 255)},  {c().Text4, designed(120, 1440, 3615, 855)},
        {c().Command5, designed(240, 5520, 3855, 255)},
        {c().Command4, designed(240, 5880, 3855, 255)},
    };
    for (const auto& [widget, place] : places)
        EXPECT_EQ(widget->geometry(), place) << widget->objectName().toStdString();
    EXPECT_EQ(c().Text1->parentWidget(), c().Frame1);
    EXPECT_EQ(c().Text4->parentWidget(), c().Frame2);
}

TEST_F(WindowTest, FocusGoesRoundInTheDesignedOrder) {
    window->show();
    ASSERT_TRUE(waitUntil([&] { return window->isVisible(); }));
    window->activateWindow();
    c().Text1->setFocus();
    const std::vector<QWidget*> order = {c().Text1,    c().Command1, c().Text2,  c().Command2,
                                         c().Command4, c().Check1,   c().Check2, c().Command5,
                                         c().Command3, c().Command6, c().Text4,  c().Text1};
    QWidget* w = c().Text1;
    for (std::size_t i = 1; i < order.size(); ++i) {
        w = w->nextInFocusChain();
        while (w->focusPolicy() == Qt::NoFocus || !w->isVisible()) w = w->nextInFocusChain();
        EXPECT_EQ(w, order[i]) << "after " << order[i - 1]->objectName().toStdString() << " came "
                               << w->objectName().toStdString();
    }
}

TEST_F(WindowTest, MenusHoldTheDesignedEntries) {
    const auto menus = window->menuBar()->actions();
    ASSERT_EQ(menus.size(), 2);
    EXPECT_EQ(menus[0]->text(), "Main");
    EXPECT_EQ(menus[1]->text(), "Help");
    QStringList entries;
    for (QAction* a : menus[0]->menu()->actions()) entries << a->text();
    EXPECT_EQ(entries, QStringList({"Show results", "Split Result File", "Exit Tarn"}));
    ASSERT_EQ(menus[1]->menu()->actions().size(), 1);
    EXPECT_EQ(menus[1]->menu()->actions()[0]->text(), "Readme");
    EXPECT_EQ(c().show->objectName(), "show");
    EXPECT_EQ(c().spllit->objectName(), "spllit");
    EXPECT_EQ(c().exit->objectName(), "exit");
    EXPECT_EQ(c().readme->objectName(), "readme");
}

TEST_F(WindowTest, ReadmeOpensInTheTextEditorOnlyWhenThere) {
    window->readme_Click();
    EXPECT_TRUE(shell.edited.empty());
    EXPECT_TRUE(messages.shown.empty());

    writeFile(dir.path() + "README.txt", "Tarn\r\n");
    window->readme_Click();
    ASSERT_EQ(shell.edited.size(), 1u);
    EXPECT_EQ(shell.edited[0], dir.path() + "README.txt");

    shell.failure = "no editor";
    window->readme_Click();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, "no editor");
    EXPECT_EQ(messages.last().title, "Info");
}

TEST_F(WindowTest, WebLinkOpensTheMakersSite) {
    c().Command4->click();
    ASSERT_EQ(shell.urls.size(), 1u);
    EXPECT_EQ(shell.urls[0], ui::kMakerWebAddress);
    EXPECT_TRUE(messages.shown.empty());
}

TEST_F(WindowTest, Screenshot) {
    window->show();
    ASSERT_TRUE(waitUntil([&] { return window->isVisible(); }));
    saveScreenshot(*window, "form1.png");
}

TEST(ElapsedTime, ShowsTrueHoursMinutesAndSeconds) {
    using std::chrono::seconds;
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(0)), "Elapsed Time: 0:00:00");
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(75)), "Elapsed Time: 0:01:15");
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(3705)), "Elapsed Time: 1:01:45");
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(40000)), "Elapsed Time: 11:06:40");
    EXPECT_EQ(tarn::ui::elapsedTimeText(seconds(100LL * 24 * 3600)), "Elapsed Time: 2400:00:00");
}
