#include "platform/desktop_windows.hpp"
#include "ui/shell/desktop_shell.hpp"
#include "ui/shell/native_window.hpp"

namespace tarn::ui {
namespace {

// The shell of Windows. The owner of the Open With dialog is kept as the window's handle.
class WindowsShell final : public DesktopShell {
public:
    void setOwner(QWidget& window) override { owner_ = nativeWindow(window); }

    std::string openInTextEditor(const std::string& path) override {
        return platform::startNotepad(path);
    }
    std::string showOpenWith(const std::string& path) override {
        return platform::showOpenWithDialog(path, owner_);
    }
    std::string openUrl(const std::string& url) override { return platform::openInBrowser(url); }
    std::string documentsFolder() override { return platform::documentsFolder(); }

private:
    void* owner_ = nullptr;
};

}  // namespace

std::unique_ptr<DesktopShell> makeDesktopShell() { return std::make_unique<WindowsShell>(); }

}  // namespace tarn::ui
