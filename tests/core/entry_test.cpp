// The entry rule and the Number type's conversions and text forms (the conversion without the
// range: split_entry_test.cpp, through its only caller).
#include "core/entry.hpp"

#include <gtest/gtest.h>

using namespace tarn;

TEST(EntryRule, AcceptsAndTruncatesInsideTheRangeCheckedFirstAndRefusesTheRest) {
    const std::string invalid(kInvalidEntryMessage), range(kOutOfRangeMessage);
    // The whole number accepted, or the message of the refusal.
    const auto entry = [](std::string_view text, char separator = '.') {
        const EntryResult r = ReadNumberEntry(text, separator);
        return r.accepted() ? std::to_string(r.number->whole()) : r.message;
    };
    const std::pair<const char*, const char*> accepted[] = {
        {"2", "2"},      {"922337203685277", "922337203685277"},
        {"2.5", "2"},    {"  97  ", "97"},
        {"\t97", "97"},  {"+97", "97"},
        {"1e3", "1000"}, {"1.5E2", "150"},
        {"25e-1", "2"},  {".5e1", "5"},
        {"5.", "5"}};
    for (const auto& [text, whole] : accepted) EXPECT_EQ(entry(text), whole) << "'" << text << "'";
    for (const char* text : {"1.99", "-5", "922337203685278", "922337203685277.5",
                             "922337203685477", "1e400", "-1e400", "1e-400"})
        EXPECT_EQ(entry(text), range) << text;
    EXPECT_EQ(entry(std::string(400, '9')), range);
    for (const char* text : {"", "   ", "abc", "12abc", "1 2", "--3", "+", ".", "1e", "1e+", "0x10",
                             "inf", "nan", "1,000", "1.2.3", "e5"})
        EXPECT_EQ(entry(text), invalid) << "'" << text << "'";
    // The locale's decimal separator and the point; without a comma locale, no comma at all.
    EXPECT_EQ(entry("100,9", ','), "100");
    EXPECT_EQ(entry("100.9", ','), "100");
    EXPECT_EQ(entry("1,99", ','), range);
    EXPECT_EQ(entry("100,9", '.'), invalid);
}

TEST(NumberType, ConversionsAreExactOverflowIsRefusedAndTheTextsHaveTheirForms) {
    EXPECT_EQ(Number::fromDouble(922337203685277.0), Number::fromWhole(922337203685277));
    EXPECT_EQ(Number::fromDouble(1.23456).raw(), 12346);
    EXPECT_EQ(Number::fromDouble(-1.23454).raw(), -12345);
    EXPECT_EQ(Number::fromDouble(922337203685477.0).whole(), Number::kMaxWhole);
    EXPECT_THROW(Number::fromDouble(1e15), std::overflow_error);
    EXPECT_THROW(Number::fromWhole(Number::kMaxWhole + 1), std::overflow_error);
    const std::pair<std::string, std::string> texts[] = {
        {signedText(Number::fromWhole(360)), " 360"},
        {trimmedText(Number::fromWhole(360)), "360"},
        {signedText(Number::fromWhole(-7)), "-7"},
        {signedText(Number::fromDouble(2.5)), " 2.5"},
        {signedText(Number::fromRaw(INT64_MIN)), "-922337203685477.5808"},
        {doubleText(922337203685277.0), "922337203685277"},
        {doubleText(2.0), "2"},
        {doubleText(10.01), "10.01"}};
    for (const auto& [text, expected] : texts) EXPECT_EQ(text, expected);
}
