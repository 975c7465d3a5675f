// The megabyte figure shown before a large results file is opened.
#include "tools/results_size.hpp"

#include <gtest/gtest.h>

using namespace tarn;

TEST(ResultsSize, FigureIsCutToTwoDecimalsAndExactBeyondFourGigabytes) {
    struct Case {
        std::uint64_t bytes;
        const char* text;
        bool large;
    };
    for (const Case& c :
         {Case{10485760, "10", false}, Case{10496245, "10", false}, Case{10496246, "10.01", true},
          Case{12582911, "11.99", true}, Case{0, "0", false}, Case{11010048, "10.5", true},
          Case{5ULL << 30, "5120", true}, Case{(5ULL << 30) + 10485, "5120", true},
          Case{(5ULL << 30) + 10486, "5120.01", true}}) {
        const double figure = sizeFigure(c.bytes);
        EXPECT_EQ(megabyteText(figure), c.text) << c.bytes;
        EXPECT_EQ(isLargeFigure(figure), c.large) << c.bytes;
    }
}
