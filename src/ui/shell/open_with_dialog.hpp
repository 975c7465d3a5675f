// Our Open With chooser: the applications the desktop knows for text files, the recommended
// ones first, then all others.
#pragma once

#include <QDialog>
#include <string>
#include <vector>

typedef struct _GAppInfo GAppInfo;
class QListWidget;

namespace tarn::ui {

class OpenWithDialog final : public QDialog {
    Q_OBJECT

public:
    explicit OpenWithDialog(const std::string& path, QWidget* parent = nullptr);
    ~OpenWithDialog() override;

    int applicationCount() const { return static_cast<int>(apps_.size()); }
    // The application picked, owned by the dialog; null when none was picked.
    GAppInfo* chosen() const;

private:
    std::vector<GAppInfo*> apps_;
    QListWidget* list_;
};

}  // namespace tarn::ui
