// Every text of the tools, word for word; other tests use the constants and functions.
#include "tools/texts.hpp"

#include <gtest/gtest.h>

using namespace tarn;

TEST(ToolsTexts, WordForWord) {
    const std::pair<std::string, std::string> texts[] = {
        {std::string(kMinimumRecordsMessage), "Minimum value is 1000 records."},
        {std::string(kRecordsOutOfRangeMessage),
         "Value out of range. Value must be between 1000 and 922 337 203 685 477."},
        {resultsNotFoundMessage("/d/primes.txt"), "The results file /d/primes.txt was not found."},
        {splitDoneMessage(3), "Done!!! 3 files were created."},
        {cutRecordNote("/d/primes.txt", 7),
         "The last 7 bytes of /d/primes.txt were left out: they end without CR LF, so they are "
         "part of a record cut short."},
        {largeFileQuestion(11.99),
         "The file is bigger than 10 MB (11.99 MB). Do you still want to open it with Notepad? If "
         "you cancel, you may choose the program to open it."},
    };
    for (const auto& [text, expected] : texts) EXPECT_EQ(text, expected);
}
