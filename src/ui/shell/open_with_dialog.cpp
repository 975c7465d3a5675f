#include "ui/shell/open_with_dialog.hpp"

#include <gio/gio.h>

#include <QDialogButtonBox>
#include <QFileInfo>
#include <QIcon>
#include <QLabel>
#include <QListWidget>
#include <QVBoxLayout>

namespace tarn::ui {

OpenWithDialog::OpenWithDialog(const std::string& path, QWidget* parent)
    : QDialog(parent), list_(new QListWidget(this)) {
    setWindowTitle(QStringLiteral("Open With"));
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(
        new QLabel(QStringLiteral("Choose the program you want to use to open the file %1:")
                       .arg(QFileInfo(QString::fromStdString(path)).fileName()),
                   this));
    layout->addWidget(list_);
    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);
    layout->addWidget(buttons);
    connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
    connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);
    connect(list_, &QListWidget::itemActivated, this, &QDialog::accept);

    auto add = [this](GList* found) {
        for (GList* l = found; l; l = l->next) {
            auto* app = G_APP_INFO(l->data);
            const bool known = std::any_of(apps_.begin(), apps_.end(),
                                           [app](GAppInfo* a) { return g_app_info_equal(a, app); });
            if (known || !g_app_info_should_show(app)) {
                g_object_unref(app);
                continue;
            }
            apps_.push_back(app);
            QIcon icon;
            if (GIcon* gicon = g_app_info_get_icon(app)) {
                gchar* name = g_icon_to_string(gicon);
                if (name) icon = QIcon::fromTheme(QString::fromUtf8(name));
                g_free(name);
            }
            list_->addItem(new QListWidgetItem(
                icon, QString::fromUtf8(g_app_info_get_display_name(app)), list_));
        }
        g_list_free(found);
    };
    add(g_app_info_get_recommended_for_type("text/plain"));
    add(g_app_info_get_all_for_type("text/plain"));
    if (list_->count() > 0) list_->setCurrentRow(0);
    resize(360, 320);
}

OpenWithDialog::~OpenWithDialog() {
    for (GAppInfo* app : apps_) g_object_unref(app);
}

GAppInfo* OpenWithDialog::chosen() const {
    const int row = list_->currentRow();
    return row >= 0 && row < applicationCount() ? apps_[row] : nullptr;
}

}  // namespace tarn::ui
