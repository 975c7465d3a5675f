// The shell of a Linux desktop: GIO's application registry for the text editor and the
// Open With chooser, Qt for the browser and the documents folder.
#pragma once

#include "ui/shell.hpp"

class QWidget;

namespace tarn::ui {

class DesktopShell final : public Shell {
public:
    explicit DesktopShell(QWidget* dialogParent = nullptr) : dialogParent_(dialogParent) {}
    void setDialogParent(QWidget* parent) { dialogParent_ = parent; }

    std::string openInTextEditor(const std::string& path) override;
    std::string showOpenWith(const std::string& path) override;
    std::string openUrl(const std::string& url) override;
    std::string documentsFolder() override;

private:
    QWidget* dialogParent_;
};

}  // namespace tarn::ui
