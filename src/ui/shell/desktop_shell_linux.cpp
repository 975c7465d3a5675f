#include <gio/gio.h>

#include <QDesktopServices>
#include <QDir>
#include <QStandardPaths>
#include <QUrl>

#include "ui/shell/desktop_shell.hpp"
#include "ui/shell/open_with_dialog.hpp"

namespace tarn::ui {
namespace {

// The shell of a Linux desktop: GIO's application registry for the text editor and the
// Open With chooser, Qt for the browser and the documents folder.
class LinuxShell final : public DesktopShell {
public:
    void setOwner(QWidget& window) override { dialogParent_ = &window; }

    std::string openInTextEditor(const std::string& path) override;
    std::string showOpenWith(const std::string& path) override;
    std::string openUrl(const std::string& url) override;
    std::string documentsFolder() override;

private:
    QWidget* dialogParent_ = nullptr;
};

std::string launchWith(GAppInfo* app, const std::string& path) {
    GFile* file = g_file_new_for_path(path.c_str());
    GList* files = g_list_append(nullptr, file);
    GError* error = nullptr;
    const bool started = g_app_info_launch(app, files, nullptr, &error);
    g_list_free(files);
    g_object_unref(file);
    if (started) return {};
    std::string reason = error ? error->message : "unknown reason";
    if (error) g_error_free(error);
    return "The program " + std::string(g_app_info_get_display_name(app)) +
           " could not be started for " + path + ": " + reason;
}

std::string LinuxShell::openInTextEditor(const std::string& path) {
    GAppInfo* editor = g_app_info_get_default_for_type("text/plain", FALSE);
    if (!editor)
        return "No text editor is set up on this system to open " + path +
               ". Open the file with a program of your choice.";
    std::string failure = launchWith(editor, path);
    g_object_unref(editor);
    return failure;
}

std::string LinuxShell::showOpenWith(const std::string& path) {
    OpenWithDialog dialog(path, dialogParent_);
    if (dialog.applicationCount() == 0)
        return "No program on this system is registered to open text files such as " + path + ".";
    if (dialog.exec() != QDialog::Accepted || !dialog.chosen()) return {};
    return launchWith(dialog.chosen(), path);
}

std::string LinuxShell::openUrl(const std::string& url) {
    if (QDesktopServices::openUrl(QUrl(QString::fromStdString(url)))) return {};
    return "The web browser could not be started for " + url + ".";
}

std::string LinuxShell::documentsFolder() {
    QString folder = QStandardPaths::writableLocation(QStandardPaths::DocumentsLocation);
    if (folder.isEmpty() || !QDir(folder).exists()) folder = QDir::homePath();
    return QDir::toNativeSeparators(QDir::cleanPath(folder)).toStdString();
}

}  // namespace

std::unique_ptr<DesktopShell> makeDesktopShell() { return std::make_unique<LinuxShell>(); }

}  // namespace tarn::ui
