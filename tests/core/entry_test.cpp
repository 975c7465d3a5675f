// The entry rule and the Number type's conversions and text forms.
#include <gtest/gtest.h>

#include <cmath>

#include "core/entry.hpp"

using namespace tarn;

namespace {

std::int64_t accepted(std::string_view text, char sep = '.') {
    const EntryResult r = ReadNumberEntry(text, sep);
    EXPECT_TRUE(r.accepted()) << "text '" << text << "' was refused: " << r.message;
    EXPECT_TRUE(r.message.empty());
    return r.accepted() ? r.number->whole() : -1;
}

std::string refused(std::string_view text, char sep = '.') {
    const EntryResult r = ReadNumberEntry(text, sep);
    EXPECT_FALSE(r.accepted()) << "text '" << text << "' was accepted";
    return r.message;
}

const std::string kInvalid(kInvalidEntryMessage);
const std::string kRange(kOutOfRangeMessage);

}  // namespace

TEST(EntryRule, AcceptsWholeNumbersAtTheBounds) {
    EXPECT_EQ(accepted("2"), 2);
    EXPECT_EQ(accepted("922337203685277"), 922337203685277);
    EXPECT_EQ(accepted("100"), 100);
}

TEST(EntryRule, TruncatesFractionsInsideTheRange) {
    EXPECT_EQ(accepted("2.5"), 2);
    EXPECT_EQ(accepted("2.9"), 2);
    EXPECT_EQ(accepted("7.9"), 7);
    EXPECT_EQ(accepted("100.9"), 100);
    EXPECT_EQ(accepted("99.9"), 99);
}

TEST(EntryRule, ChecksTheRangeBeforeTruncating) {
    EXPECT_EQ(refused("1.99"), kRange);
    EXPECT_EQ(refused("1"), kRange);
    EXPECT_EQ(refused("1.5"), kRange);
    EXPECT_EQ(refused("922337203685278"), kRange);
    EXPECT_EQ(refused("922337203685277.5"), kRange);
    EXPECT_EQ(refused("922337203685477"), kRange);
    EXPECT_EQ(refused("-5"), kRange);
    EXPECT_EQ(refused("0"), kRange);
}

TEST(EntryRule, RefusesTextThatIsNotANumber) {
    for (const char* text : {"", "   ", "abc", "12abc", "1 2", "--3", "+", ".", "1e", "1e+",
                             "0x10", "inf", "nan", "1,000", "1.2.3", "e5", "١٢"}) {
        EXPECT_EQ(refused(text), kInvalid) << "'" << text << "'";
    }
}

TEST(EntryRule, AcceptsSignsBlanksAndExponents) {
    EXPECT_EQ(accepted("  97  "), 97);
    EXPECT_EQ(accepted("\t97"), 97);
    EXPECT_EQ(accepted("+97"), 97);
    EXPECT_EQ(accepted("1e3"), 1000);
    EXPECT_EQ(accepted("1.5E2"), 150);
    EXPECT_EQ(accepted("25e-1"), 2);
    EXPECT_EQ(accepted(".5e1"), 5);
    EXPECT_EQ(accepted("5."), 5);
}

TEST(EntryRule, UsesTheLocaleDecimalSeparatorAndThePoint) {
    EXPECT_EQ(accepted("100,9", ','), 100);
    EXPECT_EQ(accepted("100.9", ','), 100);
    EXPECT_EQ(refused("1,99", ','), kRange);
    // Without a comma locale a comma is no separator at all.
    EXPECT_EQ(refused("100,9", '.'), kInvalid);
}

TEST(EntryRule, HugeAndTinyTextsAreNumbersOutOfRange) {
    EXPECT_EQ(refused(std::string(400, '9')), kRange);
    EXPECT_EQ(refused("1e400"), kRange);
    EXPECT_EQ(refused("-1e400"), kRange);
    EXPECT_EQ(refused("1e-400"), kRange);
}

TEST(WholeEntry, ConvertsWithoutTheRangeAndReportsOverflowApart) {
    EXPECT_EQ(readWholeEntry("999.9").number->whole(), 999);
    EXPECT_EQ(readWholeEntry("-5").number->whole(), -5);
    EXPECT_EQ(readWholeEntry("x").message, kInvalid);
    const EntryResult huge = readWholeEntry("1e30");
    EXPECT_FALSE(huge.accepted());
    EXPECT_TRUE(huge.message.empty());
}

TEST(NumberType, ConvertsTheUpperBoundBothWaysExactly) {
    const Number n = Number::fromWhole(922337203685277);
    EXPECT_EQ(n.toDouble(), 922337203685277.0);
    EXPECT_EQ(Number::fromDouble(n.toDouble()), n);
    EXPECT_EQ(doubleText(n.toDouble()), "922337203685277");
}

TEST(NumberType, RoundsToTheNearestTenThousandthAndRefusesOverflow) {
    EXPECT_EQ(Number::fromDouble(1.23456).raw(), 12346);
    EXPECT_EQ(Number::fromDouble(-1.23454).raw(), -12345);
    EXPECT_EQ(Number::fromDouble(2.5).raw(), 25000);
    EXPECT_EQ(Number::fromDouble(922337203685477.0).whole(), Number::kMaxWhole);
    EXPECT_THROW(Number::fromDouble(1e15), std::overflow_error);
    EXPECT_THROW(Number::fromWhole(Number::kMaxWhole + 1), std::overflow_error);
    EXPECT_THROW(Number::fromWhole(Number::kMaxWhole) + Number::fromWhole(1), std::overflow_error);
}

TEST(NumberType, TextForms) {
    EXPECT_EQ(signedText(Number::fromWhole(360)), " 360");
    EXPECT_EQ(trimmedText(Number::fromWhole(360)), "360");
    EXPECT_EQ(signedText(Number::fromWhole(0)), " 0");
    EXPECT_EQ(signedText(Number::fromWhole(-7)), "-7");
    EXPECT_EQ(signedText(Number::fromDouble(2.5)), " 2.5");
    EXPECT_EQ(signedText(Number::fromRaw(INT64_MIN)), "-922337203685477.5808");
    EXPECT_EQ(doubleText(2.0), "2");
    EXPECT_EQ(doubleText(10.01), "10.01");
    EXPECT_EQ(doubleText(15.0), "15");
}
