// Every message the program shows goes through this seam: modal, no icon, OK or OK/Cancel.
// The window uses QtMessageBox; tests use a recording fake that answers questions itself.
#pragma once

#include <string>

class QWidget;

namespace tarn::ui {

class MessageBox {
public:
    enum class Buttons { Ok, OkCancel };
    enum class Answer { Ok = 1, Cancel = 2 };  // the platform's codes

    virtual ~MessageBox() = default;
    // Closing the box by its close control answers Cancel (Ok for an OK-only box).
    virtual Answer show(const std::string& text, const std::string& title,
                        Buttons buttons = Buttons::Ok) = 0;
};

// Real modal boxes over the given parent window (may be null).
class QtMessageBox final : public MessageBox {
public:
    explicit QtMessageBox(QWidget* parent = nullptr) : parent_(parent) {}
    void setParent(QWidget* parent) { parent_ = parent; }
    Answer show(const std::string& text, const std::string& title, Buttons buttons) override;

private:
    QWidget* parent_;
};

}  // namespace tarn::ui
