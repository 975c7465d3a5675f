// Generate, Resume, start-up and closing in the window, over a fresh folder.
#include <QSignalSpy>
#include <cerrno>
#include <csignal>
#include <filesystem>

#include "core/folder_lock.hpp"
#include "generation/checkpoint_file.hpp"
#include "generation/texts.hpp"
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
    std::string file(const char* name) { return readFile(dir.path() + name); }
    std::string reportFor(int primes, int limit) {
        return "Done!!! The results were saved in the file " + dir.path() + "primes.txt. " +
               std::to_string(primes) + " primes found up to number " + std::to_string(limit) +
               "... Save the file to other location.";
    }
    std::optional<Checkpoint> checkpoint() {
        return readCheckpoint(dir.path() + "primes.ini").checkpoint;
    }
};

TEST_F(JobCommandTest, GenerateRefusesBadLimitsThenReportsAndOpensTheResults) {
    generate("99.9");
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, kMinimumMessage));

    generate("100.9");
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, reportFor(25, 100)));
    EXPECT_EQ(c().Label5->text(), "INFO: 25 primes found up to number 100...");
    EXPECT_TRUE(c().Label6->text().startsWith("Elapsed Time: 0:00:0"));
    EXPECT_EQ(c().ProgressBar1->value(), c().ProgressBar1->maximum());
    EXPECT_EQ(shell.edited, std::vector<std::string>{dir.path() + "primes.txt"});

    // Enumerated, and an unchecked "Open results when finished" opens nothing at all.
    c().Check1->setChecked(true);
    c().Check2->setChecked(false);
    generate("110");
    EXPECT_EQ(messages.last().text, reportFor(29, 110));
    EXPECT_EQ(file("primes.txt").substr(0, 8), "1;2\r\n2;3");
    EXPECT_TRUE(shell.edited.size() == 1 && shell.openedWith.empty());
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
    EXPECT_EQ(messages.last().text, testVerdictMessage(97, true));
    press(c().Command5);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kCommandTitle, kAllStoppedMessage));
    EXPECT_EQ(c().Label5->text(), "INFO:");
    EXPECT_TRUE(checkpoint() && checkpoint()->limit == 900000000000 &&
                checkpoint()->interrupted == 1);
}

TEST_F(JobCommandTest, StartUpTellsAboutAStoppedJobThatResumeContinuesOnceTheFolderIsFree) {
    const std::string ini = dir.path() + "primes.ini";
    window->Form_Load();
    press(c().Command3);  // nothing to resume
    EXPECT_TRUE(messages.shown.empty());

    // A job with limit 1000 stopped after its first turn, in the enumerated form.
    const std::string records =
        "1;2\r\n2;3\r\n3;5\r\n4;7\r\n5;11\r\n6;13\r\n7;17\r\n8;19\r\n9;23\r\n10;29\r\n11;31\r\n12;"
        "37\r\n";
    writeFile(dir.path() + "primes.txt", records);
    writeCheckpoint(ini, {37, 1000, 1});
    window->Form_Load();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, kInterruptedPrompt);
    EXPECT_EQ(c().Text1->text(), "100");  // start-up changes no control
    const std::string stopped = file("primes.ini");
    {
        // A split of this program, another window or tarn-cli holds the folder: Generate and
        // Resume leave the files alone (form2_test.cpp: a running split holds it).
        const FolderLock other = FolderLock::tryTake(dir.path());
        for (QPushButton* button : {c().Command1, c().Command3}) {
            press(button);
            EXPECT_EQ(messages.last().text, folderBusyMessage(dir.path()));
        }
        EXPECT_EQ(messages.shown.size(), 3u);
        EXPECT_TRUE(file("primes.txt") == records && file("primes.ini") == stopped);
    }
    press(c().Command3);
    ASSERT_EQ(messages.shown.size(), 4u);
    EXPECT_EQ(messages.last().text, reportFor(168, 1000));
    EXPECT_TRUE(c().Check1->isChecked());
    EXPECT_EQ(c().Text1->text(), "1000");

    writeCheckpoint(ini, {127, 105, 1});
    writeFile(dir.path() + "primes.txt", "2\r\n");
    press(c().Command3);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, kImpossibleToResumeMessage));
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
    EXPECT_FALSE(window->jobRunning() || window->isVisible());
    EXPECT_TRUE(messages.shown.empty());
    EXPECT_TRUE(checkpoint() && checkpoint()->interrupted == 1);
}
