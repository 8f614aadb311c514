#include "oxbase/core/OxString.h"

#include <gtest/gtest.h>

#include <climits>
#include <ctime>
#include <string>

namespace {
// The text of a conversion, with the array released; "<null>" for null.
std::string text(char* converted) {
    std::string result = converted != nullptr ? converted : "<null>";
    delete[] converted;
    return result;
}
} // namespace

TEST(OxStringConvertTest, Numbers) {
    // 1.5 gives 1.5 on the first conversion (fixed notation) and on later ones.
    EXPECT_EQ(text(OxString::toString(1.5)), "1.5");
    EXPECT_EQ(text(OxString::toString(1.5)), "1.5");
    EXPECT_EQ(text(OxString::toString(2.0)), "2.0");
    EXPECT_EQ(text(OxString::toString(-3)), "-3");
    EXPECT_EQ(text(OxString::toString(4000000000u)), "4000000000");
    EXPECT_EQ(text(OxString::toString(0.25f)), "0.25");
    EXPECT_EQ(text(OxString::toString(-2.5)), "-2.5");
    // A later conversion runs in general notation with nine digits: an
    // exponent appears and stays.
    EXPECT_EQ(text(OxString::toString(1e10)), "1.00000000e+10");
    EXPECT_EQ(text(OxString::toString(123456.789)), "123456.789");

    char* first = OxString::toString(7);
    char* second = OxString::toString(7);
    EXPECT_NE(first, second);
    EXPECT_STREQ(first, "7");
    EXPECT_STREQ(second, "7");
    delete[] first;
    delete[] second;
}

TEST(OxStringConvertTest, BrokenDownTime) {
    tm time = {};
    time.tm_year = 2026 - 1900;
    time.tm_mon = 10;
    time.tm_mday = 18;
    time.tm_hour = 23;
    time.tm_min = 5;
    time.tm_sec = 9;
    EXPECT_EQ(text(OxString::toString(&time)), "_y2026_m11_d18_h23_m05_s09");

    time.tm_mon = 0;
    time.tm_mday = 1;
    time.tm_hour = 0;
    EXPECT_EQ(text(OxString::toString(&time)), "_y2026_m01_d01_h00_m05_s09");

    // A null time writes nothing: the next conversion starts clean.
    EXPECT_EQ(text(OxString::toString(static_cast<tm*>(nullptr))), "<null>");
    EXPECT_EQ(text(OxString::toString(-3)), "-3");

    // Fields at the ends of int neither overflow nor lose digits.
    time.tm_year = INT_MAX;
    time.tm_mon = INT_MAX;
    std::string extreme = text(OxString::toString(&time));
    EXPECT_EQ(extreme.substr(0, 26), "_y2147485547_m2147483648_d");
}
