// A main window over a fresh folder, recording its messages and shell calls.
#pragma once

#include <gtest/gtest.h>

#include <QCoreApplication>
#include <QDeadlineTimer>
#include <QDir>
#include <QImage>
#include <QPixmap>
#include <QSignalSpy>
#include <memory>

#include "fakes.hpp"
#include "support/temp_folder.hpp"
#include "ui/form1.hpp"
#include "ui_form1.h"

namespace tarn::test {

class WindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        window = std::make_unique<ui::Form1>(messages, shell, dir.path());
    }
    void TearDown() override {
        // Let a worker that a test left running finish before the window goes.
        waitUntil([&] { return !window->jobRunning() && !window->numberCommandRunning(); });
        window.reset();
    }

    Ui::Form1& c() { return window->controls(); }

    // Runs the event loop until the condition holds (or a generous deadline passes).
    template <typename Condition>
    static bool waitUntil(Condition condition, int milliseconds = 20000) {
        QDeadlineTimer deadline(milliseconds);
        while (!condition()) {
            if (deadline.hasExpired()) return false;
            QCoreApplication::processEvents(QEventLoop::AllEvents, 10);
        }
        return true;
    }

    static void saveScreenshot(QWidget& w, const QString& name) {
        QDir().mkpath(TARN_SCREENSHOT_DIR);
        const QPixmap shot = w.grab();
        ASSERT_FALSE(shot.isNull());
        ASSERT_TRUE(shot.save(QString(TARN_SCREENSHOT_DIR) + "/" + name));
    }

    TempFolder dir;
    FakeMessageBox messages;
    FakeShell shell;
    std::unique_ptr<ui::Form1> window;
};

}  // namespace tarn::test
