#include "ui/shell/native_window.hpp"

#include <QWidget>

namespace tarn::ui {

void* nativeWindow(QWidget& window) { return reinterpret_cast<void*>(window.winId()); }

}  // namespace tarn::ui
