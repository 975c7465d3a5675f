// A main window over a fresh folder, recording its messages and shell calls.
#pragma once

#include <gtest/gtest.h>

#include <QTest>
#include <memory>

#include "fakes.hpp"
#include "support/temp_folder.hpp"
#include "ui/form1.hpp"
#include "ui_form1.h"  // with the classes of the controls

namespace tarn::test {

class WindowTest : public ::testing::Test {
protected:
    // Stop any worker that a test left running, and let it finish before the window goes.
    void TearDown() override {
        if (!idle()) c().Command5->click();
        idle();
        window.reset();
    }
    Ui::Form1& c() { return window->controls(); }
    // Runs the event loop until no worker is left (or a generous deadline passes).
    bool idle() {
        return QTest::qWaitFor(
            [&] { return !window->jobRunning() && !window->numberCommandRunning(); }, 20000);
    }
    // Presses a button and waits for the worker it starts.
    void press(QPushButton* button) {
        button->click();
        ASSERT_TRUE(idle());
    }

    TempFolder dir;
    FakeMessageBox messages;
    FakeShell shell;
    std::unique_ptr<ui::Form1> window = std::make_unique<ui::Form1>(messages, shell, dir.path());
};

}  // namespace tarn::test
