// Recording stand-ins for the message box and the platform shell.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "ui/message_box.hpp"
#include "ui/shell/shell.hpp"

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
    const Shown& last() const {
        static const Shown none{};
        return shown.empty() ? none : shown.back();
    }

    std::vector<Shown> shown;
    Answer nextAnswer = Answer::Ok;  // the answer to the next question; the later ones get OK
};

class FakeShell final : public ui::Shell {
public:
    std::string openInTextEditor(const std::string& path) override { return note(edited, path); }
    std::string showOpenWith(const std::string& path) override { return note(openedWith, path); }
    std::string openUrl(const std::string& url) override { return note(urls, url); }
    std::string documentsFolder() override { return documents; }

    std::vector<std::string> edited, openedWith, urls;
    std::string documents = "/tmp";
    std::string failure;  // what every launch answers; empty for success

private:
    std::string note(std::vector<std::string>& calls, const std::string& argument) {
        calls.push_back(argument);
        return failure;
    }
};

}  // namespace tarn::test
