// Every text of the core, word for word; other tests use the constants and functions.
#include "core/texts.hpp"

#include <gtest/gtest.h>

#include <cerrno>

using namespace tarn;

TEST(CoreTexts, WordForWord) {
    const std::pair<std::string, std::string> texts[] = {
        {std::string(kInvalidEntryMessage), "Invalid entry."},
        {std::string(kOutOfRangeMessage),
         "Value out of range. Value must be between 2 and 922 337 203 685 277."},
        {std::string(kTwoIsPrimeMessage), "Number 2 is prime."},
        {testVerdictMessage(7, true), "Number 7 is prime."},
        {testVerdictMessage(922337203685277, false), "Number 922337203685277 is not prime."},
        {fileWriteFailure("/d/primes.txt", systemReason(ENOSPC)),
         "The file /d/primes.txt could not be written: No space left on device."},
        {fileCreateFailure("/d/primes.ini", systemReason(0)),
         "The file /d/primes.ini could not be opened for writing: Input/output error."},
        {fileReadFailure("/d/primes.ini", systemReason(EISDIR)),
         "The file /d/primes.ini could not be read: Is a directory."},
        {folderBusyMessage("/home/ann/tarn/"),
         "Another Tarn job is working on the files in /home/ann/tarn. Wait until it ends, then "
         "try again."},
        {folderBusyMessage("/"),
         "Another Tarn job is working on the files in /. Wait until it ends, then try again."},
    };
    for (const auto& [text, expected] : texts) EXPECT_EQ(text, expected);
}
