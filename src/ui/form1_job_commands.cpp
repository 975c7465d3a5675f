// Generate, Resume and start-up. A job runs on a worker; the window shows its progress a few
// times a second and reports its outcome once the worker has finished with the files.
#include <QProgressBar>

#include "generation/limit_entry.hpp"
#include "generation/resume_job.hpp"
#include "generation/startup_check.hpp"
#include "generation/texts.hpp"
#include "ui/config.hpp"
#include "ui/decimal_separator.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#include "ui/texts.hpp"
#include "ui/worker.hpp"
#include "ui_form1.h"

namespace tarn::ui {
namespace {}  // namespace

void Form1::Form_Load() {
    closingRequested_ = false;
    const StartupCheck check = checkCheckpointAtStartup(folder_);
    if (!check.readFailure.empty()) messages_.show(check.readFailure, std::string(kInfoTitle));
    if (check.showInterruptedPrompt)
        messages_.show(std::string(kInterruptedPrompt), std::string(kInfoTitle));
}

bool Form1::refuseWhileJobRuns() {
    if (!jobRunning_) return false;
    messages_.show(std::string(kJobBusy), std::string(kInfoTitle));
    return true;
}

// Takes the folder's lock for a job or resume, or tells why the files are busy.
bool Form1::lockJobFolder() {
    FolderLock lock = FolderLock::tryTake(folder_);
    // Only another holder refuses; a folder that cannot be locked is left to the job's own
    // file errors.
    if (lock.busy()) {
        messages_.show(folderBusyMessage(folder_), std::string(kInfoTitle));
        return false;
    }
    jobLock_ = std::move(lock);
    return true;
}

void Form1::Command1_Click() {
    if (refuseWhileJobRuns()) return;
    const bool enumerated = ui_->Check1->isChecked();
    const EntryResult entry = readLimitEntry(ui_->Text1->text().toStdString(), decimalSeparator());
    if (!entry.accepted()) {
        messages_.show(entry.message, std::string(kInfoTitle));
        return;
    }
    const std::int64_t limit = entry.number->whole();
    if (!lockJobFolder()) return;
    jobStop_.clear();
    jobRunning_ = true;
    startJobDisplay(limit, 0);
    const JobSpec spec{folder_, limit, enumerated};
    runOnWorker(
        this, [this, spec] { return runJob(spec, jobStop_, &jobProgress_); },
        [this](const JobResult& result) { finishJob(result); });
}

void Form1::Command3_Click() {
    if (refuseWhileJobRuns() || !lockJobFolder()) return;
    jobStop_.clear();
    jobRunning_ = true;
    ResumeEvents events;
    events.onGathering = [this] {
        QMetaObject::invokeMethod(
            this, [this] { ui_->Label5->setText(QString::fromUtf8(kGatheringInfoLine.data())); });
    };
    events.onContinuing = [this](const ResumeStart& start) {
        QMetaObject::invokeMethod(this, [this, start] {
            ui_->Label5->setText(QString::fromUtf8(kDoingResumeInfoLine.data()));
            ui_->Text1->setText(QString::number(start.limit));
            if (start.enumerated) ui_->Check1->setChecked(true);
            startJobDisplay(start.limit, start.resumePoint);
        });
    };
    runOnWorker(
        this, [this, events] { return runResume(folder_, jobStop_, &jobProgress_, events); },
        [this](const ResumeResult& result) {
            JobResult job = result.job;
            switch (result.status) {
                case ResumeResult::Status::NothingToResume:
                    endJob();
                    return;
                case ResumeResult::Status::Refused:
                case ResumeResult::Status::Failed:
                    // Told before a job started, or while the file was cut back: an "Info" text.
                    job.status = JobResult::Status::Failed;
                    job.error = result.message;
                    break;
                default:
                    break;
            }
            finishJob(job);
        });
}

void Form1::startJobDisplay(std::int64_t limit, std::int64_t position) {
    jobLimit_ = limit;
    jobStart_ = std::chrono::steady_clock::now();
    jobProgress_.candidate = position;
    ui_->ProgressBar1->setRange(0, kBarSteps);
    refreshJobDisplay();
    progressTimer_.start();
}

void Form1::refreshJobDisplay() {
    const std::int64_t candidate = std::clamp<std::int64_t>(jobProgress_.candidate.load(), 0,
                                                            std::max<std::int64_t>(jobLimit_, 1));
    const auto position = static_cast<int>(static_cast<long double>(candidate) * kBarSteps /
                                           std::max<std::int64_t>(jobLimit_, 1));
    ui_->ProgressBar1->setValue(std::clamp(position, 0, kBarSteps));
    const auto elapsed = std::chrono::duration_cast<std::chrono::seconds>(
        std::chrono::steady_clock::now() - jobStart_);
    ui_->Label6->setText(QString::fromStdString(elapsedTimeText(elapsed)));
}

void Form1::finishJob(const JobResult& result) {
    // A resume that ends while reading the file never showed any progress.
    if (progressTimer_.isActive()) refreshJobDisplay();
    progressTimer_.stop();
    jobRunning_ = false;  // before any message: the job's files are free again
    jobLock_.release();
    if (!closingRequested_) {
        switch (result.status) {
            case JobResult::Status::Failed:
                messages_.show(result.error, std::string(kInfoTitle));
                break;
            case JobResult::Status::Stopped:
                messages_.show(std::string(kAllStoppedMessage), std::string(kCommandTitle));
                break;
            case JobResult::Status::Completed:
                ui_->ProgressBar1->setValue(kBarSteps);
                messages_.show(completionReport(result), std::string(kInfoTitle));
                ui_->Label5->setText(QString::fromStdString(completionInfoLine(result)));
                OpenResultsFile(OpenMode::AfterJob, result.resultsPath);
                break;
        }
    }
    endJob();
}

void Form1::endJob() {
    jobRunning_ = false;
    jobLock_.release();
    Q_EMIT jobFinished();
    if (closingRequested_) close();
}

}  // namespace tarn::ui
