// Test, Factorize and "Cancel all calculations". The test and the factorization run on a
// worker; one of them at a time, so that two results never race into the status line.

#include "core/entry.hpp"
#include "core/factorization.hpp"
#include "core/texts.hpp"
#include "core/trial_division.hpp"
#include "generation/texts.hpp"
#include "ui/decimal_separator.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#include "ui/texts.hpp"
#include "ui/worker.hpp"
#include "ui_form1.h"

namespace tarn::ui {
namespace {

QString text(std::string_view s) { return QString::fromUtf8(s.data(), static_cast<int>(s.size())); }

}  // namespace

void Form1::Command2_Click() {
    if (numberRunning_) {
        messages_.show(std::string(kNumberCommandBusy), std::string(kInfoTitle));
        return;
    }
    const EntryResult entry = ReadNumberEntry(ui_->Text2->text().toStdString(), decimalSeparator());
    if (!entry.accepted()) {
        messages_.show(entry.message, std::string(kInfoTitle));
        return;
    }
    // The test keeps its own number: a running job's limit is not touched.
    const std::int64_t number = entry.number->whole();
    ui_->Label7->setText(text(kStatusWorking));
    if (number == 2) {
        messages_.show(std::string(kTwoIsPrimeMessage), std::string(kResultsTitle));
        ui_->Label7->setText(text(kStatusDone));
        return;
    }
    numberRunning_ = true;
    numberStop_.clear();
    runOnWorker(
        this, [this, number] { return TestPrime2(number, numberStop_); },
        [this, number](int code) { finishTest(number, code); });
}

void Form1::finishTest(std::int64_t number, int code) {
    numberRunning_ = false;
    if (!closingRequested_) {
        if (code == kStopped) {
            messages_.show(std::string(kAllStoppedMessage), std::string(kCommandTitle));
            ui_->Label7->setText(text(kStatusTestStopped));
        } else {
            messages_.show(testVerdictMessage(number, code == kPrime), std::string(kResultsTitle));
            ui_->Label7->setText(text(kStatusDone));
        }
    }
    Q_EMIT numberCommandFinished();
    if (closingRequested_) close();
}

void Form1::Command6_Click() {
    if (numberRunning_) {
        messages_.show(std::string(kNumberCommandBusy), std::string(kInfoTitle));
        return;
    }
    numberStop_.clear();
    ui_->Label7->setText(text(kStatusWorking));
    ui_->Text4->clear();
    const EntryResult entry = ReadNumberEntry(ui_->Text2->text().toStdString(), decimalSeparator());
    if (!entry.accepted()) {
        messages_.show(entry.message, std::string(kInfoTitle));
        return;
    }
    const std::int64_t number = entry.number->whole();
    numberRunning_ = true;
    runOnWorker(
        this,
        [this, number]() -> std::optional<std::string> {
            const auto factors = FactorizeNumber(number, numberStop_);
            if (!factors) return std::nullopt;
            return factorizationLine(number, *factors);
        },
        [this](const std::optional<std::string>& line) {
            finishFactorize(line.value_or(""), !line || numberStop_.requested());
        });
}

void Form1::finishFactorize(const std::string& line, bool stopped) {
    numberRunning_ = false;
    // A stopped factorization writes nothing over what the stop button left.
    if (!stopped && !closingRequested_) {
        ui_->Text4->setPlainText(QString::fromStdString(line));
        ui_->Label7->setText(text(kStatusDone));
    }
    Q_EMIT numberCommandFinished();
    if (closingRequested_) close();
}

void Form1::Command5_Click() {
    numberStop_.request();
    jobStop_.request();
    ui_->Text4->clear();
    ui_->Label7->setText(text(kStatusCalculationsStopped));
}

}  // namespace tarn::ui
