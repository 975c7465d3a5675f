#include "ui/form1.hpp"

namespace tarn::ui {

void Form1::Form_Load() {}
void Form1::Command1_Click() {}
void Form1::Command3_Click() {}
void Form1::startJobDisplay(std::int64_t, std::int64_t) {}
void Form1::refreshJobDisplay() {}
void Form1::finishJob(const JobResult&) {}
bool Form1::refuseWhileJobRuns() { return false; }

}  // namespace tarn::ui
