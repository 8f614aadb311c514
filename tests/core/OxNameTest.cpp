#include "oxbase/core/OxName.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

// Interning writes the table's trace lines; the tests keep them off the screen.
class OxNameTest : public testing::Test {
protected:
    void SetUp() override { testing::internal::CaptureStderr(); }
    void TearDown() override { testing::internal::GetCapturedStderr(); }
};

TEST_F(OxNameTest, IdentityAndEmptyName) {
    OxName a("bracket");
    OxName b(OxString("bracket"));
    OxName c = a;
    EXPECT_EQ(a.getString(), b.getString());
    EXPECT_EQ(a.getString(), c.getString());
    EXPECT_STREQ(a.getString(), "bracket");
    EXPECT_EQ(a.getLength(), 7u);
    EXPECT_NE(OxName("bracket2").getString(), a.getString());

    OxName empty;
    EXPECT_EQ(!empty, 1);
    EXPECT_EQ(empty.getLength(), 0u);
    EXPECT_EQ(empty.getString(), OxName("").getString());
    EXPECT_EQ(!a, 0);
}

TEST_F(OxNameTest, IdentityAcrossGrowth) {
    std::vector<const char*> first;
    for (int i = 0; i < 500; i++) {
        first.push_back(OxName(("grow" + std::to_string(i)).c_str()).getString());
    }
    for (int i = 0; i < 500; i++) {
        std::string text = "grow" + std::to_string(i);
        EXPECT_STREQ(first[i], text.c_str());
        EXPECT_EQ(OxName(text.c_str()).getString(), first[i]) << text;
    }
}

TEST_F(OxNameTest, StripWhite) {
    EXPECT_STREQ(OxName::stripWhite("  ab c ").getString(), "ab c");
    EXPECT_EQ(OxName::stripWhite("  ab c ").getString(), OxName("ab c").getString());
    EXPECT_STREQ(OxName::stripWhite("\t x").getString(), "x");
    EXPECT_STREQ(OxName::stripWhite("y\n").getString(), "y");
    EXPECT_EQ(!OxName::stripWhite(" \t "), 1);
    EXPECT_EQ(!OxName::stripWhite(""), 1);
    // Trailing white space: the copy is cut at 512 characters; otherwise whole.
    std::string longText(600, 'q');
    EXPECT_EQ(OxName::stripWhite((" " + longText + " ").c_str()).getLength(), 512u);
    EXPECT_EQ(OxName::stripWhite((" " + longText).c_str()).getLength(), 600u);
}

TEST_F(OxNameTest, CharacterClasses) {
    for (char c : {' ', '\t', '+', '{', '}', '"', '\'', '\\', '\x01', '\x7f'}) {
        EXPECT_EQ(OxName::isIdentChar(c), OxFalse) << int(c);
    }
    for (char c : {'a', 'Z', '0', '9', '_', '-', '.', '/', '\xe9'}) {
        EXPECT_EQ(OxName::isIdentChar(c), OxTrue) << int(c);
    }
    EXPECT_EQ(OxName::isIdentStartChar('5'), OxFalse);
    EXPECT_EQ(OxName::isIdentStartChar('_'), OxFalse);
    EXPECT_EQ(OxName::isIdentStartChar('\xe9'), OxFalse);
    EXPECT_EQ(OxName::isIdentStartChar('k'), OxTrue);
    EXPECT_EQ(OxName::underline, '_');
}
