// OxHeapInfo on the platform's own heap walk (glibc's main arena on Linux,
// _heapwalk on Windows). One test follows glibc's layout exactly; the others
// hold for any heap whose walk delivers blocks. Where the walker is off
// (sanitizer builds, valgrind) the tests skip or check that the walk ends.
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

/// The diff tests' 1,000 blocks of 3,000 bytes, cut from freed 16,000-byte blocks.
constexpr size_t kSize = 3000;
constexpr unsigned int kBlocks = 1000;
constexpr size_t kRunSize = 16000;

const char* const kUnavailable = "the platform's heap walk delivers no blocks in this process "
                                 "(sanitizer build, valgrind, another allocator or platform)";

std::uintptr_t addressOf(const OxHeapInfo& picture, unsigned int i) {
    return reinterpret_cast<std::uintptr_t>(picture.getEntry(i)->address);
}

bool glibcWalker() {
    return OxSystem::getOS() == OxSystem::OxOSLinux && sizeof(void*) == 8;
}

/// Freed memory below a fence: `runSize` blocks are allocated until the latest
/// climb in equal steps over `needed` bytes, all but the highest (the fence)
/// are freed, and `blockSize` blocks are drained until one comes from the
/// freed run, when no other free memory serves that size. The vectors are
/// reserved first, so nothing else is allocated between the pictures.
struct FreedRun {
    std::uintptr_t low = 0;
    std::uintptr_t fence = 0;
    bool landed = false;
    std::vector<void*> run;
    std::vector<void*> drain;

    FreedRun(size_t runSize, size_t blockSize, std::uintptr_t needed) {
        constexpr unsigned int kMaxRun = 4000;
        constexpr unsigned int kMaxDrain = 20000;
        run.reserve(kMaxRun);
        drain.reserve(kMaxDrain);
        std::uintptr_t step = 0;
        while (fence - low < needed && run.size() < kMaxRun) {
            void* block = std::malloc(runSize);
            run.push_back(block);
            auto address = reinterpret_cast<std::uintptr_t>(block);
            if (address <= fence || address - fence != step) {
                step = address > fence ? address - fence : 0;
                low = address;
            }
            fence = address;
        }
        for (size_t i = 0; i + 1 < run.size(); i++) {
            std::free(run[i]);
        }
        while (!landed && drain.size() < kMaxDrain) {
            void* block = std::malloc(blockSize);
            drain.push_back(block);
            auto address = reinterpret_cast<std::uintptr_t>(block);
            landed = address >= low && address < fence;
        }
    }
    ~FreedRun() {
        std::free(run.back());
        for (void* block : drain) {
            std::free(block);
        }
    }
    FreedRun(const FreedRun&) = delete;
    FreedRun& operator=(const FreedRun&) = delete;
};

/// Snaps `before`, makes `count` blocks of `size` into `blocks` (reserved by
/// the caller), snaps `after`; returns after.diff(before), caller-owned.
OxHeapInfo* blocksBetweenPictures(OxHeapInfo& before, OxHeapInfo& after, std::vector<void*>& blocks,
                                  unsigned int count, size_t size) {
    before.snap();
    for (unsigned int i = 0; i < count; i++) {
        blocks.push_back(std::malloc(size));
    }
    after.snap();
    return after.diff(before);
}

/// Independent reckoning of what a diff against `older` lists of `blocks`:
/// those whose address `older` lacks and that lie below its highest address.
std::set<std::uintptr_t> newBelowTheOlderTop(const OxHeapInfo& older,
                                             const std::vector<void*>& blocks) {
    std::set<std::uintptr_t> known;
    for (unsigned int i = 0; i < older.getCount(); i++) {
        known.insert(addressOf(older, i));
    }
    std::set<std::uintptr_t> expected;
    for (void* block : blocks) {
        auto address = reinterpret_cast<std::uintptr_t>(block);
        if (!known.empty() && known.count(address) == 0 && address < *known.rbegin()) {
            expected.insert(address);
        }
    }
    return expected;
}

/// The addresses of `expected` that `made` lists, each checked to be a used
/// block of `size` bytes (at least that many unless `exact`).
std::set<std::uintptr_t> listedOf(const OxHeapInfo& made, const std::set<std::uintptr_t>& expected,
                                  size_t size, bool exact) {
    std::set<std::uintptr_t> listed;
    for (unsigned int i = 0; i < made.getCount(); i++) {
        std::uintptr_t address = addressOf(made, i);
        if (expected.count(address) != 0) {
            listed.insert(address);
            if (exact) {
                EXPECT_EQ(made.getEntry(i)->size, size);
            } else {
                EXPECT_GE(made.getEntry(i)->size, size);
            }
            EXPECT_EQ(made.getEntry(i)->state, 2u);
        }
    }
    return listed;
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
        // glibc's chunks tile the arena: each begins 8 bytes (a size field)
        // behind the end of the one before. The second walk may meet fewer
        // blocks than the first counted: unfilled entries stay cleared.
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
        // Or more (the array carved a free chunk): the one not stored is the
        // free top chunk, so the used bytes are the stored blocks' either way.
        EXPECT_EQ(picture.getUsedBytes(), usedSum);
    }
}

// Pictures before and after making 1,000 blocks of one size, then after
// freeing them. A diff lists only blocks below the older picture's highest
// address, and fresh blocks usually come from the top of the heap; so the
// blocks are carved from a freed run of large blocks below a kept fence.
// What makes the outcome exact on glibc:
// - All sizes are "large" (1,008 bytes and more): never cached or in a
//   fastbin, coalesced when freed, served by the smallest chunk that fits.
// - Draining until a block comes from the run leaves no smaller chunk for
//   this size, and the test frees nothing that could make one.
// - snap allocates its entry array between its walks, from the start of the
//   run's chunk; the second walk records the rest as a free block, where the
//   first of the 1,000 blocks lands, so the diff cannot list it; the other
//   999 lie behind it, below the fence.
// - 3,000 + glibc's 8-byte size field is a multiple of 16: usable size 3,000.
// - No other allocation and no assertion between the first allocation and
//   the last picture.
TEST(OxHeapWalk, NewBlocksOfOneSizeAreFoundByDiff) {
    ASSERT_EQ(OxHeapInfo::setWalkFunction(nullptr), nullptr);
    if (OxHeapInfo::isPlatformWalkAvailable() == OxFalse) {
        GTEST_SKIP() << kUnavailable;
    }
    if (!glibcWalker()) {
        GTEST_SKIP() << "the exact layout expected here is that of glibc on a 64-bit system";
    }
    // The free chunk holds the 1,000 blocks and the first picture's entry array.
    constexpr std::uintptr_t kNeeded = kBlocks * (kSize + 8) + 512 * 1024;
    std::vector<void*> blocks;
    blocks.reserve(kBlocks);
    FreedRun prepared(kRunSize, kSize, kNeeded);
    const std::uintptr_t low = prepared.low;
    const std::uintptr_t fence = prepared.fence;

    OxHeapInfo before;
    OxHeapInfo after;
    OxHeapInfo* made = blocksBetweenPictures(before, after, blocks, kBlocks, kSize);
    for (void* block : blocks) {
        std::free(block);
    }
    OxHeapInfo freed;
    freed.snap();

    // Premises of the layout.
    ASSERT_GE(fence - low, kNeeded) << "no run of blocks one behind the other";
    ASSERT_TRUE(prepared.landed);
    ASSERT_NE(made, nullptr);

    for (void* block : blocks) {
        auto address = reinterpret_cast<std::uintptr_t>(block);
        EXPECT_TRUE(address > low && address < fence);
    }
    std::set<std::uintptr_t> expected = newBelowTheOlderTop(before, blocks);
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
    EXPECT_EQ(listedOf(*made, expected, kSize, true), expected);
    delete made;

    // After freeing, none of the 1,000 is a used block of the third picture:
    // each lies in a free block or in that picture's own entry array.
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
}

// The same on any heap whose walk delivers blocks (Windows' _heapwalk among
// them), without knowing the layout: the range is prepared as above, which
// any allocator that reuses freed memory honours, and what diff must list is
// reckoned from the first picture. Only the first new block may be missed
// (it may start where the first picture saw free memory).
TEST(OxHeapWalk, NewBlocksInsideTheOlderRangeAreFoundByDiff) {
    ASSERT_EQ(OxHeapInfo::setWalkFunction(nullptr), nullptr);
    if (OxHeapInfo::isPlatformWalkAvailable() == OxFalse) {
        GTEST_SKIP() << kUnavailable;
    }
    // Room for the blocks with any allocator's headers and the first entry array.
    constexpr std::uintptr_t kRoom = kBlocks * (kSize + 64) + 1024 * 1024;
    std::vector<void*> blocks;
    blocks.reserve(kBlocks);
    FreedRun prepared(kRunSize, kSize, kRoom);
    OxHeapInfo before;
    OxHeapInfo after;
    std::unique_ptr<OxHeapInfo> made(blocksBetweenPictures(before, after, blocks, kBlocks, kSize));

    ASSERT_GE(prepared.fence - prepared.low, kRoom) << "no run of blocks one behind the other";
    ASSERT_TRUE(prepared.landed) << "no block of the test's size came from the freed run";
    ASSERT_NE(made, nullptr);
    unsigned int inside = 0;
    for (void* block : blocks) {
        auto address = reinterpret_cast<std::uintptr_t>(block);
        inside += address >= prepared.low && address < prepared.fence ? 1 : 0;
    }
    EXPECT_EQ(inside, kBlocks);
    std::set<std::uintptr_t> expected = newBelowTheOlderTop(before, blocks);
    EXPECT_GE(expected.size(), kBlocks - 1);
    EXPECT_EQ(listedOf(*made, expected, kSize, false), expected);

    for (void* block : blocks) {
        std::free(block);
    }
}
