// tarn: the desktop program.
#include <QApplication>

#include "core/app_folder.hpp"
#include "core/data_folder.hpp"
#ifdef _WIN32
#include "platform/windows_shell.hpp"
#else
#include "ui/desktop_shell.hpp"
#endif
#include "ui/form1.hpp"
#include "ui/message_box.hpp"

int main(int argc, char** argv) {
    QApplication app(argc, argv);
    QApplication::setApplicationName("Tarn");
    QApplication::setApplicationVersion(TARN_VERSION);
    QApplication::setDesktopFileName("tarn");

    tarn::ui::QtMessageBox messages;
#ifdef _WIN32
    tarn::platform::WindowsShell shell;
#else
    tarn::ui::DesktopShell shell;
#endif
    const std::string programFolder = tarn::AppFolder();
    tarn::ui::Form1 window(messages, shell, tarn::dataFolder(programFolder));
    window.setReadmePath(tarn::readmePath(programFolder));
    messages.setParent(&window);
#ifdef _WIN32
    shell.setOwner(reinterpret_cast<void*>(window.winId()));
#else
    shell.setDialogParent(&window);
#endif
    window.Form_Load();
    window.show();
    return QApplication::exec();
}
