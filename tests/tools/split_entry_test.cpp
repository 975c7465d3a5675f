// The count entry of the split: what it adds to the entry rule, its floor of 1000 records
// after truncation and its own wording for counts beyond the number type.
#include "tools/split_entry.hpp"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

using namespace tarn;

TEST(RecordsPerFileEntry, TakesWholeCountsFromTheFloorToTheTypeLimitAndRefusesTheRest) {
    // Accepted texts (no message) give their integer part.
    const std::pair<std::string_view, std::vector<const char*>> cases[] = {
        {"", {"1000", "1000.9", " 25000 ", "922337203685477"}},
        {kMinimumRecordsMessage, {"999", "999.9", "0", "-5", "0.5", "-1000"}},
        {kInvalidEntryMessage, {"", "   ", "abc", "1,000"}},
        {kRecordsOutOfRangeMessage, {"922337203685478", "1e300", "1e400"}}};
    for (const auto& [message, texts] : cases)
        for (const char* text : texts) {
            const EntryResult r = parseRecordsPerFile(text);
            EXPECT_EQ(r.message, message) << "'" << text << "'";
            EXPECT_EQ(r.accepted() ? r.number->whole() : 0, message.empty() ? std::stoll(text) : 0)
                << "'" << text << "'";
        }
    EXPECT_EQ(parseRecordsPerFile("1000,9", ',').number.value_or(Number{}).whole(), 1000);
}
