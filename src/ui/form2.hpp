// The split window "Split Results File": picks the folder, takes the count of records per
// file and runs the split on a worker thread, so both windows stay responsive; "Cancel" (and
// the title-bar close) raise the stop that the worker looks at between records.
#pragma once

#include <QFutureWatcher>
#include <QWidget>
#include <memory>
#include <string>

#include "core/folder_lock.hpp"
#include "core/stop_signal.hpp"
#include "tools/split_results.hpp"
#include "ui/message_box.hpp"
#include "ui/shell/shell.hpp"

namespace Ui {
class Form2;
}

namespace tarn::ui {

class Form2 : public QWidget {
    Q_OBJECT
public:
    // `dataFolder` holds the results file. The window deletes itself once closed and its split
    // has ended.
    Form2(MessageBox& messages, Shell& shell, std::string dataFolder, QWidget* parent = nullptr);
    ~Form2() override;

public Q_SLOTS:
    void Form_Load();
    void Dir1_Change();
    void Command1_Click();
    void Command2_Click();

Q_SIGNALS:
    // After the final message of a split (or its failure message) was shown.
    void splitFinished();

protected:
    void closeEvent(QCloseEvent* event) override;

private:
    void splitEnded();

    std::unique_ptr<Ui::Form2> ui_;
    MessageBox& messages_;
    Shell& shell_;
    std::string dataFolder_;

    // SplitStopRequested: shared with the worker, which may outlive a press of "Cancel".
    std::shared_ptr<StopSignal> splitStopRequested_;
    QFutureWatcher<SplitResult> worker_;
    bool running_ = false;
    bool closeWhenDone_ = false;
    // The results file's folder, held from the start of a split until its worker has finished.
    FolderLock splitLock_;
};

}  // namespace tarn::ui
