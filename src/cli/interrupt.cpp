#include "cli/cli_context.hpp"
#include "platform/process.hpp"

namespace tarn::cli {
namespace {
StopSignal* g_stop = nullptr;
// Only an atomic store: safe inside a signal handler.
void onStop() { g_stop->request(); }
}  // namespace

void installInterruptHandler(StopSignal& stop) {
    g_stop = &stop;
    platform::onStopRequest(onStop);
}

}  // namespace tarn::cli
