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


TEST_F(WindowTest, OpensInItsDesignedState) {
    EXPECT_EQ(window->windowTitle(), "Brindle - Tarn - Prime Numbers");
    EXPECT_FALSE(window->windowIcon().isNull());
    EXPECT_EQ(window->centralWidget()->size(), QSize(287, 419));
    const std::pair<QString, QString> texts[] = {
        {c().Frame1->title(), "Generate Primes "},
        {c().Frame2->title(), "Test Prime or Factorize"},
        {c().Label1->text(), "Up to"},
        {c().Text1->text(), "100"},
        {c().Label3->text(), "Enumerate results"},
        {c().Label4->text(), "Open results when finished"},
        {c().Label5->text(), "INFO:"},
        {c().Label6->text(), "Elapsed Time: "},
        {c().Command1->text(), "Generate"},
        {c().Command3->text(), "Resume"},
        {c().Label2->text(), "Number"},
        {c().Text2->text(), "100"},
        {c().Command2->text(), "Test"},
        {c().Command6->text(), "Factorize"},
        {c().Label7->text(), "Press Test or Factorize to Calculate..."},
        {c().Text4->toPlainText(), ""},
        {c().Command5->text(), "Cancel all calculations"},
        {c().Command4->text(), "Click here: Visit Brindle at https://brindle.example"}};
    for (const auto& [shown, designed] : texts) EXPECT_EQ(shown, designed);
    EXPECT_FALSE(c().Check1->isChecked());
    EXPECT_TRUE(c().Check2->isChecked());
    EXPECT_EQ(c().ProgressBar1->value(), 0);
    EXPECT_EQ(c().Text4->verticalScrollBarPolicy(), Qt::ScrollBarAlwaysOn);
    // Bold blue frame captions, a bold stop button, a red information line; the rest plain.
    EXPECT_TRUE(c().Frame1->font().bold() && c().Frame2->font().bold());
    EXPECT_TRUE(c().Frame1->styleSheet().contains("#0000ff"));
    EXPECT_TRUE(c().Command5->font().bold());
    EXPECT_FALSE(c().Label1->font().bold());
    EXPECT_TRUE(c().Label5->styleSheet().contains("#ff0000"));
    // Nothing is ever disabled or hidden.
    for (QWidget* w : window->centralWidget()->findChildren<QWidget*>())
        EXPECT_TRUE(w->isEnabled()) << w->objectName().toStdString();
}

TEST_F(WindowTest, ControlsStandWhereDesigned) {
    // Name, then left, top, width and height in twips inside the frame or the window.
    const std::vector<std::pair<QWidget*, QRect>> places = {
        {c().Frame1, {240, 120, 3855, 2775}},   {c().Label1, {360, 360, 855, 255}},
        {c().Text1, {840, 360, 2415, 285}},     {c().Check1, {360, 720, 135, 195}},
        {c().Label3, {720, 720, 2295, 255}},    {c().Check2, {360, 960, 135, 195}},
        {c().Label4, {720, 960, 2295, 255}},    {c().Label5, {360, 1200, 3015, 615}},
        {c().Label6, {360, 1800, 2895, 255}},   {c().Command1, {360, 2040, 1575, 255}},
        {c().Command3, {2040, 2040, 1335, 255}}, {c().ProgressBar1, {360, 2400, 3015, 255}},
        {c().Frame2, {240, 3000, 3855, 2415}},  {c().Label2, {360, 360, 615, 255}},
        {c().Text2, {1080, 360, 2295, 285}},    {c().Command2, {360, 840, 1335, 255}},
        {c().Command6, {1800, 840, 1575, 255}}, {c().Label7, {360, 1200, 3015, 255}},
        {c().Text4, {120, 1440, 3615, 855}},    {c().Command5, {240, 5520, 3855, 255}},
        {c().Command4, {240, 5880, 3855, 255}},
    };
    for (const auto& [widget, twips] : places) {
        const QRect pixels(twips.x() / 15, twips.y() / 15, twips.width() / 15, twips.height() / 15);
        EXPECT_EQ(widget->geometry(), pixels) << widget->objectName().toStdString();
    }
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

    // An installed copy opens the installed read-me, and only that one.
    TempFolder doc;
    shell.failure.clear();
    window->setReadmePath(doc.path() + "README.txt");
    window->readme_Click();
    EXPECT_EQ(shell.edited.size(), 2u);
    writeFile(doc.path() + "README.txt", "installed\n");
    window->readme_Click();
    ASSERT_EQ(shell.edited.size(), 3u);
    EXPECT_EQ(shell.edited[2], doc.path() + "README.txt");
}

TEST_F(WindowTest, WebLinkOpensTheMakersSite) {
    c().Command4->click();
    EXPECT_EQ(shell.urls, std::vector<std::string>{"https://brindle.example"});
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
