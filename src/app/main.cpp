// tarn: the desktop program.
#include <QApplication>
#include <QSessionManager>
#include <cstdio>
#include <cstring>

#include "core/app_folder.hpp"
#include "core/data_folder.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#include "ui/shell/desktop_shell.hpp"
#include "ui/termination_signals.hpp"

namespace {

constexpr char kHelp[] =
    "Tarn: generate, test, factorize and split prime numbers in a window.\n"
    "Usage: tarn [OPTIONS]\n"
    "\n"
    "Options:\n"
    "  -h,--help                   Print this help message and exit\n"
    "  --version                   Display program version information and exit\n"
    "\n"
    "Qt's own options (such as -platform NAME or -style NAME) are taken as well.\n";

// --help and --version answer before the window system is reached, so that they also work
// without a display.
bool answeredInformationOption(int argc, char** argv, int& code) {
    for (int i = 1; i < argc; ++i) {
        const bool help = std::strcmp(argv[i], "--help") == 0 || std::strcmp(argv[i], "-h") == 0;
        if (!help && std::strcmp(argv[i], "--version") != 0) continue;
        std::fputs(help ? kHelp : "tarn " TARN_VERSION "\n", stdout);
        code = std::fflush(stdout) == 0 ? 0 : 1;
        return true;
    }
    return false;
}

}  // namespace

int main(int argc, char** argv) {
    if (int code = 0; answeredInformationOption(argc, argv, code)) return code;
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
