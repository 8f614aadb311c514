#include "oxbase/diag/OxCounters.h"
#include "oxbase/diag/OxPrt.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <climits>
#include <string>

TEST(OxCountersTest, CountingDownFloorsButDecrementWraps) {
    struct Case {
        unsigned int start;
        int amount;
        unsigned int expected;
    };
    // clang-format off
    const Case cases[] = {
        {3, -2, 1}, {2, -2, 0}, {1, -2, 0}, {0, -1, 0}, {5, 0, 5}, {5, 7, 12},
        {4294967295u, 1, 0},                 // adding wraps
        {4294967295u, INT_MIN, 2147483647u}, // the magnitude of INT_MIN is 2^31
        {2147483648u, INT_MIN, 0},
    };
    // clang-format on
    for (const Case& c : cases) {
        OxCounter counter("n");
        for (unsigned int left = c.start; left > 0;) {
            unsigned int step = left < INT_MAX ? left : INT_MAX;
            counter.addToCount(static_cast<int>(step));
            left -= step;
        }
        ASSERT_EQ(counter.getCount(), c.start);
        counter.addToCount(c.amount);
        EXPECT_EQ(counter.getCount(), c.expected) << c.start << " + " << c.amount;
    }

    OxCounter counter("n");
    counter.decrement();
    EXPECT_EQ(counter.getCount(), 4294967295u);
    counter.increment();
    counter.increment();
    EXPECT_EQ(counter.getCount(), 1u);
}

TEST(OxCountersTest, LookupByNameOnly) {
    OxCounters counters;
    counters.increment("never");
    counters.decrement("never");
    counters.addToCount("never", 4);
    EXPECT_EQ(counters.getCount("never"), 0u);
    EXPECT_EQ(counters.exists("never"), OxFalse);
    EXPECT_EQ(counters.getLength(), 0u);

    counters.add("parts");
    counters.add("Parts");
    counters.increment("parts");
    counters.increment("parts");
    counters.addToCount("parts", 0);
    EXPECT_EQ(counters.getCount("parts"), 2u);
    EXPECT_EQ(counters.getCount("Parts"), 0u);
    EXPECT_EQ(counters.exists("Parts"), OxTrue);
    counters.add("parts"); // known: the old counter stays with its count
    EXPECT_EQ(counters.getLength(), 2u);
    EXPECT_EQ(counters.getCount("parts"), 2u);
    counters.addToCount("parts", -5);
    EXPECT_EQ(counters.getCount("parts"), 0u);
    counters.decrement("parts");
    EXPECT_EQ(counters.getCount("parts"), 4294967295u);

    EXPECT_EQ(counters.getByName(nullptr), nullptr);
    EXPECT_EQ(counters.getCount(nullptr), 0u);
    counters.add(static_cast<const char*>(nullptr));
    EXPECT_EQ(counters.getLength(), 2u);
    // An empty name makes a counter that nothing finds, each time.
    counters.add("");
    counters.add("");
    EXPECT_EQ(counters.getLength(), 4u);
    EXPECT_EQ(counters.getByName(""), nullptr);
    // Null elements are passed over.
    counters.append(nullptr);
    EXPECT_EQ(counters.getByName("Parts"), counters[1]);
}

TEST(OxCountersTest, AddingAnObjectTakesItOverOnlyWhenNew) {
    OxCounters counters;
    auto* first = new OxCounter("files");
    counters.add(first);
    EXPECT_EQ(counters.getByName("files"), first); // the set owns it now

    OxCounter twin("files"); // a known name: stays with the caller (stack object)
    counters.add(&twin);
    EXPECT_EQ(counters.getByName("files"), first);
    EXPECT_EQ(counters.getLength(), 1u);

    OxCounter unnamed("");
    counters.add(&unnamed);
    counters.add(static_cast<OxCounter*>(nullptr));
    EXPECT_EQ(counters.getLength(), 1u);
    // ASan's leak check and double-free detection verify the ownership rules.
}

TEST(OxCountersTest, DumpIndentsEachCounter) {
    OxCounters empty;
    EXPECT_EQ(oxtest::dumpText(empty), "");

    OxCounters counters;
    counters.add("a");
    counters.add("");
    counters.add("b");
    counters.addToCount("b", 12);
    OxPrt prt; // resets the indentation
    OxPrt::adjustIndent(2);
    std::string indent(3, ' ');
    EXPECT_EQ(oxtest::dumpText(counters), indent + "counter[0]: Counter name: a, count: 0\n" +
                                              indent +
                                              "counter[1]: Counter name: <null>, count: 0\n" +
                                              indent + "counter[2]: Counter name: b, count: 12\n");
    OxPrt::adjustIndent(-2);
    delete counters[1];
    counters.set(1, nullptr);
    delete counters[0];
    counters.set(0, nullptr);
    EXPECT_EQ(oxtest::dumpText(counters), " counter[2]: Counter name: b, count: 12\n");
}
