// The main window: the generation panel, the test/factorize panel, the stop button, the web
// link and the menus. Every long command runs on a worker thread; the window only starts it,
// shows its progress a few times a second, and reports its outcome when the worker is done.
#pragma once

#include <QMainWindow>
#include <QPointer>
#include <QTimer>
#include <chrono>
#include <cstdint>
#include <memory>
#include <string>

#include "core/folder_lock.hpp"
#include "core/stop_signal.hpp"
#include "generation/generation_job.hpp"

namespace Ui {
class Form1;
}

namespace tarn::ui {

class MessageBox;
class Shell;

// The designed controls keep their designed names (form1.ui):
//   Frame1 "Generate Primes "       Text1 limit ("Up to", Label1), Check1 "Enumerate results"
//                                   (Label3), Check2 "Open results when finished" (Label4),
//                                   Label5 information line, Label6 elapsed time,
//                                   ProgressBar1, Command1 Generate, Command3 Resume
//   Frame2 "Test Prime or Factorize" Text2 number ("Number", Label2), Command2 Test,
//                                   Command6 Factorize, Text4 factorization, Label7 status line
//   Command5 "Cancel all calculations", Command4 the web link
//   Menus: main (show "Show results", spllit "Split Result File", exit "Exit Tarn"),
//          help (readme "Readme")
class Form1 : public QMainWindow {
    Q_OBJECT

public:
    // `folder` holds primes.txt, primes.ini and README.txt (one trailing separator).
    Form1(MessageBox& messages, Shell& shell, std::string folder, QWidget* parent = nullptr);
    ~Form1() override;
    // Where "Readme" looks instead of `folder`: an installed copy reads the installed one.
    void setReadmePath(std::string path) { readmePath_ = std::move(path); }

    // Start-up: the checkpoint is made sure of and the user told about a stopped job.
    // Runs before the window is first shown.
    void Form_Load();

    Ui::Form1& controls() { return *ui_; }
    const std::string& folder() const { return folder_; }
    bool jobRunning() const { return jobRunning_; }
    bool numberCommandRunning() const { return numberRunning_; }
    QWidget* splitWindow() const { return splitWindow_; }

public Q_SLOTS:
    void Command1_Click();  // Generate
    void Command2_Click();  // Test
    void Command3_Click();  // Resume
    void Command4_Click();  // web link
    void Command5_Click();  // Cancel all calculations
    void Command6_Click();  // Factorize
    void show_Click();
    void spllit_Click();
    void exit_Click();
    void readme_Click();

Q_SIGNALS:
    // Emitted once a worker's outcome has been shown.
    void numberCommandFinished();
    void jobFinished();
    // The window has closed for good: no worker is left running. The program ends here.
    void closed();

protected:
    void closeEvent(QCloseEvent* event) override;

private:
    enum class OpenMode { OnRequest, AfterJob };
    void OpenResultsFile(OpenMode mode, const std::string& path);
    void reportLaunch(const std::string& failure);

    // Test and Factorize.
    void finishTest(std::int64_t number, int code);
    void finishFactorize(const std::string& line, bool stopped);

    // Generation and resume jobs.
    void startJobDisplay(std::int64_t limit, std::int64_t position);
    void refreshJobDisplay();
    void finishJob(const JobResult& result);
    void endJob();
    bool refuseWhileJobRuns();
    bool lockJobFolder();
    void requestClose();

    std::unique_ptr<Ui::Form1> ui_;
    MessageBox& messages_;
    Shell& shell_;
    std::string folder_;
    std::string readmePath_;  // empty: README.txt in folder_
    QPointer<QWidget> splitWindow_;

    // Test/Factorize and the jobs have stop requests of their own, so that a test started
    // while a job runs cannot swallow the job's pending stop; "Cancel all calculations"
    // and closing the window raise both.
    StopSignal numberStop_;
    StopSignal jobStop_;
    bool closingRequested_ = false;
    bool numberRunning_ = false;
    bool jobRunning_ = false;
    // Held from the start of a job or resume until its worker has finished.
    FolderLock jobLock_;

    JobProgress jobProgress_;
    std::int64_t jobLimit_ = 0;
    std::chrono::steady_clock::time_point jobStart_;
    QTimer progressTimer_;
};

// "Elapsed Time: 1:01:45": true elapsed time, hours without a bound.
std::string elapsedTimeText(std::chrono::seconds elapsed);

}  // namespace tarn::ui
