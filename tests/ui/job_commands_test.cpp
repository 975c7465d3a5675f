// Generate, Resume, start-up and closing in the window, over a fresh folder.
#include <QSignalSpy>
#include <cerrno>
#include <csignal>
#include <filesystem>

#include "core/folder_lock.hpp"
#include "generation/checkpoint_file.hpp"
#include "generation/job_texts.hpp"
#include "generation/resume_texts.hpp"
#include "ui/termination_signals.hpp"
#include "ui/texts.hpp"
#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

class JobCommandTest : public WindowTest {
protected:
    void generate(const QString& limit) {
        c().Text1->setText(limit);
        press(c().Command1);
    }
    std::string results() { return readFile(dir.path() + "primes.txt"); }
    // Generate and Resume each show only `message`.
    void expectBothRefused(const std::string& message) {
        for (QPushButton* button : {c().Command1, c().Command3}) {
            messages.shown.clear();
            press(button);
            ASSERT_EQ(messages.shown.size(), 1u) << button->text().toStdString();
            EXPECT_EQ(messages.last().text, message);
            EXPECT_EQ(messages.last().title, ui::kInfoTitle);
        }
    }
    std::string reportFor(int primes, int limit) {
        return "Done!!! The results were saved in the file " + dir.path() + "primes.txt. " +
               std::to_string(primes) + " primes found up to number " + std::to_string(limit) +
               "... Save the file to other location.";
    }
};

TEST_F(JobCommandTest, GenerateRefusesBadLimitsThenReportsAndOpensTheResults) {
    generate("99.9");
    EXPECT_EQ(messages.last().text, kMinimumMessage);
    EXPECT_EQ(messages.last().title, ui::kInfoTitle);

    generate("100.9");
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.last().text, reportFor(25, 100));
    EXPECT_EQ(messages.last().title, ui::kInfoTitle);
    EXPECT_EQ(c().Label5->text(), "INFO: 25 primes found up to number 100...");
    EXPECT_TRUE(c().Label6->text().startsWith("Elapsed Time: 0:00:0"));
    EXPECT_EQ(c().ProgressBar1->value(), c().ProgressBar1->maximum());
    EXPECT_EQ(shell.edited, std::vector<std::string>{dir.path() + "primes.txt"});

    // Enumerated, and an unchecked "Open results when finished" opens nothing at all.
    c().Check1->setChecked(true);
    c().Check2->setChecked(false);
    generate("110");
    EXPECT_EQ(messages.last().text, reportFor(29, 110));
    EXPECT_EQ(results().substr(0, 8), "1;2\r\n2;3");
    EXPECT_EQ(shell.edited.size(), 1u);
    EXPECT_TRUE(shell.openedWith.empty());
}

TEST_F(JobCommandTest, StopLeavesAResumableCheckpoint) {
    c().Text1->setText("900000000000");
    c().Command1->click();
    // A second job, or a resume, while one runs is refused; Test still works.
    c().Command1->click();
    c().Command3->click();
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.shown[0].text, ui::kJobBusy);
    c().Text2->setText("97");
    c().Command2->click();
    ASSERT_TRUE(QTest::qWaitFor([&] { return !window->numberCommandRunning(); }, 20000));
    EXPECT_EQ(messages.last().text, "Number 97 is prime.");
    press(c().Command5);
    EXPECT_EQ(messages.last().text, kAllStoppedMessage);
    EXPECT_EQ(messages.last().title, ui::kCommandTitle);
    EXPECT_EQ(c().Label5->text(), "INFO:");
    const auto stopped = readCheckpoint(dir.path() + "primes.ini").checkpoint;
    ASSERT_TRUE(stopped);
    EXPECT_EQ(stopped->limit, 900000000000);
    EXPECT_EQ(stopped->interrupted, 1);
}

TEST_F(JobCommandTest, StartUpTellsAboutAStoppedJobThatResumeContinues) {
    // A checkpoint that cannot be read may still name a job: start-up leaves it and says why.
    const std::string checkpoint = dir.path() + "primes.ini";
    std::filesystem::create_directory(checkpoint);
    window->Form_Load();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, fileReadFailure(checkpoint, systemReason(EISDIR)));
    EXPECT_TRUE(std::filesystem::is_directory(checkpoint));
    std::filesystem::remove(checkpoint);
    messages.shown.clear();

    window->Form_Load();
    press(c().Command3);  // nothing to resume
    EXPECT_TRUE(messages.shown.empty());

    // A job with limit 1000 stopped after its first turn, in the enumerated form.
    std::string file;
    int n = 0;
    for (int p : {2, 3, 5, 7, 11, 13, 17, 19, 23, 29, 31, 37})
        file += std::to_string(++n) + ";" + std::to_string(p) + "\r\n";
    writeFile(dir.path() + "primes.txt", file);
    writeCheckpoint(dir.path() + "primes.ini", {37, 1000, 1});
    window->Form_Load();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, kInterruptedPrompt);
    EXPECT_EQ(messages.last().title, ui::kInfoTitle);
    EXPECT_EQ(c().Text1->text(), "100");  // start-up changes no control

    press(c().Command3);
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.last().text, reportFor(168, 1000));
    EXPECT_TRUE(c().Check1->isChecked());
    EXPECT_EQ(c().Text1->text(), "1000");
    EXPECT_EQ(c().Label5->text(), "INFO: 168 primes found up to number 1000...");

    writeCheckpoint(dir.path() + "primes.ini", {127, 105, 1});
    writeFile(dir.path() + "primes.txt", "2\r\n");
    press(c().Command3);
    ASSERT_EQ(messages.shown.size(), 3u);
    EXPECT_EQ(messages.last().text, kImpossibleToResumeMessage);
    EXPECT_EQ(messages.last().title, ui::kInfoTitle);
}

TEST_F(JobCommandTest, ClosingDuringAJobStopsItQuietlyWithACheckpoint) {
    // SIGTERM closes the window like the user does.
    ui::closeOnTerminationSignals(*window);
    QSignalSpy closed(window.get(), &ui::Form1::closed);
    c().Text1->setText("900000000000");
    c().Command1->click();
    window->show();
    ASSERT_EQ(::raise(SIGTERM), 0);
    ASSERT_TRUE(QTest::qWaitFor([&] { return closed.count() == 1; }, 20000));
    EXPECT_FALSE(window->jobRunning());
    EXPECT_FALSE(window->isVisible());
    EXPECT_TRUE(messages.shown.empty());
    const auto stopped = readCheckpoint(dir.path() + "primes.ini").checkpoint;
    ASSERT_TRUE(stopped);
    EXPECT_EQ(stopped->interrupted, 1);
}

TEST_F(JobCommandTest, GenerateAndResumeWaitWhileAnotherHolderHasTheFiles) {
    // A stopped job that either command would change; a split of this program, another window
    // or tarn-cli holds the folder (form2_test.cpp: a running split holds it).
    const std::string stopped = "1;2\r\n2;3\r\n3;5\r\n4;7\r\n";
    writeFile(dir.path() + "primes.txt", stopped);
    writeCheckpoint(dir.path() + "primes.ini", {7, 1000, 1});
    const std::string checkpoint = readFile(dir.path() + "primes.ini");
    {
        const FolderLock other = FolderLock::tryTake(dir.path());
        ASSERT_TRUE(other.held());
        c().Text1->setText("1000");
        expectBothRefused(folderBusyMessage(dir.path()));
        EXPECT_EQ(results(), stopped);
        EXPECT_EQ(readFile(dir.path() + "primes.ini"), checkpoint);
    }
    generate("100");  // the holder has let go
    EXPECT_EQ(messages.last().text, reportFor(25, 100));
}
