// The count entry of the split: its floor, its truncation and its refusals.
#include "tools/split_entry.hpp"

#include <gtest/gtest.h>

using namespace tarn;

namespace {

std::string refusal(std::string_view text, char sep = '.') {
    const EntryResult r = parseRecordsPerFile(text, sep);
    EXPECT_FALSE(r.accepted()) << "'" << text << "' was accepted";
    return r.message;
}

}  // namespace

TEST(RecordsPerFileEntry, RefusesCountsBelowTheFloorAfterTruncation) {
    for (const char* text : {"999", "999.9", "0", "-5", "0.5", "-1000"})
        EXPECT_EQ(refusal(text), "Minimum value is 1000 records.") << text;
}

TEST(RecordsPerFileEntry, RefusesTextsThatAreNoNumber) {
    for (const char* text : {"", "   ", "abc", "10a00", "1,000", "1e"})
        EXPECT_EQ(refusal(text), "Invalid entry.") << "'" << text << "'";
}

TEST(RecordsPerFileEntry, RefusesCountsBeyondTheNumberType) {
    EXPECT_EQ(refusal("922337203685478"), std::string(kRecordsOutOfRangeMessage));
    EXPECT_EQ(refusal("1e300"), std::string(kRecordsOutOfRangeMessage));
    EXPECT_EQ(refusal("1e400"), std::string(kRecordsOutOfRangeMessage));
}

TEST(RecordsPerFileEntry, AcceptsWholeCountsFromTheFloorToTheTypeLimit) {
    const auto whole = [](std::string_view text, char sep = '.') {
        const EntryResult r = parseRecordsPerFile(text, sep);
        EXPECT_TRUE(r.accepted()) << text << ": " << r.message;
        return r.accepted() ? r.number->whole() : -1;
    };
    EXPECT_EQ(whole("1000"), 1000);
    EXPECT_EQ(whole("1000.9"), 1000);
    EXPECT_EQ(whole("1000,9", ','), 1000);
    EXPECT_EQ(whole(" 25000 "), 25000);
    EXPECT_EQ(whole("1e6"), 1000000);
    EXPECT_EQ(whole("922337203685477"), 922337203685477);
}
