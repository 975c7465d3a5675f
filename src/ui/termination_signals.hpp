// SIGTERM, SIGINT and SIGHUP (a session ending, the system stopping the program, Ctrl-C in the
// terminal it was started from; on Windows Ctrl-C and the console closing) close the main window
// like the user does, so that a running job stops through its stop path and leaves its checkpoint.
#pragma once

class QWidget;

namespace tarn::ui {

// Installs the handlers; a request later closes `window` on the window's thread. A Windows
// desktop program hears of a session ending through the application's commitDataRequest.
void closeOnTerminationSignals(QWidget& window);

}  // namespace tarn::ui
