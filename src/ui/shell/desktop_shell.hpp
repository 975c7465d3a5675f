// The shell of the system the program runs on: desktop_shell_linux.cpp (GIO's application
// registry, Qt for the browser and the documents folder) or desktop_shell_windows.cpp (Notepad,
// the shell's Open With dialog, ShellExecuteW, the known Documents folder); the build compiles
// the one for its system.
#pragma once

#include <memory>

#include "ui/shell/shell.hpp"

class QWidget;

namespace tarn::ui {

class DesktopShell : public Shell {
public:
    // The main window, which owns the shell's dialogs.
    virtual void setOwner(QWidget& window) = 0;
};

std::unique_ptr<DesktopShell> makeDesktopShell();

}  // namespace tarn::ui
