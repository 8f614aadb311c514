#include "oxbase/ranges/OxRangeList.h"
#include "oxbase/diag/OxMsg.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <set>
#include <string>
#include <vector>

namespace {

void collect(const char* text, void* userData) {
    static_cast<std::vector<std::string>*>(userData)->push_back(text);
}

class OxRangeListTest : public testing::Test {
protected:
    oxtest::TempDir dir;
    std::vector<std::string> messages;
    std::unique_ptr<OxMsg> msg;

    void SetUp() override {
        oxtest::writeFile(dir.file("ranges.msg"), "228,S,0nomem %s\n"
                                                  "293,E,0syntax %s %u [%s]\n"
                                                  "294,E,0backwards %s %u %u\n");
        msg = std::make_unique<OxMsg>(dir.file("ranges.msg").c_str(), nullptr, nullptr, nullptr);
        OxMsg::setMsgCallback(collect);
        OxMsg::setMsgCallbackUserData(&messages);
        testing::internal::CaptureStderr(); // errors also reach standard error
    }
    void TearDown() override {
        testing::internal::GetCapturedStderr();
        OxMsg::setMsgCallback(nullptr);
        OxMsg::setMsgCallbackUserData(nullptr);
    }
};

std::string text(OxRangeList& list) {
    std::unique_ptr<char[]> s(list.convertToString());
    return s ? s.get() : "<null>";
}

std::string compacted(const char* source) {
    OxRangeList list(source, nullptr);
    list.compact();
    return text(list);
}

std::vector<unsigned int> walk(OxRangeList& list) {
    std::vector<unsigned int> members;
    unsigned int n = 0;
    if (list.getFirstEntry(n) == OxTrue) {
        do {
            members.push_back(n);
        } while ((n = list.getNextEntry(n)) != 0 && members.size() < 100000);
    }
    return members;
}

// Exposes the tree slot so that the dump of a list with a tree can be seen.
struct TreeRangeList : OxRangeList {
    using OxRangeList::OxRangeList;
    using OxRangeList::tree;
    OxGBinaryTree<OxRangeListRecord*>* makeTree() {
        return tree = new OxGBinaryTree<OxRangeListRecord*>;
    }
};

} // namespace

TEST_F(OxRangeListTest, AcceptedTexts) {
    // clang-format off
    struct Case {
        const char* source;
        const char* records; // list order, as convertToString spells it
    } cases[] = {
        {"5", "5"}, {"3-3", "3"}, {"1,2 3", "1,2,3"}, {"1, 2", "1,2"}, {"1\n2", "1,2"},
        {"1\r\n2", "1,2"}, {"\t1, \t 2-4", "1,2-4"}, {"9,1-3,2-4", "9,1-3,2-4"}, {"1,2,", "1"},
        {"  7  ", "7"}, {"4294967295", "4294967295"}, {"4294967296", "0"},
        {"4294967297-4294967298", "1-2"},
    };
    // clang-format on
    for (const Case& c : cases) {
        OxRangeList list(c.source, nullptr);
        EXPECT_EQ(list.isValid(), OxTrue) << c.source;
        EXPECT_EQ(text(list), c.records) << c.source;
    }
    EXPECT_TRUE(messages.empty());

    OxRangeList blank("  ", nullptr);
    EXPECT_EQ(blank.isValid(), OxTrue);
    EXPECT_EQ(blank.getLength(), 0u);
    OxRangeList empty("", nullptr), null(nullptr, nullptr), unset;
    EXPECT_EQ(empty.isValid(), OxFalse);
    EXPECT_EQ(null.isValid(), OxFalse);
    EXPECT_EQ(unset.isValid(), OxFalse);
}

TEST_F(OxRangeListTest, RejectedTextsAndTheirPositions) {
    // clang-format off
    struct Case {
        const char* source;
        const char* message;
    } cases[] = {
        {"1 , 2", "syntax integer 3 [1 , 2]"}, {"1-", "syntax integer 3 [1-]"},
        {"1-a", "syntax integer 3 [1-a]"}, {"-1", "syntax integer 1 [-1]"},
        {"a", "syntax integer 1 [a]"}, {"1\t2", "syntax integer 2 [1\t2]"},
        {"12,3-4-5", "syntax integer 7 [12,3-4-5]"}, {" 1,,2 ", "syntax integer 3 [1,,2]"},
        {"3-2", "backwards integer 3 2"}, {"1,10-9", "backwards integer 10 9"},
    };
    // clang-format on
    for (const Case& c : cases) {
        messages.clear();
        OxRangeList list(c.source, nullptr);
        EXPECT_EQ(list.isValid(), OxFalse) << c.source;
        EXPECT_EQ(list.getLength(), 0u) << c.source;
        EXPECT_EQ(list.capacity, 0u) << c.source; // records and array released
        EXPECT_EQ(messages, std::vector<std::string>{c.message}) << c.source;
    }
    messages.clear();
    OxRangeList pages("1-x", "page");
    EXPECT_EQ(messages, std::vector<std::string>{"syntax page 3 [1-x]"});
}

TEST_F(OxRangeListTest, SortCompactAndTouchingRanges) {
    OxRangeList list("9,1-3,2-4", nullptr);
    EXPECT_EQ(list.isInRange(4), OxTrue); // no compaction needed
    EXPECT_EQ(list.isInRange(5), OxFalse);
    EXPECT_EQ(text(list), "9,1-3,2-4");
    list.compact();
    EXPECT_EQ(text(list), "1-4,9");

    EXPECT_EQ(compacted("1-3,4-6"), "1-3,4-6");
    EXPECT_EQ(compacted("1-3,3-6"), "1-6");
    EXPECT_EQ(compacted("1-10,2-3"), "1-10");
    EXPECT_EQ(compacted("5,5,5"), "5");
    EXPECT_EQ(compacted("0-4294967295,7"), "0-4294967295");

    OxRangeList stable("5-9,1,5-6", nullptr); // equal `first` keep their order
    stable.sort();
    EXPECT_EQ(text(stable), "1,5-9,5-6");
}

TEST_F(OxRangeListTest, NumbersMergeAndNegate) {
    OxGList<unsigned int> numbers;
    for (unsigned int n : {7u, 1u, 2u, 3u, 3u}) {
        numbers.append(n);
    }
    OxRangeList fromNumbers(numbers, nullptr);
    EXPECT_EQ(text(fromNumbers), "1-3,7");
    ASSERT_EQ(numbers.getLength(), 4u); // sorted and without repeats in place
    EXPECT_EQ(numbers[3], 7u);
    OxGList<unsigned int> extremes;
    for (unsigned int n : {4294967295u, 0u, 4294967294u}) {
        extremes.append(n);
    }
    OxRangeList fromExtremes(extremes, nullptr);
    EXPECT_EQ(text(fromExtremes), "0,4294967294-4294967295");
    OxGList<unsigned int> none;
    OxRangeList fromNone(none, nullptr);
    EXPECT_EQ(fromNone.isValid(), OxTrue);
    EXPECT_EQ(fromNone.getLength(), 0u);

    OxRangeList target("2-5", nullptr), source("1-3", nullptr), nothing("  ", nullptr);
    target.merge(source);
    EXPECT_EQ(text(target), "1-5");
    EXPECT_EQ(text(source), "1-3");
    OxRangeList unordered("5,1", nullptr);
    unordered.merge(nothing);
    EXPECT_EQ(text(unordered), "1,5");
    unordered.merge(unordered);
    EXPECT_EQ(text(unordered), "1,5");

    auto negated = [](const char* source, unsigned int from, unsigned int to) {
        OxRangeList list(source, nullptr);
        EXPECT_EQ(list.negate(from, to), OxTrue) << source;
        return text(list);
    };
    EXPECT_EQ(negated("1-3,10-12,20-22", 11, 15), "4-9,13-19");
    EXPECT_EQ(negated("3-4", 1, 10), "1-2,5-10");
    EXPECT_EQ(negated("1-10", 1, 10), "<null>");
    EXPECT_EQ(negated("4-6,1-3", 0, 10), "0,7-10"); // touching: no gap
    EXPECT_EQ(negated("  ", 2, 7), "2-7");
    EXPECT_EQ(negated("0-4294967295", 0, 4294967295u), "<null>");
    OxRangeList kept("1-3", nullptr);
    EXPECT_EQ(kept.negate(5, 4), OxFalse);
    EXPECT_EQ(text(kept), "1-3");
}

TEST_F(OxRangeListTest, Walk) {
    OxRangeList two("1-2,3-4", nullptr);
    EXPECT_EQ(walk(two), (std::vector<unsigned int>{1, 2, 3, 4}));
    EXPECT_EQ(two.getLength(), 2u);

    OxRangeList several("20-22,1-3,10,2", nullptr);
    EXPECT_EQ(walk(several), (std::vector<unsigned int>{1, 2, 3, 10, 20, 21, 22}));
    // Numbers out of the walk's order are searched from the front.
    EXPECT_EQ(several.getNextEntry(21), 22u);
    EXPECT_EQ(several.getNextEntry(1), 2u);
    EXPECT_EQ(several.getNextEntry(3), 10u);
    EXPECT_EQ(several.getNextEntry(5), 0u);
    EXPECT_EQ(several.getNextEntry(22), 0u);

    OxRangeList empty("  ", nullptr);
    unsigned int n = 99;
    EXPECT_EQ(empty.getFirstEntry(n), OxFalse);
    EXPECT_EQ(n, 0u);

    // Random sets against an ordered set of the same numbers.
    std::mt19937 random(7);
    for (int round = 0; round < 20; round++) {
        OxGList<unsigned int> numbers;
        std::set<unsigned int> expected;
        for (int i = 0; i < 300; i++) {
            unsigned int v = 1 + random() % 500;
            numbers.append(v);
            expected.insert(v);
        }
        OxRangeList list(numbers, nullptr);
        EXPECT_EQ(walk(list), std::vector<unsigned int>(expected.begin(), expected.end()));
        for (unsigned int v = 0; v < 510; v += 37) {
            EXPECT_EQ(list.isInRange(v), OxToBool(expected.count(v) != 0));
        }
    }
}

TEST_F(OxRangeListTest, Dump) {
    TreeRangeList list("1-3,7", nullptr);
    std::ostrstream plain;
    list.dump(&plain);
    EXPECT_EQ(oxtest::streamText(plain), "OxRangeList (List of numeric ranges):\n"
                                         "There are 2 range records in the range list.\n"
                                         "[0]: Numbers from 1 through 3\n"
                                         "[1]: Number 7\n");

    list.makeTree()->insert(1, list[0]);
    std::ostrstream treeText;
    list.tree->dump(&treeText, list.tree->root);
    std::ostrstream withTree;
    list.dump(&withTree);
    EXPECT_EQ(oxtest::streamText(withTree), oxtest::streamText(plain) + "---- OxBinaryTree:\n" +
                                                oxtest::streamText(treeText) +
                                                "---- End of OxBinaryTree:\n");
    list.negate(0, 9); // disposes of the tree
    EXPECT_EQ(list.tree, nullptr);
    EXPECT_EQ(text(list), "0,4-6,8-9");
}

TEST_F(OxRangeListTest, BadInputNeverCrashes) {
    for (int c = 1; c < 256; c++) {
        std::string source = std::string("1") + static_cast<char>(c) + "2";
        OxRangeList list(source.c_str(), nullptr);
        std::string expected = "<null>";
        if (c >= '0' && c <= '9') {
            expected = "1" + std::string(1, static_cast<char>(c)) + "2";
        } else if (c == ',' || c == ' ' || c == '\n' || c == '\r') {
            expected = "1,2";
        } else if (c == '-') {
            expected = "1-2";
        }
        EXPECT_EQ(text(list), expected) << c;
    }

    std::string big;
    while (big.size() < (1u << 20)) {
        big += "123,99999999999999-77,";
    }
    OxRangeList wraps(big.c_str(), nullptr); // 99999999999999 wraps to 276447231
    EXPECT_EQ(wraps.isValid(), OxFalse);

    std::string manyRanges;
    for (unsigned int i = 0; manyRanges.size() < (1u << 20); i += 3) {
        manyRanges += std::to_string(i) + "-" + std::to_string(i + 1) + " ";
    }
    OxRangeList many(manyRanges.c_str(), nullptr);
    ASSERT_EQ(many.isValid(), OxTrue);
    unsigned int records = many.getLength();
    many.compact();
    EXPECT_EQ(many.getLength(), records); // gaps of one number: nothing merges

    std::mt19937 random(3);
    std::string noise(1u << 20, ' ');
    for (char& ch : noise) {
        ch = static_cast<char>(1 + random() % 255);
    }
    OxRangeList fuzz(noise.c_str(), nullptr);
    EXPECT_EQ(fuzz.getLength(), 0u);
}
