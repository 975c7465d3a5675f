#include "ui/termination_signals.hpp"

#ifdef _WIN32

namespace tarn::ui {

// Windows sends a desktop program none of these signals: the end of a session reaches the window
// as the application's commitDataRequest.
void closeOnTerminationSignals(QWidget&) {}

}  // namespace tarn::ui

#else

#include <signal.h>
#include <sys/socket.h>
#include <unistd.h>

#include <QSocketNotifier>
#include <QWidget>

namespace tarn::ui {
namespace {

int g_pipe[2] = {-1, -1};

extern "C" void onTermination(int) {
    // Only async-signal-safe work here: the window's thread reads the byte.
    const char byte = 1;
    [[maybe_unused]] const auto written = ::write(g_pipe[0], &byte, 1);
}

}  // namespace

void closeOnTerminationSignals(QWidget& window) {
    if (g_pipe[0] >= 0 || ::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, g_pipe) != 0) return;
    auto* notifier = new QSocketNotifier(g_pipe[1], QSocketNotifier::Read, &window);
    QObject::connect(notifier, &QSocketNotifier::activated, &window, [&window] {
        char byte;
        [[maybe_unused]] const auto read = ::read(g_pipe[1], &byte, 1);
        window.close();
    });
    struct sigaction action {};
    action.sa_handler = onTermination;
    sigemptyset(&action.sa_mask);
    action.sa_flags = SA_RESTART;
    for (int signal : {SIGTERM, SIGINT, SIGHUP}) sigaction(signal, &action, nullptr);
}

}  // namespace tarn::ui

#endif
