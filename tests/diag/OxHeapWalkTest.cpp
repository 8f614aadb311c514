// OxHeapInfo on the platform's own heap walk: glibc's main arena, which the
// Linux walker reads, and the runtime's _heapwalk on Windows. One test
// follows glibc's layout exactly; the others hold for any heap whose walk
// delivers blocks. Where the walker is off (sanitizer builds, valgrind) the
// tests skip or check that the walk ends at once.
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

/// The blocks of the diff tests: 1,000 of 3,000 bytes each, cut from a run
/// of freed 16,000-byte blocks.
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

/// Freed memory below a fence, from which blocks of one size are then cut:
/// a run of `runSize` blocks is allocated until the latest ones climb in
/// equal steps over `needed` bytes (the first ones may fill older free
/// memory, the later ones come from the top of the heap), all but the
/// highest (the fence) are freed, and blocks of `blockSize` are drained until
/// one comes from the freed run: by then no other free memory serves that
/// size. Every vector is reserved before the first allocation, so that the
/// test allocates nothing else between its pictures.
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

/// Takes `before`, makes `count` blocks of `size` into `blocks` (reserved by
/// the caller, so that nothing else is allocated), takes `after` and returns
/// after.diff(before), owned by the caller.
OxHeapInfo* blocksBetweenPictures(OxHeapInfo& before, OxHeapInfo& after, std::vector<void*>& blocks,
                                  unsigned int count, size_t size) {
    before.snap();
    for (unsigned int i = 0; i < count; i++) {
        blocks.push_back(std::malloc(size));
    }
    after.snap();
    return after.diff(before);
}

/// Independent reckoning of what a diff against `older` must list of
/// `blocks`: each block whose address the older picture lacks and that lies
/// below the highest address it has.
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
}

// The same question on any heap whose walk delivers blocks, the Windows heap
// of _heapwalk in particular, without knowing the allocator's layout: 1,000
// blocks made between two pictures inside the first picture's address range
// are what diff lists.
//
// The range is prepared as above, with what any allocator that reuses freed
// memory does: a run of large blocks is allocated until the latest ones lie
// one behind the other in equal steps, all but the highest (the fence) are
// freed, and blocks of the test's size are drained until one comes from the
// freed run. The later blocks then come from there too, below the fence.
// What diff must list is reckoned independently from the first picture's
// addresses: every new block that the first picture lacks and that lies
// below its highest address. The first new block may start where the first
// picture saw the free memory it was cut from; all the others must count.
TEST(OxHeapWalk, NewBlocksInsideTheOlderRangeAreFoundByDiff) {
    ASSERT_EQ(OxHeapInfo::setWalkFunction(nullptr), nullptr);
    if (OxHeapInfo::isPlatformWalkAvailable() == OxFalse) {
        GTEST_SKIP() << kUnavailable;
    }
    // Room for the blocks with any allocator's headers, and for the entry
    // array of the first picture.
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
