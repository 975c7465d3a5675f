// "Split Result File": one modeless split window at a time, loaded afresh after it was closed.
#include "ui/form1.hpp"
#include "ui/form2.hpp"

namespace tarn::ui {

void Form1::spllit_Click() {
    if (!splitWindow_) {
        auto* window = new Form2(messages_, shell_, folder_);
        window->setWindowIcon(windowIcon());
        splitWindow_ = window;
    }
    splitWindow_->show();
    splitWindow_->raise();
    splitWindow_->activateWindow();
}

}  // namespace tarn::ui
