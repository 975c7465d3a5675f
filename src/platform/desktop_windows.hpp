// The Windows desktop, for the window's shell (ui/shell/desktop_shell_windows.cpp). Each call
// returns an empty text, or the failure with the system's own reason.
#pragma once

#include <string>

namespace tarn::platform {

// Notepad with the file: NOTEPAD.EXE "<path>".
std::string startNotepad(const std::string& path);
// The system's Open With dialog for the file, owned by the window `owner` (a HWND).
std::string showOpenWithDialog(const std::string& path, void* owner);
// The address in the default web browser.
std::string openInBrowser(const std::string& url);
// The user's Documents folder (the profile folder when there is none), without a trailing
// separator.
std::string documentsFolder();

}  // namespace tarn::platform
