// Tests of the inode sets: what add and exists answer, probing, growth,
// trace lines and dumps.
#include "oxbase/io/OxInodeTable.h"
#include "oxbase/diag/OxPrt.h"
#include "support/OxTestSupport.h"

#include <cstring>
#include <gtest/gtest.h>

namespace {

OxStat statusOf(std::uint64_t device, std::uint64_t inode) {
    OxStat status;
    std::memset(&status, 0, sizeof status);
    status.st_dev = static_cast<decltype(status.st_dev)>(device);
    status.st_ino = static_cast<decltype(status.st_ino)>(inode);
    return status;
}

using oxtest::dumpText;

} // namespace

TEST(OxInodeTableTest, AddAndExistsAnswers) {
    OxInodeTable table;
    OxStat zero = statusOf(5, 0);
    EXPECT_EQ(table.add(&zero), OxTrue);
    EXPECT_EQ(table.exists(&zero), OxFalse);

    OxStat file = statusOf(5, 77);
    EXPECT_EQ(table.exists(&file), OxFalse);
    EXPECT_EQ(table.add(&file), OxTrue);
    EXPECT_EQ(table.add(&file), OxFalse);
    EXPECT_EQ(table.exists(&file), OxTrue);

    // The same inode on another device is another file.
    OxStat other = statusOf(6, 77);
    EXPECT_EQ(table.exists(&other), OxFalse);
    EXPECT_EQ(table.add(&other), OxTrue);
    EXPECT_EQ(table.getNbDevices(), 2u);

    EXPECT_EQ(table.add(nullptr), OxFalse);
    EXPECT_EQ(table.exists(nullptr), OxFalse);

    OxInodeDevice device(5);
    EXPECT_EQ(device.add(nullptr), OxTrue);
    EXPECT_EQ(device.add(&other), OxFalse);
    EXPECT_EQ(device.exists(&other), OxFalse);
    EXPECT_EQ(device.getCount(), 0u);

    // Numbers beyond 32 bits stay apart from their low halves, where the
    // status record holds such numbers (Windows keeps a 16-bit inode and a
    // 32-bit device number).
    if (sizeof(zero.st_ino) < 8 || sizeof(zero.st_dev) < 8) {
        return;
    }
    OxStat wide = statusOf(0x100000005ull, (1ull << 40) + 77);
    EXPECT_EQ(table.add(&wide), OxTrue);
    EXPECT_EQ(table.exists(&wide), OxTrue);
    OxStat low = statusOf(5, 77 + 0);
    EXPECT_EQ(table.add(&low), OxFalse);
    EXPECT_EQ(table.getNbDevices(), 3u);
}

TEST(OxInodeTableTest, ProbingAndGrowth) {
    OxInodeDevice device(1);
    EXPECT_EQ(device.getSize(), 13u);
    // 13 and 26 share home slot 0.
    OxStat a = statusOf(1, 13);
    OxStat b = statusOf(1, 26);
    EXPECT_EQ(device.add(&a), OxTrue);
    EXPECT_EQ(device.add(&b), OxTrue);
    EXPECT_EQ(device.exists(&a), OxTrue);
    EXPECT_EQ(device.exists(&b), OxTrue);

    // The sixth element grows 13 slots to nextPrime(26) = 29, then 59.
    for (std::uint64_t inode = 100; inode < 104; inode++) {
        OxStat s = statusOf(1, inode);
        EXPECT_EQ(device.add(&s), OxTrue);
    }
    EXPECT_EQ(device.getSize(), 29u);
    EXPECT_EQ(device.getCount(), 6u);
    for (std::uint64_t inode = 104; inode < 113; inode++) {
        OxStat s = statusOf(1, inode);
        device.add(&s);
    }
    EXPECT_EQ(device.getSize(), 59u);
    EXPECT_EQ(device.exists(&a), OxTrue);
    EXPECT_EQ(device.exists(&b), OxTrue);
    for (std::uint64_t inode = 100; inode < 113; inode++) {
        EXPECT_EQ(device.contains(inode), OxTrue) << inode;
    }
    EXPECT_EQ(device.contains(99), OxFalse);
}

TEST(OxInodeTableTest, TraceLinesAtThreshold99) {
    unsigned int saved = OxPrt::getTraceThreshold();
    OxInodeDevice device(1);
    OxStat a = statusOf(1, 13);
    OxStat b = statusOf(1, 26);
    OxPrt::setTraceThreshold(98);
    testing::internal::CaptureStderr();
    device.add(&a);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");

    OxPrt::setTraceThreshold(99);
    testing::internal::CaptureStderr();
    device.add(&b); // home 0 is taken: one collision, slot 1
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "  currentPos = 1\n"
                                                      "  array[currentPos].ref = 1\n"
                                                      "  array[currentPos].element = 26\n");
    OxPrt::setTraceThreshold(saved);
}

TEST(OxInodeTableTest, Dumps) {
    OxInodeTable table;
    EXPECT_EQ(dumpText(table), "---- OxInodeTable\nInode tables:\n---- End of OxInodeTable\n");
    OxStat a = statusOf(42, 3);
    OxStat b = statusOf(7, 3);
    table.add(&a);
    table.add(&b);
    EXPECT_EQ(dumpText(table), "---- OxInodeTable\nInode tables:\n"
                               "---- OxInodeDevice\ndevice idenitifier: 42\nInode table: \n"
                               "---- End of OxInodeDevice\n"
                               "---- OxInodeDevice\ndevice idenitifier: 7\nInode table: \n"
                               "---- End of OxInodeDevice\n"
                               "---- End of OxInodeTable\n");
}
