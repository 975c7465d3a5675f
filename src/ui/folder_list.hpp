// The folder list of the split window: the folders from the root down to the current one,
// then the current folder's subfolders. Opening a folder (double-click or Enter) makes it the
// current one; a folder that is only highlighted does not count. Every change of the current
// folder, by the user or by setPath, raises changed().
#pragma once

#include <QString>
#include <QTreeWidget>

namespace tarn::ui {

class FolderList : public QTreeWidget {
    Q_OBJECT
public:
    explicit FolderList(QWidget* parent = nullptr);

    QString path() const { return path_; }
    // An empty or missing folder leaves the current one as it is.
    void setPath(const QString& path);

Q_SIGNALS:
    void changed();

protected:
    // The list reads as open folders over closed ones; no expand or collapse marks.
    void drawBranches(QPainter*, const QRect&, const QModelIndex&) const override {}

private:
    void rebuild();

    QString path_;
};

}  // namespace tarn::ui
