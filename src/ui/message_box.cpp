#include "ui/message_box.hpp"

#include <QMessageBox>

namespace tarn::ui {

MessageBox::Answer QtMessageBox::show(const std::string& text, const std::string& title,
                                      Buttons buttons) {
    QMessageBox box(QMessageBox::NoIcon, QString::fromStdString(title),
                    QString::fromStdString(text),
                    buttons == Buttons::Ok ? QMessageBox::Ok
                                           : (QMessageBox::Ok | QMessageBox::Cancel),
                    parent_);
    if (buttons == Buttons::OkCancel) box.setEscapeButton(QMessageBox::Cancel);
    const int pressed = box.exec();
    return pressed == QMessageBox::Ok ? Answer::Ok
                                      : (buttons == Buttons::Ok ? Answer::Ok : Answer::Cancel);
}

}  // namespace tarn::ui
