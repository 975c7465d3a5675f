// The split window over the recording fakes: its built form, the refusals, a split on the
// worker thread, and a split stopped by "Cancel" or by the title bar.
#include "ui/form2.hpp"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <QApplication>
#include <QDir>
#include <QGroupBox>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QPushButton>
#include <QSignalSpy>
#include <QTest>
#include <QTreeWidget>
#include <csignal>
#include <cstdio>
#include <filesystem>
#include <memory>

#include "support/temp_folder.hpp"
#include "tools/split_entry.hpp"
#include "tools/split_results.hpp"
#include "ui/fakes.hpp"
#include "ui/folder_list.hpp"

using namespace tarn;
using tarn::test::FakeMessageBox;
using tarn::test::FakeShell;
using tarn::test::readFile;
using tarn::test::TempFolder;
using tarn::test::writeFile;
using tarn::ui::Form2;

namespace {

std::string records(int count) {
    std::string text;
    for (int i = 1; i <= count; ++i) text += std::to_string(i) + ";" + std::to_string(i) + "\r\n";
    return text;
}

struct Form2Test : ::testing::Test {
    TempFolder program, documents;
    FakeMessageBox messages;
    FakeShell shell;
    bool jobRunning = false;
    QPointer<Form2> form;

    void SetUp() override {
        // The documents folder as the shell gives it: no trailing separator.
        shell.documents = documents.path().substr(0, documents.path().size() - 1);
        form = new Form2(messages, shell, program.path(), [this] { return jobRunning; });
    }
    void TearDown() override { delete form.data(); }

    template <class T = QWidget>
    T* child(const char* name) const {
        T* w = form->findChild<T*>(QString::fromLatin1(name));
        EXPECT_NE(w, nullptr) << name;
        return w;
    }
    QString command2() const { return child<QPushButton>("Command2")->text(); }
    std::string outFile(int n) const {
        return documents.path() + "primes" + std::to_string(n) + ".txt";
    }

    void split(const QString& count) {
        child<QLineEdit>("Text1")->setText(count);
        QTest::mouseClick(child<QPushButton>("Command1"), Qt::LeftButton);
    }
    bool waitForSplit() {
        QSignalSpy finished(form.data(), &Form2::splitFinished);
        return finished.count() > 0 || finished.wait(10000);
    }
};

}  // namespace

TEST_F(Form2Test, IsBuiltAsDesigned) {
    EXPECT_EQ(form->windowTitle(), "Split Results File");
    EXPECT_TRUE(form->isWindow());
    EXPECT_EQ(form->size(), QSize(408, 221));
    EXPECT_EQ(form->minimumSize(), form->maximumSize()) << "the layout is fixed";

    struct Expected {
        const char* name;
        const char* parent;
        QRect place;
        const char* text;
    };
    const Expected controls[] = {
        {"Frame1", "Form2", {16, 8, 377, 145}, "Save in"},
        {"Dir1", "Frame1", {16, 24, 345, 81}, nullptr},
        {"Label1", "Frame1", {16, 112, 345, 25}, nullptr},
        {"Text1", "Form2", {16, 160, 73, 19}, "1000"},
        {"Label2", "Form2", {96, 160, 97, 17}, "records in each file"},
        {"Command1", "Form2", {96, 192, 105, 17}, "Split"},
        {"Command2", "Form2", {224, 192, 97, 17}, "Close"},
    };
    for (const auto& c : controls) {
        QWidget* w = child(c.name);
        ASSERT_NE(w, nullptr);
        EXPECT_EQ(w->geometry(), c.place) << c.name;
        EXPECT_EQ(w->parentWidget()->objectName(), c.parent) << c.name;
        if (!c.text) continue;
        QString text;
        if (auto* b = qobject_cast<QPushButton*>(w)) text = b->text();
        if (auto* l = qobject_cast<QLabel*>(w)) text = l->text();
        if (auto* e = qobject_cast<QLineEdit*>(w)) text = e->text();
        if (auto* g = qobject_cast<QGroupBox*>(w)) text = g->title();
        EXPECT_EQ(text, c.text) << c.name;
    }
    EXPECT_TRUE(child<QLabel>("Label1")->wordWrap());
    form->ensurePolished();  // the title's style comes with the polish
    EXPECT_TRUE(child("Frame1")->font().bold());
    EXPECT_FALSE(child("Label1")->font().bold());
    EXPECT_FALSE(child("Label2")->font().bold());
}

TEST_F(Form2Test, TabGoesFromTheFolderListToTheButtonsAndFocusStartsThere) {
    EXPECT_EQ(form->focusWidget(), child("Dir1"));
    std::vector<QString> order;
    QWidget* w = child("Dir1");
    for (int i = 0; i < 4; ++i) {
        order.push_back(w->objectName());
        do w = w->nextInFocusChain();
        while (!(w->focusPolicy() & Qt::TabFocus));
    }
    EXPECT_EQ(order, (std::vector<QString>{"Dir1", "Text1", "Command1", "Command2"}));
}

TEST_F(Form2Test, LoadShowsTheDocumentsFolderAndOpeningAFolderFollows) {
    EXPECT_EQ(child<QLabel>("Label1")->text().toStdString(), shell.documents);
    auto* dir1 = child<tarn::ui::FolderList>("Dir1");
    EXPECT_EQ(dir1->path().toStdString(), shell.documents);

    std::filesystem::create_directory(documents.path() + "Tables");
    dir1->setPath(dir1->path());  // unchanged: no rebuild, so read the folder afresh below
    const std::string tables = documents.path() + "Tables";
    dir1->setPath(QString::fromStdString(shell.documents + "/.."));
    dir1->setPath(QString::fromStdString(shell.documents));
    const auto found = dir1->findItems("Tables", Qt::MatchExactly | Qt::MatchRecursive);
    ASSERT_EQ(found.size(), 1);

    // Only highlighted: the folder into which a split writes stays the same.
    dir1->setCurrentItem(found.front());
    EXPECT_EQ(child<QLabel>("Label1")->text().toStdString(), shell.documents);

    // Opened with Enter: it becomes the current folder, and Label1 follows.
    dir1->setFocus();
    QTest::keyClick(dir1, Qt::Key_Return);
    EXPECT_EQ(dir1->path().toStdString(), tables);
    EXPECT_EQ(child<QLabel>("Label1")->text().toStdString(), tables);
}

TEST_F(Form2Test, RefusedCountsTouchNoFileAndLeaveClose) {
    writeFile(program.path() + "primes.txt", records(50));
    const std::pair<const char*, std::string> cases[] = {
        {"999", "Minimum value is 1000 records."},
        {"999.9", "Minimum value is 1000 records."},
        {"0", "Minimum value is 1000 records."},
        {"-5", "Minimum value is 1000 records."},
        {"", "Invalid entry."},
        {"abc", "Invalid entry."},
        {"1e300", std::string(kRecordsOutOfRangeMessage)},
    };
    for (const auto& [text, message] : cases) {
        split(QString::fromLatin1(text));
        ASSERT_FALSE(messages.shown.empty());
        EXPECT_EQ(messages.last().text, message) << "'" << text << "'";
        EXPECT_EQ(messages.last().title, "Info");
        EXPECT_EQ(messages.last().buttons, tarn::ui::MessageBox::Buttons::Ok);
        EXPECT_FALSE(form->splitRunning());
        EXPECT_EQ(command2(), "Close");
    }
    EXPECT_EQ(messages.shown.size(), std::size(cases));
    EXPECT_FALSE(std::filesystem::exists(outFile(1)));
}

TEST_F(Form2Test, ASplitWhileAJobRunsIsRefused) {
    writeFile(program.path() + "primes.txt", records(50));
    jobRunning = true;
    split("1000");
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, tarn::ui::kSplitWhileJobMessage);
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_FALSE(form->splitRunning());
    EXPECT_FALSE(std::filesystem::exists(outFile(1)));
}

TEST_F(Form2Test, SplitsOnTheWorkerAndReportsTheFiles) {
    const std::string input = records(2500);
    writeFile(program.path() + "primes.txt", input);
    split("1000.9");
    EXPECT_TRUE(form->splitRunning());
    EXPECT_EQ(command2(), "Cancel");
    ASSERT_TRUE(waitForSplit());
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, "Done!!! 3 files were created.");
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_EQ(command2(), "Close");
    EXPECT_EQ(readFile(outFile(1)) + readFile(outFile(2)) + readFile(outFile(3)), input);
    EXPECT_FALSE(std::filesystem::exists(outFile(4)));
    EXPECT_TRUE(form) << "a split that ends by itself leaves the window open";
}

TEST_F(Form2Test, AMissingResultsFileIsReportedAndCloseComesBack) {
    split("1000");
    ASSERT_TRUE(waitForSplit());
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text,
              "The results file " + program.path() + "primes.txt was not found.");
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_EQ(command2(), "Close");
}

TEST_F(Form2Test, AnOutputFolderThatCannotBeWrittenIsReported) {
    writeFile(program.path() + "primes.txt", records(50));
    // Label1 names a plain file: no file can be created "inside" it.
    writeFile(documents.path() + "plain", "x");
    child<QLabel>("Label1")->setText(QString::fromStdString(documents.path() + "plain"));
    split("1000");
    ASSERT_TRUE(waitForSplit());
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_NE(messages.last().text.find(documents.path() + "plain/primes1.txt"), std::string::npos)
        << messages.last().text;
    EXPECT_EQ(command2(), "Close");
}

namespace {

// The results file is a pipe that the test feeds, so the split is surely running while the
// test presses its buttons.
class FedResultsFile {
public:
    explicit FedResultsFile(const std::string& path) : path_(path) {
        EXPECT_EQ(mkfifo(path.c_str(), 0600), 0);
        oldPipeAction_ = std::signal(SIGPIPE, SIG_IGN);
    }
    ~FedResultsFile() {
        if (feed_) std::fclose(feed_);
        std::signal(SIGPIPE, oldPipeAction_);
    }
    // Opening waits for the split, which opens the pipe as it starts.
    void send(const std::string& text) {
        if (!feed_) feed_ = std::fopen(path_.c_str(), "w");
        if (std::fwrite(text.data(), 1, text.size(), feed_) == text.size() &&
            std::fflush(feed_) == 0)
            sent_ += text;
    }
    const std::string& sent() const { return sent_; }

private:
    std::string path_;
    std::FILE* feed_ = nullptr;
    std::string sent_;
    void (*oldPipeAction_)(int) = nullptr;
};

}  // namespace

class Form2StopTest : public Form2Test, public ::testing::WithParamInterface<bool> {};

TEST_P(Form2StopTest, ClosingDuringASplitStopsItBetweenRecords) {
    const bool byCancel = GetParam();
    FedResultsFile results(program.path() + "primes.txt");
    split("1000");
    results.send(records(1500));
    EXPECT_EQ(command2(), "Cancel");

    // A second "Split" while this one runs is refused.
    QTest::mouseClick(child<QPushButton>("Command1"), Qt::LeftButton);
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, tarn::ui::kSplitAlreadyRunningMessage);

    form->show();
    if (byCancel)
        QTest::mouseClick(child<QPushButton>("Command2"), Qt::LeftButton);
    else
        form->close();  // the title-bar control
    EXPECT_FALSE(form->isVisible());
    ASSERT_TRUE(form) << "the window must wait for its worker";

    // More records wake the split if it waits for the pipe. The pipe stays open, so the split
    // can only end by seeing the stop.
    QSignalSpy finished(form.data(), &Form2::splitFinished);
    for (int more = 0; finished.count() == 0 && more < 1000; ++more) {
        results.send("2;" + std::to_string(more) + "\r\n");
        finished.wait(5);
    }
    ASSERT_EQ(finished.count(), 1);
    ASSERT_EQ(messages.shown.size(), 2u);
    std::string copied;
    int files = 0;
    while (std::filesystem::exists(outFile(files + 1))) copied += readFile(outFile(++files));
    EXPECT_EQ(messages.last().text, splitDoneMessage(files));
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_TRUE(results.sent().starts_with(copied)) << "only whole records, in order";

    QTest::qWait(50);  // the deferred deletion
    QApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    EXPECT_FALSE(form) << "a closed window goes once its split has ended";
}

INSTANTIATE_TEST_SUITE_P(CancelOrTitleBar, Form2StopTest, ::testing::Bool());

TEST_F(Form2Test, ScreenshotShowsEveryControlWhole) {
    std::filesystem::create_directories(std::string(TARN_SCREENSHOT_DIR));
    for (const char* name : {"Music", "Pictures", "Primes 2024", "Videos"})
        std::filesystem::create_directory(documents.path() + name);
    form->Form_Load();
    child<tarn::ui::FolderList>("Dir1")->setPath(QString::fromStdString(shell.documents + "/.."));
    form->Form_Load();
    form->show();
    ASSERT_TRUE(QTest::qWaitForWindowExposed(form.data()));
    const QString file = QString::fromLatin1(TARN_SCREENSHOT_DIR) + "/form2.png";
    ASSERT_TRUE(form->grab().save(file));
    EXPECT_TRUE(QFile::exists(file));
}
