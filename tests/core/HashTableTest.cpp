#include "oxbase/core/HashTable.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

std::string traced(HashTable& table, const char* text, bool insert = true) {
    testing::internal::CaptureStderr();
    if (insert) {
        table.insert(OxString(text));
    } else {
        table.remove(OxString(text));
    }
    return testing::internal::GetCapturedStderr();
}

std::string lines(unsigned int pos, unsigned int ref, const char* element) {
    return "  currentPos = " + std::to_string(pos) +
           "\n  array[currentPos].ref = " + std::to_string(ref) +
           "\n  array[currentPos].element = " + element + "\n";
}

/// Texts "k<i>" whose hash lands on the same home slot of a 13-slot table.
std::vector<std::string> collisions(unsigned int count, unsigned int& home) {
    std::vector<std::vector<std::string>> bySlot(13);
    for (int i = 0;; i++) {
        std::string text = "k" + std::to_string(i);
        auto& slot = bySlot[OxString::hash(text.c_str()) % 13];
        slot.push_back(text);
        if (slot.size() == count) {
            home = OxString::hash(text.c_str()) % 13;
            return slot;
        }
    }
}

} // namespace

TEST(HashTableTest, PrimesAndNextPrime) {
    EXPECT_EQ(HashTable::nextPrime(0), 1u);
    EXPECT_EQ(HashTable::nextPrime(8), 11u);
    EXPECT_EQ(HashTable::nextPrime(26), 29u);
    EXPECT_EQ(HashTable::nextPrime(13), 13u);
    EXPECT_EQ(HashTable::isPrime(9), OxFalse);
    EXPECT_EQ(HashTable::isPrime(4), OxTrue);
    EXPECT_EQ(HashTable::isPrime(10), OxTrue); // no odd divisor
    EXPECT_EQ(HashTable::isPrime(16), OxTrue);
    EXPECT_EQ(HashTable::isPrime(4294967291u), OxTrue); // largest 32-bit prime
    // From 9 on, nextPrime is the smallest real prime at or above the odd start.
    std::vector<bool> composite(5000, false);
    for (unsigned int i = 2; i < 5000; i++) {
        for (unsigned int j = 2 * i; j < 5000; j += i) {
            composite[j] = true;
        }
    }
    for (unsigned int n = 9; n < 4900; n++) {
        unsigned int expected = n | 1u;
        while (composite[expected]) {
            expected += 2;
        }
        ASSERT_EQ(HashTable::nextPrime(n), expected) << n;
    }
}

TEST(HashTableTest, UseCountsFindAndTrace) {
    HashTable table;
    table.init();
    EXPECT_EQ(table.getTableSize(), 13u);
    // "abc" hashes to 100384, slot 100384 % 13 = 11.
    EXPECT_EQ(traced(table, "abc"), lines(11, 1, "abc"));
    EXPECT_EQ(traced(table, "abc"), lines(11, 2, "abc"));
    EXPECT_EQ(table.getRef(OxString("abc")), 2u);
    testing::internal::CaptureStderr();
    EXPECT_EQ(table.remove(OxString("abc")), OxFalse);
    EXPECT_EQ(table.remove(OxString("abc")), OxTrue);
    EXPECT_EQ(table.remove(OxString("abc")), OxTrue); // nothing left to lower
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              lines(11, 2, "abc") + lines(11, 1, "abc") +
                  "  currentPos = 11\n  array[currentPos].ref = 0\n");

    table.find(OxString("abc"));
    EXPECT_EQ(table.wasFound(), OxFalse);
    EXPECT_STREQ(table.find(OxString("abc")).getString(), "abc"); // left behind
    traced(table, "xyz");
    EXPECT_STREQ(table.find(OxString("xyz")).getString(), "xyz");
    EXPECT_EQ(table.wasFound(), OxTrue);
    table.isFound(OxString("none"));
    EXPECT_EQ(table.wasFound(), OxTrue); // isFound leaves it alone

    HashTable copy;
    copy = table;
    traced(table, "xyz");
    EXPECT_EQ(copy.getRef(OxString("xyz")), 1u);
    EXPECT_EQ(table.getRef(OxString("xyz")), 2u);
    table.makeEmpty();
    EXPECT_EQ(table.isFound(OxString("xyz")), OxFalse);
    EXPECT_EQ(copy.isFound(OxString("xyz")), OxTrue);
}

TEST(HashTableTest, QuadraticProbingAndFreedSlots) {
    unsigned int home = 0;
    std::vector<std::string> texts = collisions(3, home);
    HashTable table;
    table.init();
    EXPECT_EQ(traced(table, texts[0].c_str()), lines(home, 1, texts[0].c_str()));
    EXPECT_EQ(traced(table, texts[1].c_str()), lines((home + 1) % 13, 1, texts[1].c_str()));
    EXPECT_EQ(traced(table, texts[2].c_str()), lines((home + 4) % 13, 1, texts[2].c_str()));
    // A freed slot ends the probe: the entries pushed past it are lost.
    traced(table, texts[0].c_str(), false);
    EXPECT_EQ(table.isFound(OxString(texts[1].c_str())), OxFalse);
    EXPECT_EQ(table.isFound(OxString(texts[2].c_str())), OxFalse);
}

TEST(HashTableTest, GrowthAtHalfLoad) {
    HashTable table;
    table.init();
    const char* texts[] = {"a", "b", "c", "d", "e", "f"};
    for (int i = 0; i < 5; i++) {
        traced(table, texts[i]);
    }
    EXPECT_EQ(table.getTableSize(), 13u);
    std::string trace = traced(table, "f");
    EXPECT_EQ(table.getTableSize(), 29u);
    EXPECT_EQ(table.getCurrentSize(), 6u);
    // The insert's position line, six reinsertions of three lines, two closing lines.
    size_t count = 0;
    for (char c : trace) {
        count += c == '\n' ? 1 : 0;
    }
    EXPECT_EQ(count, 1u + 6u * 3u + 2u);
    EXPECT_EQ(trace.rfind("  currentPos = ", 0), 0u);
    for (const char* text : texts) {
        EXPECT_EQ(table.getRef(OxString(text)), 1u) << text;
    }
    for (int i = 0; i < 200; i++) {
        traced(table, ("n" + std::to_string(i)).c_str());
    }
    EXPECT_LT(table.getCurrentSize(), table.getTableSize() / 2);
    EXPECT_EQ(table.isFound(OxString("n199")), OxTrue);
}
