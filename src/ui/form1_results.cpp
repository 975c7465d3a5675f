// Handing the results file to another program: the text editor, or for a large file (after
// the user cancels the question) a program the user picks.
#include "core/app_folder.hpp"
#include "core/file_names.hpp"
#include "tools/results_size.hpp"
#include "ui/form1.hpp"
#include "ui/message_box.hpp"
#include "ui/shell/shell.hpp"
#include "ui/texts.hpp"
#include "ui_form1.h"

namespace tarn::ui {

void Form1::show_Click() { OpenResultsFile(OpenMode::OnRequest, resultsFilePath(folder_)); }

void Form1::OpenResultsFile(OpenMode mode, const std::string& path) {
    // An unchecked "Open results when finished" means the user wants nothing opened.
    if (mode == OpenMode::AfterJob && !ui_->Check2->isChecked()) return;

    double figure = 0.0;
    if (mode == OpenMode::AfterJob || FileExists(path))
        figure = sizeFigure(fileLength(path).value_or(0));
    MessageBox::Answer answer = MessageBox::Answer::Ok;
    if (isLargeFigure(figure))
        answer = messages_.show(largeFileQuestion(figure), std::string(kInfoTitle),
                                MessageBox::Buttons::OkCancel);
    if (mode == OpenMode::OnRequest && !FileExists(path)) return;
    reportLaunch(answer == MessageBox::Answer::Ok ? shell_.openInTextEditor(path)
                                                  : shell_.showOpenWith(path));
}

}  // namespace tarn::ui
