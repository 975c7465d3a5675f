#include "ui/form1.hpp"

namespace tarn::ui {

void Form1::Command2_Click() {}
void Form1::Command5_Click() {}
void Form1::Command6_Click() {}
void Form1::finishTest(std::int64_t, int) {}
void Form1::finishFactorize(std::int64_t, const std::string&, bool) {}

}  // namespace tarn::ui
