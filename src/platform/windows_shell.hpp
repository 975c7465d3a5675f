// The shell of Windows: Notepad for text files, the shell's Open With dialog, the default
// browser through ShellExecuteW, and the known Documents folder. Built only for Windows.
#pragma once

#include "ui/shell.hpp"

namespace tarn::platform {

class WindowsShell final : public ui::Shell {
public:
    // `owner` is the HWND that owns the Open With dialog (null: none); kept as a plain pointer
    // so that this header needs neither <windows.h> nor Qt.
    explicit WindowsShell(void* owner = nullptr) : owner_(owner) {}
    void setOwner(void* owner) { owner_ = owner; }

    std::string openInTextEditor(const std::string& path) override;
    std::string showOpenWith(const std::string& path) override;
    std::string openUrl(const std::string& url) override;
    std::string documentsFolder() override;

private:
    void* owner_;
};

// The command line that starts Notepad with the file: NOTEPAD.EXE "<path>".
std::wstring notepadCommandLine(const std::wstring& path);

}  // namespace tarn::platform
