// tarn: the desktop program.
#include <QApplication>
#include <QSessionManager>

#include "core/app_folder.hpp"
#include "core/data_folder.hpp"
#ifdef _WIN32
#include "platform/windows_shell.hpp"
#else
#include "ui/desktop_shell.hpp"
#endif
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#ifndef _WIN32
#include "ui/termination_signals.hpp"
#endif

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
    // The program ends when the main window has really closed, which waits for a running job
    // to leave through its stop path; the split window alone does not keep it alive.
    QApplication::setQuitOnLastWindowClosed(false);
    QObject::connect(&window, &tarn::ui::Form1::closed, &app, &QApplication::quit,
                     Qt::QueuedConnection);
    // Logging off or shutting down closes the window like the user does.
    QObject::connect(&app, &QGuiApplication::commitDataRequest, &window,
                     [&window](QSessionManager&) { window.close(); });
#ifndef _WIN32
    tarn::ui::closeOnTerminationSignals(window);
#endif
    window.Form_Load();
    window.show();
    return QApplication::exec();
}
