// A main window over a fresh folder, with recording stand-ins for the message box and the shell.
#pragma once

#include <gtest/gtest.h>

#include <QTest>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "support/temp_folder.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#include "ui/shell/shell.hpp"
#include "ui_form1.h"  // with the classes of the controls

namespace tarn::test {

class FakeMessageBox final : public ui::MessageBox {
public:
    struct Shown {
        std::string text, title;
        Buttons buttons;
    };
    Answer show(const std::string& text, const std::string& title, Buttons buttons) override {
        shown.push_back({text, title, buttons});
        return std::exchange(nextAnswer, Answer::Ok);
    }
    // An empty message when none was shown, so that a check fails instead of the test program.
    Shown last() const { return shown.empty() ? Shown{} : shown.back(); }
    // The last message as "<title>: <text>", to compare with said().
    std::string lastSaid() const { return said(last().title, last().text); }
    static std::string said(std::string_view title, std::string_view text) {
        return std::string(title) + ": " + std::string(text);
    }

    std::vector<Shown> shown;
    Answer nextAnswer = Answer::Ok;  // the answer to the next question; the later ones get OK
};

// Every launch is recorded and answers `failure` (empty for success).
class FakeShell final : public ui::Shell {
public:
    std::string openInTextEditor(const std::string& path) override { return note(edited, path); }
    std::string showOpenWith(const std::string& path) override { return note(openedWith, path); }
    std::string openUrl(const std::string& url) override { return note(urls, url); }
    std::string documentsFolder() override { return documents; }
    std::string note(std::vector<std::string>& calls, const std::string& argument) {
        return calls.push_back(argument), failure;
    }

    std::vector<std::string> edited, openedWith, urls;
    std::string documents = "/tmp", failure;
};

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
