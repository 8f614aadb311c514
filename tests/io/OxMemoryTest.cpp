#include "oxbase/io/OxMemory.h"
#include "OxIoTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>

using oxiotest::IoTest;
using oxiotest::Numbers;

TEST_F(IoTest, MemoryNeverHandsOutTheLastByte) {
    unsigned char bytes[24] = {0x3F, 0xF0, 0, 0, 0, 0, 0, 0, 0x40, 0, 0, 0, 0, 0, 0, 0};
    unsigned char before[24];
    std::memcpy(before, bytes, sizeof bytes);
    double d = 0;
    {
        OxMemory eight(bytes, 8);
        EXPECT_EQ(eight.read(d), 0);
        EXPECT_EQ(eight.getCurOffset(), 0);
        EXPECT_EQ(taken(), Numbers{"147"});
        OxMemory nine(bytes, 9);
        EXPECT_EQ(nine.read(d), 8);
        EXPECT_EQ(d, 1.0);
        EXPECT_EQ(nine.getCurOffset(), 8);
        char c = 'q';
        EXPECT_EQ(nine.read(c), 0);
        EXPECT_EQ(c, 'q');
        EXPECT_EQ(taken(), Numbers{"147"});
        OxMemory one(bytes, 1);
        EXPECT_EQ(one.read(c), 0);
        EXPECT_EQ(taken(), Numbers{"147"});

        OxMemory all(bytes, 24); // three doubles' worth yields two
        EXPECT_EQ(all.getLength(), 24u);
        EXPECT_EQ(all.read(d) + all.read(d) + all.read(d), 16);
        EXPECT_EQ(d, 2.0);
        EXPECT_EQ(taken(), Numbers{"147"});
        int i = 0;
        EXPECT_EQ(all.read(i), 4); // a failed read leaves no trace
        EXPECT_EQ(all.getCurOffset(), 20);
        std::ostrstream s;
        EXPECT_EQ(all.dump(&s), &s);
        EXPECT_EQ(oxtest::streamText(s), "");
    }
    EXPECT_EQ(std::memcmp(bytes, before, sizeof bytes), 0);

    unsigned char five[5] = {0, 0, 0, 1, 9};
    OxMemory m(five, 5);
    int i = 0;
    EXPECT_EQ(m.read(i), 4);
    EXPECT_EQ(i, 1);
    EXPECT_EQ(m.read(static_cast<char*>(nullptr), 0), 0); // passes the test, no message
    EXPECT_EQ(taken(), Numbers{});

    char a[3];
    unsigned char b[3];
    OxMemory first(bytes, 24), second(bytes, 24);
    EXPECT_EQ(first.read(a, 3), 3);
    EXPECT_EQ(second.read(b, 3), 3);
    EXPECT_EQ(std::memcmp(a, b, 3), 0);
    EXPECT_EQ(first.getCurOffset(), second.getCurOffset());
    EXPECT_EQ(first.read(a, 21), 0);
    EXPECT_EQ(taken(), Numbers{"147"});
}

TEST_F(IoTest, MemorySeeksClamp) {
    unsigned char bytes[10] = {};
    OxMemory m(bytes, 10);
    EXPECT_EQ(m.seek(10, OxMemory::DIR_BEGIN), OxTrue);
    EXPECT_EQ(m.getCurOffset(), 10);
    char c;
    EXPECT_EQ(m.read(static_cast<char*>(nullptr), 0), 0);
    EXPECT_EQ(m.read(c), 0);
    EXPECT_EQ(taken(), (Numbers{"147", "147"}));
    EXPECT_EQ(m.seek(11, OxMemory::DIR_BEGIN), OxFalse);
    EXPECT_EQ(m.getCurOffset(), 9);
    EXPECT_EQ(taken(), Numbers{"153"});

    EXPECT_EQ(m.seek(0, OxMemory::DIR_BEGIN), OxTrue);
    EXPECT_EQ(m.seek(10, OxMemory::DIR_CURRENT), OxFalse);
    EXPECT_EQ(m.getCurOffset(), 9);
    EXPECT_EQ(taken(), Numbers{"153"});

    EXPECT_EQ(m.seek(3, OxMemory::DIR_BEGIN), OxTrue);
    EXPECT_EQ(m.seek(static_cast<size_t>(-5), OxMemory::DIR_CURRENT), OxFalse);
    EXPECT_EQ(m.getCurOffset(), 0);
    EXPECT_EQ(taken(), Numbers{"152"});

    EXPECT_EQ(m.seek(4, OxMemory::DIR_CURRENT), OxTrue);
    EXPECT_EQ(m.seek(static_cast<size_t>(-4), OxMemory::DIR_CURRENT), OxTrue);
    EXPECT_EQ(m.getCurOffset(), 0);
    EXPECT_EQ(m.seek(7, static_cast<OxMemory::DIR>(5)), OxTrue); // no such direction: no move
    EXPECT_EQ(m.getCurOffset(), 0);

    OxMemory empty(nullptr, 0);
    EXPECT_EQ(empty.seek(1, OxMemory::DIR_CURRENT), OxFalse);
    EXPECT_EQ(empty.getCurOffset(), 0);
    EXPECT_EQ(empty.read(c), 0);
    EXPECT_EQ(taken(), (Numbers{"153", "147"}));
}
