#include "ui/desktop_shell.hpp"

#include <gio/gio.h>

#include <QDesktopServices>
#include <QDir>
#include <QStandardPaths>
#include <QUrl>

#include "ui/open_with_dialog.hpp"

namespace tarn::ui {

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

std::string DesktopShell::openInTextEditor(const std::string& path) {
    GAppInfo* editor = g_app_info_get_default_for_type("text/plain", FALSE);
    if (!editor)
        return "No text editor is set up on this system to open " + path +
               ". Open the file with a program of your choice.";
    std::string failure = launchWith(editor, path);
    g_object_unref(editor);
    return failure;
}

std::string DesktopShell::showOpenWith(const std::string& path) {
    OpenWithDialog dialog(path, dialogParent_);
    if (dialog.applicationCount() == 0)
        return "No program on this system is registered to open text files such as " + path + ".";
    if (dialog.exec() != QDialog::Accepted || !dialog.chosen()) return {};
    return launchWith(dialog.chosen(), path);
}

std::string DesktopShell::openUrl(const std::string& url) {
    if (QDesktopServices::openUrl(QUrl(QString::fromStdString(url)))) return {};
    return "The web browser could not be started for " + url + ".";
}

std::string DesktopShell::documentsFolder() {
    QString folder = QStandardPaths::writableLocation(QStandardPaths::DocumentsLocation);
    if (folder.isEmpty() || !QDir(folder).exists()) folder = QDir::homePath();
    return QDir::toNativeSeparators(QDir::cleanPath(folder)).toStdString();
}

}  // namespace tarn::ui
