// "Readme" of an installed copy opens the installed read-me, not one in the data folder.
#include "window_fixture.hpp"

namespace tarn::test {

TEST_F(WindowTest, ReadmeOpensTheInstalledCopyWhenGivenOne) {
    TempFolder doc;
    writeFile(dir.path() + "README.txt", "data folder\n");  // never opened once a path is given
    window->setReadmePath(doc.path() + "README.txt");
    window->readme_Click();
    EXPECT_TRUE(shell.edited.empty());  // the installed copy is missing: nothing happens
    EXPECT_TRUE(messages.shown.empty());

    writeFile(doc.path() + "README.txt", "installed\n");
    window->readme_Click();
    ASSERT_EQ(shell.edited.size(), 1u);
    EXPECT_EQ(shell.edited[0], doc.path() + "README.txt");
}

}  // namespace tarn::test
