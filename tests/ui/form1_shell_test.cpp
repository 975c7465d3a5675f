// What the main window hands to the shell: the results file (a large one after a question;
// results_size_test.cpp has the figure's boundary), the read-me and the web link.
#include <filesystem>

#include "tools/texts.hpp"
#include "ui/texts.hpp"
#include "window_fixture.hpp"

using namespace tarn;
using namespace tarn::test;

TEST_F(WindowTest, ResultsReadmeAndWebLinkGoToTheShell) {
    const std::string path = dir.path() + "primes.txt";
    window->show_Click();  // no file: nothing at all
    EXPECT_TRUE(messages.shown.empty() && shell.edited.empty());

    writeFile(path, "2\r\n");
    window->show_Click();
    EXPECT_TRUE(messages.shown.empty());
    EXPECT_EQ(shell.edited, std::vector<std::string>{path});

    std::filesystem::resize_file(path, 10496246);
    messages.nextAnswer = ui::MessageBox::Answer::Cancel;
    window->show_Click();
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, largeFileQuestion(10.01)));
    EXPECT_EQ(messages.last().buttons, ui::MessageBox::Buttons::OkCancel);
    EXPECT_EQ(shell.openedWith, std::vector<std::string>{path});
    window->show_Click();  // OK opens the text editor after all
    EXPECT_EQ(shell.edited.size(), 2u);

    shell.failure = "The program could not be started.";
    window->show_Click();
    EXPECT_EQ(messages.last().text, shell.failure);

    // The read-me (none: nothing at all) and the web link.
    messages.shown.clear(), shell.edited.clear();
    window->readme_Click();
    EXPECT_TRUE(shell.edited.empty() && messages.shown.empty());
    writeFile(dir.path() + "README.txt", "Tarn\r\n");
    window->readme_Click();
    EXPECT_EQ(shell.edited, std::vector<std::string>{dir.path() + "README.txt"});
    ASSERT_EQ(messages.shown.size(), 1u);
    EXPECT_EQ(messages.lastSaid(), messages.said(ui::kInfoTitle, shell.failure));

    shell.failure.clear();

    c().Command4->click();
    EXPECT_EQ(shell.urls, std::vector<std::string>{std::string(ui::kMakerWebAddress)});
    EXPECT_EQ(messages.shown.size(), 1u);
}
