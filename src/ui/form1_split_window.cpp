#include "ui/form1.hpp"

namespace tarn::ui {

void Form1::spllit_Click() {}

}  // namespace tarn::ui
