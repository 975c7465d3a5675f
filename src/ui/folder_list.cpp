#include "ui/folder_list.hpp"

#include <QDir>
#include <QFileInfo>
#include <QHeaderView>
#include <QStyle>

namespace tarn::ui {
namespace {
constexpr int kPathRole = Qt::UserRole;
}

FolderList::FolderList(QWidget* parent) : QTreeWidget(parent), path_(QDir::currentPath()) {
    setHeaderHidden(true);
    setColumnCount(1);
    setRootIsDecorated(false);
    setIndentation(10);
    setUniformRowHeights(true);
    setItemsExpandable(false);
    setExpandsOnDoubleClick(false);
    connect(this, &QTreeWidget::itemActivated, this,
            [this](QTreeWidgetItem* item, int) { setPath(item->data(0, kPathRole).toString()); });
    rebuild();
}

void FolderList::setPath(const QString& path) {
    if (path.isEmpty()) return;
    const QFileInfo info(path);
    if (!info.isDir()) return;
    const QString clean = QDir::cleanPath(info.absoluteFilePath());
    if (clean == path_) return;
    path_ = clean;
    rebuild();
    Q_EMIT changed();
}

void FolderList::rebuild() {
    clear();
    const QIcon open = style()->standardIcon(QStyle::SP_DirOpenIcon);
    const QIcon closed = style()->standardIcon(QStyle::SP_DirClosedIcon);

    // The chain of open folders from the root down to the current one.
    QTreeWidgetItem* parent = nullptr;
    QString walked;
    const QStringList parts = path_.split(QLatin1Char('/'), Qt::SkipEmptyParts);
    const auto addItem = [&](const QString& text, const QString& itemPath, const QIcon& icon) {
        auto* item = parent ? new QTreeWidgetItem(parent) : new QTreeWidgetItem(this);
        item->setText(0, text);
        item->setIcon(0, icon);
        item->setData(0, kPathRole, itemPath);
        return item;
    };
    parent = addItem(QStringLiteral("/"), QStringLiteral("/"), open);
    for (const QString& part : parts) {
        walked += QLatin1Char('/') + part;
        parent = addItem(part, walked, open);
    }
    QTreeWidgetItem* current = parent;

    const QDir dir(path_);
    const QStringList subfolders =
        dir.entryList(QDir::Dirs | QDir::NoDotAndDotDot, QDir::Name | QDir::IgnoreCase);
    for (const QString& name : subfolders) addItem(name, dir.filePath(name), closed);
    expandAll();
    setCurrentItem(current);
    scrollToItem(current, QAbstractItemView::PositionAtTop);
}

}  // namespace tarn::ui
