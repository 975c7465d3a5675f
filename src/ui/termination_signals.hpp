// SIGTERM, SIGINT and SIGHUP (a session ending, the system stopping the program, Ctrl-C in the
// terminal it was started from) close the main window like the user does, so that a running
// job stops through its stop path and leaves its checkpoint.
#pragma once

class QWidget;

namespace tarn::ui {

// Installs the handlers; a signal later closes `window` on the window's thread. Does nothing on
// Windows, which has no such signals for a desktop program.
void closeOnTerminationSignals(QWidget& window);

}  // namespace tarn::ui
