// The windows are laid out in fixed pixel places for an 8-point sans-serif font of about
// 11 pixels; Arial-metric fonts fill those places without clipping.
#pragma once

#include <QFont>
#include <QWidget>

namespace tarn::ui {

inline void applyDesignedFont(QWidget* window) {
    QFont font;
    font.setFamilies({"Liberation Sans", "Arial", "Nimbus Sans", "Helvetica"});
    font.setPixelSize(11);
    window->setFont(font);
}

}  // namespace tarn::ui
