#include "ui/form1.hpp"

#include <QCloseEvent>

#include "core/app_folder.hpp"
#include "core/file_names.hpp"
#include "ui/config.hpp"
#include "ui/designed_font.hpp"
#include "ui/message_box.hpp"
#include "ui/shell/shell.hpp"
#include "ui/texts.hpp"
#include "ui_form1.h"

namespace tarn::ui {

Form1::Form1(MessageBox& messages, Shell& shell, std::string folder, QWidget* parent)
    : QMainWindow(parent),
      ui_(std::make_unique<Ui::Form1>()),
      messages_(messages),
      shell_(shell),
      folder_(std::move(folder)) {
    ui_->setupUi(this);
    applyDesignedFont(this);
    // The frames' captions are bold; what they hold is not.
    for (QWidget* frame : {static_cast<QWidget*>(ui_->Frame1), static_cast<QWidget*>(ui_->Frame2)})
        for (QWidget* child : frame->findChildren<QWidget*>()) {
            QFont f = font();
            f.setBold(false);
            child->setFont(f);
        }
    // The designed boxes are 9 pixels wide: draw the indicator to fit them.
    for (QWidget* box : {static_cast<QWidget*>(ui_->Check1), static_cast<QWidget*>(ui_->Check2)})
        box->setStyleSheet("QCheckBox::indicator { width: 9px; height: 9px; }");
    ui_->Command4->setText(QString::fromUtf8(kWebLinkCaption) +
                           QString::fromUtf8(kMakerWebAddress));
    setFixedSize(sizeHint());
    ui_->Text1->setFocus();

    connect(ui_->Command1, &QPushButton::clicked, this, &Form1::Command1_Click);
    connect(ui_->Command2, &QPushButton::clicked, this, &Form1::Command2_Click);
    connect(ui_->Command3, &QPushButton::clicked, this, &Form1::Command3_Click);
    connect(ui_->Command4, &QPushButton::clicked, this, &Form1::Command4_Click);
    connect(ui_->Command5, &QPushButton::clicked, this, &Form1::Command5_Click);
    connect(ui_->Command6, &QPushButton::clicked, this, &Form1::Command6_Click);
    connect(ui_->show, &QAction::triggered, this, &Form1::show_Click);
    connect(ui_->spllit, &QAction::triggered, this, &Form1::spllit_Click);
    connect(ui_->exit, &QAction::triggered, this, &Form1::exit_Click);
    connect(ui_->readme, &QAction::triggered, this, &Form1::readme_Click);

    progressTimer_.setInterval(kProgressInterval);
    connect(&progressTimer_, &QTimer::timeout, this, &Form1::refreshJobDisplay);
}

Form1::~Form1() { delete splitWindow_; }

void Form1::reportLaunch(const std::string& failure) {
    if (!failure.empty()) messages_.show(failure, std::string(kInfoTitle), MessageBox::Buttons::Ok);
}

void Form1::readme_Click() {
    const std::string path = readmePath_.empty() ? folder_ + kReadmeFileName : readmePath_;
    if (FileExists(path)) reportLaunch(shell_.openInTextEditor(path));
}

void Form1::Command4_Click() { reportLaunch(shell_.openUrl(std::string(kMakerWebAddress))); }

void Form1::exit_Click() { close(); }

void Form1::closeEvent(QCloseEvent* event) {
    // Every way out stops a running job through its stop path, so that its checkpoint
    // describes the results file left behind; the program ends once the worker is done.
    requestClose();
    if (splitWindow_) splitWindow_->close();
    if (jobRunning_ || numberRunning_) {
        event->ignore();
        hide();
        return;
    }
    event->accept();
    Q_EMIT closed();
}

void Form1::requestClose() {
    closingRequested_ = true;
    numberStop_.request();
    jobStop_.request();
}

std::string elapsedTimeText(std::chrono::seconds elapsed) {
    const long long total = elapsed.count() < 0 ? 0 : elapsed.count();
    char text[64];
    std::snprintf(text, sizeof text, kElapsedTimeFormat, total / 3600, total / 60 % 60, total % 60);
    return text;
}

}  // namespace tarn::ui
