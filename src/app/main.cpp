// tarn: the desktop program.
#include <QApplication>
#include <QSessionManager>

#include "core/app_folder.hpp"
#include "core/data_folder.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#include "ui/shell/desktop_shell.hpp"
#include "ui/termination_signals.hpp"

int main(int argc, char** argv) {
    QApplication app(argc, argv);
    QApplication::setApplicationName("Tarn");
    QApplication::setApplicationVersion(TARN_VERSION);
    QApplication::setDesktopFileName("tarn");

    tarn::ui::QtMessageBox messages;
    const std::unique_ptr<tarn::ui::DesktopShell> shell = tarn::ui::makeDesktopShell();
    const std::string programFolder = tarn::AppFolder();
    tarn::ui::Form1 window(messages, *shell, tarn::dataFolder(programFolder));
    window.setReadmePath(tarn::readmePath(programFolder));
    messages.setParent(&window);
    shell->setOwner(window);
    // The program ends when the main window has really closed, which waits for a running job
    // to leave through its stop path; the split window alone does not keep it alive.
    QApplication::setQuitOnLastWindowClosed(false);
    QObject::connect(&window, &tarn::ui::Form1::closed, &app, &QApplication::quit,
                     Qt::QueuedConnection);
    // Logging off or shutting down closes the window like the user does.
    QObject::connect(&app, &QGuiApplication::commitDataRequest, &window,
                     [&window](QSessionManager&) { window.close(); });
    tarn::ui::closeOnTerminationSignals(window);
    window.Form_Load();
    window.show();
    return QApplication::exec();
}
