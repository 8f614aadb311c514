#include "oxbase/core/OxString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

namespace {
/// Owns a new[] array for the length of a test line.
struct Owned {
    char* text;
    explicit Owned(char* t) : text(t) {}
    ~Owned() { delete[] text; }
    std::string str() const { return text != nullptr ? text : "<nullptr>"; }
};

std::string stripZeros(const char* input, char fill = '\0') {
    std::string copy = input;
    std::vector<char> buffer(copy.begin(), copy.end());
    buffer.push_back('\0');
    return OxString::stripTrailingZeros(buffer.data(), fill);
}
} // namespace

TEST(OxString, BufferMovesBetweenInlineAndHeap) {
    OxString empty;
    EXPECT_STREQ(empty.getString(), "");
    EXPECT_EQ(!empty, 1);

    OxString fifteen("123456789012345");
    const char* inlineBuffer = fifteen.getString();
    EXPECT_GE(inlineBuffer, reinterpret_cast<const char*>(&fifteen));
    EXPECT_LT(inlineBuffer, reinterpret_cast<const char*>(&fifteen + 1));

    OxString sixteen("1234567890123456");
    EXPECT_FALSE(sixteen.getString() >= reinterpret_cast<const char*>(&sixteen) &&
                 sixteen.getString() < reinterpret_cast<const char*>(&sixteen + 1));

    OxString hundred(std::string(100, 'x').c_str());
    hundred = "abc";
    EXPECT_STREQ(hundred.getString(), "abc");
    EXPECT_GE(hundred.getString(), reinterpret_cast<const char*>(&hundred));
    EXPECT_LT(hundred.getString(), reinterpret_cast<const char*>(&hundred + 1));

    OxString self("a text of more than sixteen characters");
    OxString& alias = self;
    self = alias;                // self-assignment keeps the text
    self = self.getString() + 2; // a piece of its own text
    EXPECT_STREQ(self.getString(), "text of more than sixteen characters");

    OxString joined("abc");
    joined += "";
    joined += OxString("defghijklmnopqrstuvwxyz");
    EXPECT_STREQ(joined.getString(), "abcdefghijklmnopqrstuvwxyz");
    EXPECT_EQ(joined.getLength(), 26u);
    OxString copy(joined);
    EXPECT_STREQ(copy.getString(), joined.getString());
    EXPECT_NE(copy.getString(), joined.getString());
    joined.makeEmpty(OxTrue);
    EXPECT_STREQ(joined.getString(), "");

    EXPECT_STREQ(OxString(-42).getString(), "-42");
    EXPECT_STREQ(OxString("abcdef", 3).getString(), "abc");
    EXPECT_STREQ(OxString("abcdef", 2, 3).getString(), "cd");
}

TEST(OxString, SubStrings) {
    OxString text("abcdef");
    EXPECT_STREQ(text.getSubString(2, 3).getString(), "cd");
    EXPECT_STREQ(text.getSubString(2, -1).getString(), "cdef");
    EXPECT_STREQ(text.getSubString(2, 100).getString(), "cdef");
    EXPECT_STREQ(text.getSubString(3, 1).getString(), "a");

    OxString a("abcdef"), b("abcdef"), c("abcdef");
    a.deleteSubString(1, 2);
    b.deleteSubString(2, -1);
    c.deleteSubString(3, 1);
    EXPECT_STREQ(a.getString(), "adef");
    EXPECT_STREQ(b.getString(), "ab");
    EXPECT_STREQ(c.getString(), "abcdef");
}

TEST(OxString, Hash) {
    EXPECT_EQ(OxString("").hash(), 0u);
    EXPECT_EQ(OxString("a").hash(), 97u);
    EXPECT_EQ(OxString("abc").hash(), 100384u);
    // Characters above 127 are widened with their sign.
    unsigned int expected = 0xFFFFFFFFu ^ 0xFFu ^ 0x80u; // 0 ^ (-128 as 32 bits)
    EXPECT_EQ(OxString("\x80").hash(), expected);
}

TEST(OxString, DupCombineAppendNullAndEmptyRules) {
    EXPECT_EQ(OxString::dup(nullptr), nullptr);
    EXPECT_EQ(OxString::dup(""), nullptr);
    EXPECT_EQ(OxString::dup("abc", 0), nullptr);
    EXPECT_EQ(OxString::dup(nullptr, 3), nullptr);
    Owned padded(OxString::dup("a", 5));
    EXPECT_EQ(std::memcmp(padded.text, "a\0\0\0\0\0", 6), 0);
    Owned cut(OxString::dup("abcdef", 3));
    EXPECT_STREQ(cut.text, "abc");

    EXPECT_EQ(OxString::combine("", ""), nullptr);
    EXPECT_EQ(OxString::combine(nullptr, "a"), nullptr);
    EXPECT_EQ(Owned(OxString::combine("", "x")).str(), "x");
    EXPECT_EQ(Owned(OxString::combine("x", "")).str(), "x");
    EXPECT_EQ(Owned(OxString::combine("ab", "cd")).str(), "abcd");

    char* text = OxString::dup("base");
    EXPECT_EQ(OxString::append(text, static_cast<const char*>(nullptr)), nullptr);
    EXPECT_STREQ(text, "base"); // still the caller's and still valid
    text = OxString::append(text, ".xml");
    text = OxString::append(text, '!');
    Owned result(text);
    EXPECT_EQ(result.str(), "base.xml!");
    EXPECT_EQ(OxString::append(static_cast<char*>(nullptr), 'x'), nullptr);
}

TEST(OxString, InPlaceEdits) {
    char crlf[] = "a\r\nb\nc\rd";
    EXPECT_STREQ(OxString::stripCRLF(crlf), "a b c d");
    char ends[] = "\r\n\n";
    EXPECT_STREQ(OxString::stripCRLF(ends), "  ");
    EXPECT_EQ(OxString::stripCRLF(nullptr), nullptr);

    char white[] = " \t a b \n";
    EXPECT_STREQ(OxString::stripWhite(white), "a b");
    char blanks[] = "    ";
    EXPECT_STREQ(OxString::stripWhite(blanks), "");

    char mixed[] = "MiXeD 1";
    EXPECT_STREQ(OxString::toLower(mixed), "mixed 1");
    EXPECT_STREQ(OxString::toUpper(mixed), "MIXED 1");

    EXPECT_EQ(OxString::occurances("banana", 'a'), 3u);
    EXPECT_EQ(OxString::occurances("", 'a'), 0u);
    EXPECT_EQ(OxString::occurances(nullptr, 'a'), 0u);
}

TEST(OxString, StripTrailingZeros) {
    // clang-format off
    const char* const cases[][2] = {
        {"1.500", "1.5"}, {"1.000", "1.0"}, {"10.0", "10.0"}, {"100", "100"}, {".500", ".5"},
        {"-2.50", "-2.5"}, {"1.050", "1.05"}, {"1.5e10", "1.5e10"}, {"1.50e10", "1.50e10"},
        {"abc", "abc"}, {"1.2.30", "1.2.30"}, {"  2.200  ", "2.2"}, {"", ""},
    };
    // clang-format on
    for (const auto& c : cases) {
        EXPECT_EQ(stripZeros(c[0]), c[1]) << c[0];
    }
    EXPECT_EQ(stripZeros("1.500", ' '), "1.5  ");
    EXPECT_EQ(OxString::stripTrailingZeros(nullptr, '\0'), nullptr);
}

TEST(OxString, Translate) {
    // Squeeze: the second of two blanks follows a translated blank, so it is
    // not translated; the characters behind it that are still blanks are
    // copied down one place and the text keeps its length. A match at a later
    // position of `from` clears the memory.
    struct Case {
        const char* text;
        const char* from;
        const char* to;
        OxBool squeeze;
        unsigned int count;
        const char* result;
    } cases[] = {
        {"hello", "lo", "01", OxFalse, 3, "he001"},
        {"hello", "loh", "01", OxFalse, 3, "he001"}, // 'h' has no partner
        {"", "a", "b", OxFalse, 0, ""},
        {"hello", "", "b", OxFalse, 0, "hello"},
        {"a b c", " ", ",", OxFalse, 2, "a,b,c"},
        {"a  b", " ", ",", OxTrue, 1, "a, b"},
        {"a   b", " ", ",", OxTrue, 1, "a,  b"},
        {"a b c", " ", ",", OxTrue, 2, "a,b,c"},
        {"a-x", "-x", "+y", OxTrue, 2, "a+y"},
    };
    for (const Case& c : cases) {
        std::string text = c.text;
        EXPECT_EQ(OxString::tr(&text[0], c.from, c.to, c.squeeze), c.count) << c.text;
        EXPECT_STREQ(text.c_str(), c.result) << c.text;
        if (std::strlen(c.from) == 1) { // the one-character form agrees
            std::string again = c.text;
            EXPECT_EQ(OxString::tr(&again[0], c.from[0], c.to[0], c.squeeze), c.count);
            EXPECT_EQ(again, text);
        }
    }
    char hello[] = "hello";
    EXPECT_EQ(OxString::tr(nullptr, "a", "b", OxFalse), 0u);
    EXPECT_EQ(OxString::tr(hello, nullptr, "b", OxFalse), 0u);
}
