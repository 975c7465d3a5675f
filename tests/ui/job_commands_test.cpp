// Generate, Resume, start-up and closing in the window, over a fresh folder.
#include <sys/stat.h>

#include <QSignalSpy>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <memory>

#include "core/folder_lock.hpp"
#include "generation/checkpoint_file.hpp"
#include "ui/form2.hpp"
#include "ui/termination_signals.hpp"
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
            EXPECT_EQ(messages.last().title, "Info");
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
    EXPECT_EQ(messages.last().text, "Minimum value is 100");
    EXPECT_EQ(messages.last().title, "Info");

    generate("100.9");
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.last().text, reportFor(25, 100));
    EXPECT_EQ(messages.last().title, "Info");
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
    EXPECT_EQ(messages.shown[0].title, "Info");
    EXPECT_NE(messages.shown[0].text.find("already running"), std::string::npos);
    c().Text2->setText("97");
    c().Command2->click();
    ASSERT_TRUE(QTest::qWaitFor([&] { return !window->numberCommandRunning(); }, 20000));
    EXPECT_EQ(messages.last().text, "Number 97 is prime.");
    press(c().Command5);
    EXPECT_EQ(messages.last().text, "All calculations were stopped!");
    EXPECT_EQ(messages.last().title, "Command");
    EXPECT_EQ(c().Label5->text(), "INFO:");
    const auto stopped = readCheckpoint(dir.path() + "primes.ini").checkpoint;
    ASSERT_TRUE(stopped);
    EXPECT_EQ(stopped->limit, 900000000000);
    EXPECT_EQ(stopped->interrupted, 1);
}

TEST_F(JobCommandTest, StartUpTellsAboutAStoppedJobThatResumeContinues) {
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
    EXPECT_EQ(messages.last().text,
              "You've interrupted the calculations the last time you used the program. If you "
              "wish, you can continue by pressing Resume.");
    EXPECT_EQ(messages.last().title, "Info");
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
    EXPECT_EQ(messages.last().text,
              "Impossible to resume! Some error must have ocuured. To Resume you must Cancel the "
              "Calculations.");
    EXPECT_EQ(messages.last().title, "Info");
}

// A checkpoint that cannot be read (here a folder in its place) may still name a job to resume:
// start-up leaves it and says why.
TEST_F(JobCommandTest, StartUpTellsWhyItCannotReadTheCheckpointAndLeavesIt) {
    const std::string checkpoint = dir.path() + "primes.ini";
    std::filesystem::create_directory(checkpoint);
    window->Form_Load();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text,
              "The file " + checkpoint + " could not be read: Is a directory.");
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_TRUE(std::filesystem::is_directory(checkpoint));
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

TEST_F(JobCommandTest, GenerateAndResumeWaitWhileAnotherJobOrASplitHasTheFiles) {
    // A stopped job that either command would change.
    const std::string stopped = "1;2\r\n2;3\r\n3;5\r\n4;7\r\n";
    writeFile(dir.path() + "primes.txt", stopped);
    writeCheckpoint(dir.path() + "primes.ini", {7, 1000, 1});
    const std::string checkpoint = readFile(dir.path() + "primes.ini");
    const std::string busy = "Another Tarn job is working on the files in " +
                             dir.path().substr(0, dir.path().size() - 1) +
                             ". Wait until it ends, then try again.";
    {
        // Another window or tarn-cli holds the folder.
        const FolderLock other = FolderLock::tryTake(dir.path());
        ASSERT_TRUE(other.held());
        c().Text1->setText("1000");
        expectBothRefused(busy);
        EXPECT_EQ(results(), stopped);
        EXPECT_EQ(readFile(dir.path() + "primes.ini"), checkpoint);
    }

    // The split window reads the results file, a pipe that the test feeds, so the split surely
    // runs until the test closes the pipe.
    TempFolder into;
    shell.documents = into.path();
    ASSERT_EQ(std::remove((dir.path() + "primes.txt").c_str()), 0);
    ASSERT_EQ(mkfifo((dir.path() + "primes.txt").c_str(), 0600), 0);
    const auto oldPipeAction = std::signal(SIGPIPE, SIG_IGN);
    window->spllit_Click();
    auto* split = qobject_cast<ui::Form2*>(window->splitWindow());
    ASSERT_NE(split, nullptr);
    QSignalSpy splitDone(split, &ui::Form2::splitFinished);
    split->Command1_Click();
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> pipe(
        std::fopen((dir.path() + "primes.txt").c_str(), "w"), std::fclose);
    ASSERT_NE(pipe, nullptr);
    std::fputs(stopped.c_str(), pipe.get());
    std::fflush(pipe.get());
    ASSERT_TRUE(split->splitRunning());
    expectBothRefused(ui::kJobWhileSplitMessage);
    EXPECT_EQ(readFile(dir.path() + "primes.ini"), checkpoint);
    pipe.reset();  // the split reads to the end and finishes
    ASSERT_TRUE(splitDone.count() == 1 || splitDone.wait(10000));
    std::signal(SIGPIPE, oldPipeAction);
    EXPECT_EQ(messages.last().text, "Done!!! 1 files were created.");

    // The split has let go of the files.
    ASSERT_EQ(std::remove((dir.path() + "primes.txt").c_str()), 0);
    generate("100");
    EXPECT_EQ(messages.last().text, reportFor(25, 100));
}
