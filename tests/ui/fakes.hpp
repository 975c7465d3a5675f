// Recording stand-ins for the message box and the platform shell.
#pragma once

#include <deque>
#include <string>
#include <vector>

#include "ui/message_box.hpp"
#include "ui/shell.hpp"

namespace tarn::test {

class FakeMessageBox final : public ui::MessageBox {
public:
    struct Shown {
        std::string text, title;
        Buttons buttons;
    };

    Answer show(const std::string& text, const std::string& title, Buttons buttons) override {
        shown.push_back({text, title, buttons});
        if (answers.empty()) return Answer::Ok;
        const Answer a = answers.front();
        answers.pop_front();
        return a;
    }
    // The answer to the next question; unanswered questions get OK.
    void setNextAnswer(Answer a) { answers.push_back(a); }
    const Shown& last() const { return shown.back(); }

    std::vector<Shown> shown;
    std::deque<Answer> answers;
};

class FakeShell final : public ui::Shell {
public:
    std::string openInTextEditor(const std::string& path) override {
        edited.push_back(path);
        return failure;
    }
    std::string showOpenWith(const std::string& path) override {
        openedWith.push_back(path);
        return failure;
    }
    std::string openUrl(const std::string& url) override {
        urls.push_back(url);
        return failure;
    }
    std::string documentsFolder() override { return documents; }

    std::vector<std::string> edited, openedWith, urls;
    std::string documents = "/tmp";
    std::string failure;  // what every launch answers; empty for success
};

}  // namespace tarn::test
