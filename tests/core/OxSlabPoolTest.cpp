#include "oxbase/core/detail/OxSlabPool.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <set>
#include <vector>

using namespace oxbase::detail;

// Enough blocks of 40 bytes to fill several slabs of every size (4 KiB to
// 64 KiB): each block must be aligned, apart from all others, and keep what
// is written into it while the others are written.
TEST(OxSlabPoolTest, BlocksAreDistinctAlignedAndKeepTheirContent) {
    OxSlabPool pool(37);
    EXPECT_EQ(pool.getBlockSize(), 40U);
    std::vector<unsigned char*> blocks;
    for (int i = 0; i < 5000; i++) {
        auto* block = static_cast<unsigned char*>(pool.allocate());
        ASSERT_NE(block, nullptr);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % alignof(void*), 0U);
        std::memset(block, i & 0xff, 40);
        blocks.push_back(block);
    }
    EXPECT_EQ(pool.getLiveCount(), 5000U);
    std::set<unsigned char*> distinct(blocks.begin(), blocks.end());
    EXPECT_EQ(distinct.size(), blocks.size());
    for (std::size_t i = 0; i < blocks.size(); i++) {
        for (int k = 0; k < 40; k++) {
            ASSERT_EQ(blocks[i][k], i & 0xff) << "block " << i << " byte " << k;
        }
    }

    // A freed block is the next one handed out.
    pool.release(blocks[17]);
    EXPECT_EQ(pool.allocate(), blocks[17]);

    // With the last block freed the pool starts afresh and still serves.
    for (unsigned char* block : blocks) {
        pool.release(block);
    }
    pool.release(nullptr);
    EXPECT_EQ(pool.getLiveCount(), 0U);
    void* again = pool.allocate();
    ASSERT_NE(again, nullptr);
    std::memset(again, 0, 40);
    pool.release(again);
}

// Objects of the pool's size come from it, others (a derived class) from the
// heap, in both directions; AddressSanitizer reports a block sent the wrong
// way. Blocks smaller than a pointer still hold the free list.
TEST(OxSlabPoolTest, ObjectsOfOtherSizesUseTheHeap) {
    OxSlabPool pool(48);
    void* own = pool.allocateObject(48);
    void* other = pool.allocateObject(100);
    void* spare = pool.allocateObject(64, std::nothrow);
    EXPECT_EQ(pool.getLiveCount(), 1U);
    pool.releaseObject(other, 100);
    pool.releaseObject(spare); // told by its address: not a pool block
    pool.releaseObject(own);   // told by its address: a pool block
    EXPECT_EQ(pool.getLiveCount(), 0U);

    OxSlabPool tiny(1);
    EXPECT_EQ(tiny.getBlockSize(), sizeof(void*));
    void* a = tiny.allocate();
    void* b = tiny.allocate();
    EXPECT_NE(a, b);
    tiny.release(a);
    tiny.release(b);
    EXPECT_EQ(tiny.getLiveCount(), 0U);
}
