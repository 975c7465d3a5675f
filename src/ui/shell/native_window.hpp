// The system's own handle of a window (a HWND on Windows), for system dialogs it owns. Kept free of
// Qt's headers so that the Windows shell needs none.
#pragma once

class QWidget;

namespace tarn::ui {

void* nativeWindow(QWidget& window);

}  // namespace tarn::ui
