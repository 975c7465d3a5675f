#include <csignal>

#include "cli/cli_context.hpp"

namespace tarn::cli {
namespace {
StopSignal* g_stop = nullptr;
extern "C" void onSignal(int) {
    // Only an atomic store: safe inside a signal handler.
    if (g_stop) g_stop->request();
}
}  // namespace

void installInterruptHandler(StopSignal& stop) {
    g_stop = &stop;
    struct sigaction action {};
    action.sa_handler = onSignal;
    sigemptyset(&action.sa_mask);
    // A closed terminal (SIGHUP) stops the job like Ctrl-C, so its checkpoint is written.
    for (const int number : {SIGINT, SIGTERM, SIGHUP}) sigaction(number, &action, nullptr);
}

}  // namespace tarn::cli
