#include "ui/form2.hpp"

#include <QCloseEvent>
#include <QtConcurrent/QtConcurrentRun>

#include "core/file_names.hpp"
#include "tools/split_entry.hpp"
#include "ui/decimal_separator.hpp"
#include "ui/folder_list.hpp"
#include "ui/texts.hpp"
#include "ui_form2.h"

namespace tarn::ui {
namespace {

// As close to the classic 8-point dialog font as the platform offers.
QFont dialogFont(const QFont& base) {
    QFont font = base;
    font.setFamilies({QStringLiteral("MS Sans Serif"), QStringLiteral("Microsoft Sans Serif"),
                      QStringLiteral("Liberation Sans"), QStringLiteral("Arial"),
                      QStringLiteral("Nimbus Sans")});
    font.setPointSizeF(8.25);
    return font;
}

}  // namespace

Form2::Form2(MessageBox& messages, Shell& shell, std::string dataFolder, QWidget* parent)
    : QWidget(parent, Qt::Window),
      ui_(std::make_unique<Ui::Form2>()),
      messages_(messages),
      shell_(shell),
      dataFolder_(std::move(dataFolder)) {
    setFont(dialogFont(font()));
    ui_->setupUi(this);
    setFixedSize(408, 221);
    setAttribute(Qt::WA_DeleteOnClose);

    connect(ui_->Dir1, &FolderList::changed, this, &Form2::Dir1_Change);
    connect(ui_->Command1, &QPushButton::clicked, this, &Form2::Command1_Click);
    connect(ui_->Command2, &QPushButton::clicked, this, &Form2::Command2_Click);
    connect(&worker_, &QFutureWatcher<SplitResult>::finished, this, &Form2::splitEnded);

    Form_Load();
    ui_->Dir1->setFocus();
}

Form2::~Form2() {
    // The window can go with its owner while a split runs: stop it and let it finish its
    // last record, so that no thread writes files behind the program's back.
    if (running_) {
        splitStopRequested_->request();
        worker_.waitForFinished();
    }
}

void Form2::Form_Load() {
    ui_->Dir1->setPath(QString::fromStdString(shell_.documentsFolder()));
    ui_->Label1->setText(ui_->Dir1->path());
}

void Form2::Dir1_Change() { ui_->Label1->setText(ui_->Dir1->path()); }

void Form2::Command1_Click() {
    // The window is modeless and nothing is disabled, so a split can be asked for while one
    // runs; a job on the same files (here or elsewhere) is kept off by the folder's lock.
    if (running_) {
        messages_.show(std::string(kSplitAlreadyRunningMessage), std::string(kInfoTitle));
        return;
    }
    const std::string input = resultsFilePath(dataFolder_);
    const std::string prefix = splitNamePrefix(ui_->Label1->text().toStdString());
    const EntryResult count =
        parseRecordsPerFile(ui_->Text1->text().toStdString(), decimalSeparator());
    if (!count.accepted()) {
        messages_.show(count.message, std::string(kInfoTitle));
        return;
    }
    // A job of the main window, another window or tarn-cli may be on the same files.
    FolderLock lock = FolderLock::tryTake(dataFolder_);
    if (lock.busy()) {
        messages_.show(folderBusyMessage(dataFolder_), std::string(kInfoTitle));
        return;
    }
    splitLock_ = std::move(lock);

    splitStopRequested_ = std::make_shared<StopSignal>();
    running_ = true;
    ui_->Command2->setText(QString::fromUtf8(kSplitCancelCaption));
    worker_.setFuture(QtConcurrent::run(
        [input, prefix, perFile = count.number->whole(), stop = splitStopRequested_] {
            return splitResultsFile(input, prefix, perFile, *stop);
        }));
}

void Form2::Command2_Click() {
    if (splitStopRequested_) splitStopRequested_->request();
    close();
}

void Form2::closeEvent(QCloseEvent* event) {
    if (!running_) {
        event->accept();
        return;
    }
    // Closed during a split, by "Cancel" or by the title bar: stop it like "Cancel" does, and
    // keep the window (hidden) until the worker has handed back its result.
    splitStopRequested_->request();
    closeWhenDone_ = true;
    hide();
    event->ignore();
}

void Form2::splitEnded() {
    const SplitResult result = worker_.result();
    running_ = false;
    splitLock_.release();
    ui_->Command2->setText(QString::fromUtf8(kSplitCloseCaption));
    std::string message = result.message;
    if (result.status != SplitStatus::Failed) {
        message = splitDoneMessage(result.files);
        if (result.cutBytes > 0)
            message += ' ' + cutRecordNote(resultsFilePath(dataFolder_), result.cutBytes);
    }
    messages_.show(message, std::string(kInfoTitle));
    Q_EMIT splitFinished();
    if (closeWhenDone_ && testAttribute(Qt::WA_DeleteOnClose)) deleteLater();
}

}  // namespace tarn::ui
