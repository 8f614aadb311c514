// OxHeapInfo on the platform's own heap walk. The exact expectations follow
// glibc's main arena, which the Linux walker reads; elsewhere, and where the
// walker is off (sanitizer builds, valgrind), the tests skip or check that
// the walk ends at once.
#include "oxbase/core/OxSystem.h"
#include "oxbase/diag/OxHeapInfo.h"
#include "oxbase/platform/detail/OxPlatformHeap.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <memory>
#include <set>
#include <vector>

using namespace oxbase::detail;

namespace {

const char* const kUnavailable = "the platform's heap walk delivers no blocks in this process "
                                 "(sanitizer build, valgrind, another allocator or platform)";

std::uintptr_t addressOf(const OxHeapInfo& picture, unsigned int i) {
    return reinterpret_cast<std::uintptr_t>(picture.getEntry(i)->address);
}

bool glibcWalker() {
    return OxSystem::getOS() == OxSystem::OxOSLinux && sizeof(void*) == 8;
}

} // namespace

TEST(OxHeapWalk, PictureOfTheRealHeap) {
    ASSERT_EQ(OxHeapInfo::setWalkFunction(nullptr), nullptr);
    OxHeapInfo picture;
    if (OxHeapInfo::isPlatformWalkAvailable() == OxFalse) {
        // The walk must end at once, having read nothing.
        picture.snap();
        EXPECT_EQ(picture.getCount(), 0u);
        EXPECT_EQ(picture.getUsedBytes(), 0u);
        OxHeapWalkEntry entry;
        EXPECT_NE(OxPlatformNativeHeapWalk(&entry), OxHeapWalkOk);
        GTEST_SKIP() << kUnavailable;
    }
    std::unique_ptr<char[]> mine(new char[40]);
    picture.snap();
    ASSERT_GT(picture.getCount(), 1u);
    EXPECT_GT(picture.getUsedCount(), 0u);
    bool found = false;
    size_t usedSum = 0;
    for (unsigned int i = 0; i < picture.getCount(); i++) {
        const OxHeapInfo::HeapEntry* entry = picture.getEntry(i);
        if (entry->address == mine.get()) {
            found = true;
            EXPECT_EQ(entry->state, 2u);
            EXPECT_GE(entry->size, 40u);
        }
        usedSum += entry->state == 2 ? entry->size : 0;
    }
    EXPECT_TRUE(found);
    if (glibcWalker()) {
        // glibc's chunks tile the arena: each block begins one size field
        // (8 bytes) behind the end of the block before it. The second walk
        // may meet fewer blocks than the first counted (allocating the entry
        // array can merge freed small chunks): the entries it did not fill
        // stay cleared, at the end.
        unsigned int filled = 1;
        while (filled < picture.getCount() && picture.getEntry(filled)->state != 0) {
            ASSERT_EQ(addressOf(picture, filled - 1) + picture.getEntry(filled - 1)->size + 8,
                      addressOf(picture, filled))
                << "block " << filled;
            filled++;
        }
        for (unsigned int i = filled; i < picture.getCount(); i++) {
            EXPECT_EQ(picture.getEntry(i)->address, nullptr);
        }
        // Or it met more (the entry array carved off a free chunk): then the
        // block not stored is the last one, the top chunk, which is free, and
        // the used bytes are those of the stored blocks either way.
        EXPECT_EQ(picture.getUsedBytes(), usedSum);
    }
}

// Pictures before and after making 1,000 blocks of one size, then after
// freeing them again.
//
// A diff lists only blocks below the highest address of the older picture,
// and fresh blocks usually come from the top of the heap, above everything
// the older picture holds. So the blocks are made inside the older
// picture's range: a run of large blocks, lying one behind the other, is
// allocated and freed again except its highest block, which stays as a
// fence; the freed run coalesces into one free chunk below the fence, and
// the 1,000 blocks are carved from it one behind the other.
//
// What makes the outcome exact:
// - All sizes are "large" for glibc (1,008 bytes and more): such blocks
//   never sit in the per-thread cache or a fastbin, they coalesce as soon
//   as they are freed, and each request is served by the smallest free
//   chunk that fits (small requests may instead split whatever chunk was
//   split last).
// - Before the first picture, blocks of the test's size are drained until
//   one comes from the run's chunk. By then no smaller chunk that could
//   serve this size is left, and the test frees nothing that could make
//   one, so every later block comes from the run's chunk.
// - snap allocates its entry array between its two walks, from the start
//   of that chunk (or elsewhere, if it is small enough). The second walk
//   records the rest of the chunk as a free block. The first of the 1,000
//   blocks lands exactly at that recorded address, so the diff (which
//   compares addresses) cannot list it; the other 999 lie behind it, below
//   the fence.
// - 3,000 bytes plus glibc's 8-byte size field is a multiple of 16, so each
//   block's usable size is exactly 3,000.
// - Between the first allocation and the last picture, the test makes no
//   other allocation (its vectors are reserved beforehand) and no
//   assertion.
TEST(OxHeapWalk, NewBlocksOfOneSizeAreFoundByDiff) {
    ASSERT_EQ(OxHeapInfo::setWalkFunction(nullptr), nullptr);
    if (OxHeapInfo::isPlatformWalkAvailable() == OxFalse) {
        GTEST_SKIP() << kUnavailable;
    }
    if (!glibcWalker()) {
        GTEST_SKIP() << "the exact layout expected here is that of glibc on a 64-bit system";
    }
    constexpr size_t kSize = 3000;
    constexpr unsigned int kBlocks = 1000;
    constexpr size_t kRunSize = 16000;
    constexpr std::uintptr_t kRunStep = kRunSize + 16; // glibc's chunk of a 16,000-byte block
    // The free chunk holds the 1,000 blocks and the first picture's entry array.
    constexpr std::uintptr_t kNeeded = kBlocks * (kSize + 8) + 512 * 1024;
    constexpr unsigned int kMaxRun = 2000;
    constexpr unsigned int kMaxDrain = 10000;

    std::vector<void*> run;
    std::vector<void*> drain;
    std::vector<void*> blocks;
    run.reserve(kMaxRun);
    drain.reserve(kMaxDrain);
    blocks.reserve(kBlocks);

    // Run blocks are allocated until the latest ones climb in equal steps
    // over enough memory: the first of them may fill older free chunks, the
    // later ones come from the top of the heap. The last one is the fence.
    std::uintptr_t low = 0;
    std::uintptr_t fence = 0;
    while (fence - low < kNeeded && run.size() < kMaxRun) {
        void* block = std::malloc(kRunSize);
        run.push_back(block);
        auto address = reinterpret_cast<std::uintptr_t>(block);
        if (address != fence + kRunStep) {
            low = address;
        }
        fence = address;
    }
    for (size_t i = 0; i + 1 < run.size(); i++) {
        std::free(run[i]);
    }
    bool landed = false;
    while (!landed && drain.size() < kMaxDrain) {
        void* block = std::malloc(kSize);
        drain.push_back(block);
        auto address = reinterpret_cast<std::uintptr_t>(block);
        landed = address >= low && address < fence;
    }

    OxHeapInfo before;
    before.snap();
    for (unsigned int i = 0; i < kBlocks; i++) {
        blocks.push_back(std::malloc(kSize));
    }
    OxHeapInfo after;
    after.snap();
    OxHeapInfo* made = after.diff(before);
    for (void* block : blocks) {
        std::free(block);
    }
    OxHeapInfo freed;
    freed.snap();

    // Premises of the layout.
    ASSERT_GE(fence - low, kNeeded) << "no run of blocks one behind the other";
    ASSERT_TRUE(landed);
    ASSERT_NE(made, nullptr);

    // Independent reckoning of what the diff must list: a new block whose
    // address the first picture lacks and that lies below its highest one.
    std::set<std::uintptr_t> older;
    for (unsigned int i = 0; i < before.getCount(); i++) {
        older.insert(addressOf(before, i));
    }
    std::set<std::uintptr_t> expected;
    for (void* block : blocks) {
        auto address = reinterpret_cast<std::uintptr_t>(block);
        EXPECT_TRUE(address > low && address < fence);
        if (older.count(address) == 0 && address < *older.rbegin()) {
            expected.insert(address);
        }
    }
    // The first block sits where the first picture saw the free chunk.
    auto first = reinterpret_cast<std::uintptr_t>(blocks[0]);
    bool firstWasFree = false;
    for (unsigned int i = 0; i < before.getCount(); i++) {
        if (addressOf(before, i) == first) {
            firstWasFree = before.getEntry(i)->state == 1;
        }
    }
    EXPECT_TRUE(firstWasFree);
    EXPECT_EQ(expected.size(), kBlocks - 1);
    EXPECT_EQ(expected.count(first), 0u);

    std::set<std::uintptr_t> listed;
    for (unsigned int i = 0; i < made->getCount(); i++) {
        std::uintptr_t address = addressOf(*made, i);
        if (expected.count(address) != 0) {
            listed.insert(address);
            EXPECT_EQ(made->getEntry(i)->size, kSize);
            EXPECT_EQ(made->getEntry(i)->state, 2u);
        }
    }
    EXPECT_EQ(listed, expected);
    delete made;

    // After freeing, no block of the 1,000 is a used block of the third
    // picture. Its own entry array, allocated between its walks, may well
    // take the memory they left (and start at the first one's address):
    // each of their addresses lies inside a free block or inside that array.
    auto array = reinterpret_cast<std::uintptr_t>(freed.getEntry(0));
    for (void* block : blocks) {
        auto address = reinterpret_cast<std::uintptr_t>(block);
        bool covered = false;
        for (unsigned int i = 0; i < freed.getCount() && !covered; i++) {
            const OxHeapInfo::HeapEntry* entry = freed.getEntry(i);
            std::uintptr_t start = addressOf(freed, i);
            bool inside = address >= start && address < start + entry->size;
            if (start == address && entry->state == 2) {
                EXPECT_EQ(start, array) << "a freed block is still used";
            }
            covered = inside && (entry->state == 1 || start == array);
        }
        EXPECT_TRUE(covered) << "block at " << block;
    }

    std::free(run.back());
    for (void* block : drain) {
        std::free(block);
    }
}
