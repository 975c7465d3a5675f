// The split window over the recording fakes: what it adds to the split (the folder it writes into,
// the refusals, the worker and its final message, the stop by "Cancel" or by the title bar).
#include "ui/form2.hpp"

#include <sys/stat.h>

#include <QPointer>
#include <QSignalSpy>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <memory>

#include "core/folder_lock.hpp"
#include "ui/folder_list.hpp"
#include "ui/texts.hpp"
#include "window_fixture.hpp"

using namespace tarn;
using tarn::ui::Form2;

namespace {

std::string records(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

// The split window as the main window opens it, over the main window's folder.
struct Form2Test : test::WindowTest {
    test::TempFolder documents;
    QPointer<Form2> form;

    void SetUp() override {
        std::filesystem::create_directory(documents.path() + "Pictures");
        // The documents folder as the shell gives it: no trailing separator.
        shell.documents = documents.path().substr(0, documents.path().size() - 1);
        window->spllit_Click();
        form = qobject_cast<Form2*>(window->splitWindow());
    }

    QWidget* child(const char* name) const { return form->findChild<QWidget*>(name); }
    std::string text(const char* name) const {
        return child(name)->property("text").toString().toStdString();
    }
    void split(const char* count) {
        child("Text1")->setProperty("text", count);
        QTest::mouseClick(child("Command1"), Qt::LeftButton);
    }
    // How many files primes1.txt, primes2.txt ... the folder holds.
    static int files(const std::string& folder) {
        int n = 0;
        while (std::filesystem::exists(folder + "/primes" + std::to_string(n + 1) + ".txt")) ++n;
        return n;
    }
};

}  // namespace

TEST_F(Form2Test, RefusesThenSplitsOnTheWorkerIntoTheFolderOpenedInTheList) {
    // A killed job left part of a last record.
    test::writeFile(dir.path() + "primes.txt", records(2500) + "2501;25");
    {
        // A job of the main window, another window or tarn-cli has the files.
        const FolderLock other = FolderLock::tryTake(dir.path());
        split("1000");
        EXPECT_EQ(messages.last().text, folderBusyMessage(dir.path()));
    }
    split("999.9");
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, kMinimumRecordsMessage));
    EXPECT_EQ(files(shell.documents), 0);

    auto* dir1 = qobject_cast<ui::FolderList*>(child("Dir1"));
    EXPECT_EQ(text("Label1"), shell.documents);
    const auto found = dir1->findItems("Pictures", Qt::MatchExactly | Qt::MatchRecursive);
    ASSERT_EQ(found.size(), 1);
    dir1->setCurrentItem(found.front());  // only highlighted: the split's folder stays
    EXPECT_EQ(text("Label1"), shell.documents);
    QTest::keyClick(dir1, Qt::Key_Return);
    const std::string pictures = documents.path() + "Pictures";
    EXPECT_EQ(text("Label1"), pictures);

    QSignalSpy finished(form.data(), &Form2::splitFinished);
    split("1000.9");
    EXPECT_EQ(text("Command2"), ui::kSplitCancelCaption);
    ASSERT_TRUE(finished.wait(10000));
    ASSERT_EQ(messages.shown.size(), 3u);
    EXPECT_EQ(messages.last().text,
              splitDoneMessage(3) + ' ' + cutRecordNote(dir.path() + "primes.txt", 7));
    EXPECT_EQ(text("Command2"), ui::kSplitCloseCaption);
    EXPECT_EQ(files(pictures), 3);
    ASSERT_TRUE(form) << "a split that ends by itself leaves the window open";
    form->show();
    QTest::mouseClick(child("Command2"), Qt::LeftButton);
    EXPECT_FALSE(form && form->isVisible());
}

TEST_F(Form2Test, ClosingDuringASplitStopsIt) {
    // The results file is a pipe that the test feeds and keeps open, so the split surely runs
    // while the test presses its buttons, and can only end by seeing the stop.
    const std::string results = dir.path() + "primes.txt";
    ASSERT_EQ(mkfifo(results.c_str(), 0600), 0);
    const auto oldPipeAction = std::signal(SIGPIPE, SIG_IGN);
    split("1000");
    // Opening waits for the split to open the pipe; closing ends it even if the test fails.
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> pipe(std::fopen(results.c_str(), "w"),
                                                               std::fclose);
    ASSERT_NE(pipe, nullptr);
    const auto feed = [&](const std::string& text) {
        std::fputs(text.c_str(), pipe.get());
        std::fflush(pipe.get());
    };
    feed(records(1500));
    QTest::mouseClick(child("Command1"), Qt::LeftButton);
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, ui::kSplitAlreadyRunningMessage);
    // The split holds the folder, so that no job of any window or of tarn-cli starts on it.
    EXPECT_TRUE(FolderLock::tryTake(dir.path()).busy());

    form->show();
    form->close();  // the title-bar control; "Cancel" asks for the stop and closes
    EXPECT_FALSE(form->isVisible());
    ASSERT_TRUE(form) << "the window must wait for its worker";
    // More records wake the split if it waits for the pipe.
    QSignalSpy finished(form.data(), &Form2::splitFinished);
    for (int more = 0; finished.count() == 0 && more < 1000; ++more)
        feed("2;" + std::to_string(more) + "\r\n"), finished.wait(5);
    std::signal(SIGPIPE, oldPipeAction);
    ASSERT_EQ(finished.count(), 1);
    ASSERT_EQ(messages.shown.size(), 2u);
    EXPECT_EQ(messages.last().text, splitDoneMessage(files(shell.documents)));
    QTest::qWait(50);  // the deferred deletion
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    EXPECT_FALSE(form) << "a closed window goes once its split has ended";
}
