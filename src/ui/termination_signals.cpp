#include "ui/termination_signals.hpp"

#include <QTimer>
#include <QWidget>
#include <atomic>

#include "platform/process.hpp"
#include "ui/config.hpp"

namespace tarn::ui {
namespace {

std::atomic<bool> g_requested{false};

// Runs in a signal handler or on a thread of the system's: only the atomic store.
void onStop() { g_requested.store(true); }

}  // namespace

void closeOnTerminationSignals(QWidget& window) {
    platform::onStopRequest(onStop);
    // The window's thread looks at the request a few times a second; a close from here is the
    // same as the user's.
    auto* poll = new QTimer(&window);
    QObject::connect(poll, &QTimer::timeout, &window, [&window] {
        if (g_requested.exchange(false)) window.close();
    });
    poll->start(kSignalPollInterval);
}

}  // namespace tarn::ui
