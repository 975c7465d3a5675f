// Both windows as they open, over what the designed forms give: a fixed size, nothing ever
// disabled, every button's and label's text whole in its control, the texts the code sets.
#include <QLabel>

#include "ui/texts.hpp"
#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

TEST_F(WindowTest, BothWindowsOpenWholeAndEnabled) {
    window->show();
    window->spllit_Click();
    QWidget* split = window->splitWindow();
    window->spllit_Click();
    EXPECT_EQ(window->splitWindow(), split) << "one split window at a time";
    ASSERT_TRUE(QTest::qWaitForWindowExposed(window.get()) && QTest::qWaitForWindowExposed(split));
    EXPECT_FALSE(window->windowIcon().isNull());
    EXPECT_EQ(c().Command4->text().toStdString(),
              std::string(ui::kWebLinkCaption) + std::string(ui::kMakerWebAddress));
    for (QWidget* w : {static_cast<QWidget*>(window.get()), split}) {
        EXPECT_EQ(w->minimumSize(), w->maximumSize()) << "the window's size is fixed";
        for (QWidget* child : w->findChildren<QWidget*>()) {
            const std::string name = child->objectName().toStdString();
            EXPECT_TRUE(child->isEnabled()) << name;
            QString text = child->property("text").toString();
            if (!child->isVisible() ||
                !(qobject_cast<QAbstractButton*>(child) || qobject_cast<QLabel*>(child)))
                continue;
            EXPECT_LE(child->fontMetrics().horizontalAdvance(text.trimmed()), child->width())
                << name << " cuts \"" << text.toStdString() << '"';
        }
    }
}
