// What a user notices of a shown window, checked on every control found by walking its widget
// tree: each control inside its panel and clear of the others, every text whole where its style
// draws it, Tab going round in order, and a screenshot showing each control as it draws itself.
#pragma once

#include <gtest/gtest.h>

#include <QCheckBox>
#include <QGroupBox>
#include <QLabel>
#include <QLineEdit>
#include <QStyleOption>
#include <QTest>
#include <algorithm>
#include <vector>

namespace tarn::test {

// Plain widgets and group boxes hold controls; any other widget is one control, whatever parts
// (scroll bars, a viewport) it is built of.
inline bool isPanel(const QWidget* w) {
    return w->inherits("QGroupBox") || w->metaObject() == &QWidget::staticMetaObject;
}

// The visible controls of a window or panel as a user reads them, top to bottom and left to
// right; `deep` takes each panel's controls right after the panel.
inline std::vector<QWidget*> controlsIn(const QWidget* panel, bool deep = false) {
    std::vector<QWidget*> found, all;
    for (QWidget* w : panel->findChildren<QWidget*>(Qt::FindDirectChildrenOnly))
        if (w->isVisible() && !w->isWindow()) found.push_back(w);
    std::stable_sort(found.begin(), found.end(), [](QWidget* a, QWidget* b) {
        return std::pair(a->y(), a->x()) < std::pair(b->y(), b->x());
    });
    for (QWidget* w : found) {
        all.push_back(w);
        if (deep && isPanel(w))
            for (QWidget* inner : controlsIn(w, true)) all.push_back(inner);
    }
    return all;
}

// A control's text with the rectangle its style draws it in and how it places it there; a check
// box without text has its indicator there, a control without text its whole rectangle.
struct TextPlace {
    QString text;
    QRect area;
    int flags = Qt::AlignCenter;
};
inline TextPlace textPlace(QWidget* w) {
    const QStyle* style = w->style();
    if (auto* label = qobject_cast<QLabel*>(w))
        return {label->text(), label->contentsRect(),
                int(label->alignment()) | (label->wordWrap() ? Qt::TextWordWrap : 0)};
    if (auto* box = qobject_cast<QGroupBox*>(w)) {
        QStyleOptionGroupBox opt;
        opt.initFrom(box);
        opt.text = box->title();
        opt.textAlignment = box->alignment();
        opt.subControls = QStyle::SC_GroupBoxLabel | QStyle::SC_GroupBoxFrame;
        return {opt.text,
                style->subControlRect(QStyle::CC_GroupBox, &opt, QStyle::SC_GroupBoxLabel, box),
                int(box->alignment())};
    }
    if (auto* button = qobject_cast<QAbstractButton*>(w)) {
        QStyleOptionButton opt;
        opt.initFrom(button);
        opt.text = button->text();
        if (!qobject_cast<QCheckBox*>(w))
            return {opt.text, style->subElementRect(QStyle::SE_PushButtonContents, &opt, button)};
        const auto part =
            opt.text.isEmpty() ? QStyle::SE_CheckBoxIndicator : QStyle::SE_CheckBoxContents;
        return {opt.text, style->subElementRect(part, &opt, button),
                Qt::AlignLeft | Qt::AlignVCenter};
    }
    if (auto* edit = qobject_cast<QLineEdit*>(w)) {
        QStyleOptionFrame opt;
        opt.initFrom(edit);
        opt.lineWidth = style->pixelMetric(QStyle::PM_DefaultFrameWidth, &opt, edit);
        const QRect r = style->subElementRect(QStyle::SE_LineEditContents, &opt, edit);
        // QLineEdit keeps two more pixels clear on each side.
        return {edit->text(), r.marginsRemoved(edit->textMargins()).adjusted(2, 0, -2, 0),
                Qt::AlignLeft | Qt::AlignVCenter};
    }
    return {{}, w->rect()};
}

// The lines a text takes in its place (wrapped where the place wraps it), to the nearest pixel.
// Qt cuts a text whose lines overrun the place it is drawn in; trailing blanks show nothing.
inline QRect textRect(const QWidget* w, const TextPlace& place) {
    return QFontMetricsF(w->font())
        .boundingRect(QRectF(place.area), place.flags, place.text.trimmed())
        .toRect();
}

// What of a control a user sees, in its own coordinates: of a label only its text.
inline QRect visiblePart(QWidget* w) {
    const TextPlace place = textPlace(w);
    if (!qobject_cast<QLabel*>(w)) return w->rect();
    return place.text.isEmpty() ? QRect() : textRect(w, place);
}

inline std::string name(const QWidget* w) { return w->objectName().toStdString(); }

// The window's title and every text it shows, in reading order, joined by "|".
inline std::string shownTexts(QWidget* window) {
    QStringList texts{window->windowTitle()};
    for (QWidget* w : controlsIn(window, true))
        if (const QString text = textPlace(w).text; !text.isEmpty()) texts << text;
    return texts.join('|').toStdString();
}

// Every control inside its panel, its text whole in its place, clear of the others and of the
// panel's title.
inline void checkLayout(QWidget* panel) {
    std::vector<std::pair<QWidget*, QRect>> parts;
    if (qobject_cast<QGroupBox*>(panel))
        parts.emplace_back(panel, textRect(panel, textPlace(panel)));
    for (QWidget* w : controlsIn(panel)) {
        const TextPlace place = textPlace(w);
        EXPECT_TRUE(panel->rect().contains(w->geometry())) << name(w) << " is cut off";
        EXPECT_TRUE(w->rect().contains(place.area) &&
                    (place.text.isEmpty() || place.area.contains(textRect(w, place))))
            << name(w) << " is too small for "
            << (place.text.isEmpty() ? "its indicator" : '"' + place.text.toStdString() + '"');
        if (isPanel(w)) checkLayout(w);
        parts.emplace_back(w, visiblePart(w).translated(w->pos()));
    }
    for (std::size_t i = 0; i < parts.size(); ++i)
        for (std::size_t j = 0; j < i; ++j)
            EXPECT_FALSE(parts[i].second.intersects(parts[j].second))
                << name(parts[i].first) << " overlaps " << name(parts[j].first);
}

// Starts at the control with the focus and presses Tab until back at the first of `order`, the
// names of the controls separated by blanks.
inline void checkTabOrder(QWidget* window, const QString& order) {
    QStringList chain{window->focusWidget()->objectName()};
    for (qsizetype presses = order.count(' ') + 1; presses > 0; --presses) {
        QTest::keyClick(window->focusWidget(), Qt::Key_Tab);
        chain << window->focusWidget()->objectName();
    }
    EXPECT_EQ(chain.join(' ').toStdString(),
              (order + ' ' + order.section(' ', 0, 0)).toStdString());
}

// Saves the window's screenshot, in which each control must look as it does drawn alone over
// its panel.
inline void checkScreenshot(QWidget* window, const QString& file) {
    const QImage shot = window->grab().toImage().convertToFormat(QImage::Format_RGB32);
    EXPECT_TRUE(shot.save(file)) << file.toStdString();
    for (QWidget* w : controlsIn(window, true)) {
        const QRect part = visiblePart(w), inShot = part.translated(w->mapTo(window, QPoint()));
        if (part.isEmpty()) continue;
        QImage alone(part.size(), QImage::Format_RGB32);
        w->parentWidget()->render(&alone, {}, part.translated(w->pos()),
                                  QWidget::DrawWindowBackground);
        w->render(&alone, {}, part, QWidget::DrawChildren);
        EXPECT_TRUE(shot.rect().contains(inShot) && alone == shot.copy(inShot))
            << name(w) << " does not show whole in " << file.toStdString();
    }
}

}  // namespace tarn::test
