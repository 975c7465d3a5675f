// tarn: the desktop program.
#include <QApplication>

#include "core/app_folder.hpp"
#include "ui/desktop_shell.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"

int main(int argc, char** argv) {
    QApplication app(argc, argv);
    QApplication::setApplicationName("Tarn");
    QApplication::setApplicationVersion(TARN_VERSION);
    QApplication::setDesktopFileName("tarn");

    tarn::ui::QtMessageBox messages;
    tarn::ui::DesktopShell shell;
    tarn::ui::Form1 window(messages, shell, tarn::AppFolder());
    messages.setParent(&window);
    shell.setDialogParent(&window);
    window.Form_Load();
    window.show();
    return QApplication::exec();
}
