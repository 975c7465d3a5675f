// "Show results" and the offer to open the file after a job, through the fake shell.
#include <filesystem>

#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;
using Answer = ui::MessageBox::Answer;

namespace {

void makeResults(const std::string& path, std::uintmax_t bytes) {
    writeFile(path, "2\r\n");
    std::filesystem::resize_file(path, bytes);
}

}  // namespace

TEST_F(WindowTest, ShowResultsWithoutAFileDoesNothing) {
    window->show_Click();
    EXPECT_TRUE(messages.shown.empty());
    EXPECT_TRUE(shell.edited.empty());
    EXPECT_TRUE(shell.openedWith.empty());
}

TEST_F(WindowTest, ShowResultsOpensSmallFilesWithoutAQuestion) {
    const std::string path = dir.path() + "primes.txt";
    for (std::uintmax_t bytes : {std::uintmax_t{100}, std::uintmax_t{10485760},
                                 std::uintmax_t{10496245}}) {
        makeResults(path, bytes);
        window->show_Click();
    }
    EXPECT_TRUE(messages.shown.empty());
    ASSERT_EQ(shell.edited.size(), 3u);
    EXPECT_EQ(shell.edited[0], path);
}

TEST_F(WindowTest, ShowResultsAsksAboutLargeFiles) {
    const std::string path = dir.path() + "primes.txt";
    makeResults(path, 10496246);
    window->show_Click();  // unanswered: OK
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text,
              "The file is bigger than 10 MB (10.01 MB). Do you still want to open it with "
              "Notepad? If you cancel, you may choose the program to open it.");
    EXPECT_EQ(messages.last().title, "Info");
    EXPECT_EQ(messages.last().buttons, ui::MessageBox::Buttons::OkCancel);
    EXPECT_EQ(shell.edited, std::vector<std::string>{path});

    makeResults(path, 15728640);
    messages.setNextAnswer(Answer::Cancel);
    window->show_Click();
    EXPECT_NE(messages.last().text.find("(15 MB)"), std::string::npos);
    EXPECT_EQ(shell.openedWith, std::vector<std::string>{path});
    EXPECT_EQ(shell.edited.size(), 1u);

    makeResults(path, 11000000);
    window->show_Click();
    EXPECT_NE(messages.last().text.find("(10.49 MB)"), std::string::npos);
}

TEST_F(WindowTest, LaunchFailuresAreReported) {
    writeFile(dir.path() + "primes.txt", "2\r\n");
    shell.failure = "The program could not be started.";
    window->show_Click();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.last().text, shell.failure);
    EXPECT_EQ(messages.last().title, "Info");
}
