// OxHeapInfo on fake heaps: an installed walk function delivers fixed lists
// of blocks, so that snap, sort, diff and memusage can be checked exactly.
#include "oxbase/diag/OxHeapInfo.h"
#include "oxbase/diag/OxPrt.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <random>
#include <set>
#include <sstream>
#include <string>
#include <vector>

namespace {

struct FakeBlock {
    std::uintptr_t address;
    size_t size;
    int used;
};

// What the walks deliver: walk k (counted from 0 since installation) sees
// walks[k], the last list serving every later walk.
std::vector<std::vector<FakeBlock>> fakeWalks;
unsigned int walksStarted = 0;

// Fake addresses are integers; the pointer they stand for is never followed.
void* fakePointer(std::uintptr_t address) {
    return reinterpret_cast<void*>(address); // NOLINT(performance-no-int-to-ptr)
}

// The cursor holds the walk's list in cursor[1] and the next block + 1 in cursor[0].
OxHeapWalkStatus fakeWalk(OxHeapWalkEntry* entry) {
    if (entry->cursor[0] == 0) {
        entry->cursor[1] = std::min<size_t>(walksStarted++, fakeWalks.size() - 1);
        entry->cursor[0] = 1;
    }
    const std::vector<FakeBlock>& blocks = fakeWalks[entry->cursor[1]];
    size_t next = entry->cursor[0] - 1;
    if (next >= blocks.size()) {
        return OxHeapWalkEnd;
    }
    entry->address = fakePointer(blocks[next].address);
    entry->size = blocks[next].size;
    entry->used = blocks[next].used;
    entry->cursor[0]++;
    return OxHeapWalkOk;
}

// Installs the fake walk for the life of the object and puts back what was there.
class FakeHeap {
public:
    explicit FakeHeap(std::vector<std::vector<FakeBlock>> walks) {
        fakeWalks = std::move(walks);
        walksStarted = 0;
        previous = OxHeapInfo::setWalkFunction(fakeWalk);
    }
    ~FakeHeap() {
        OxHeapInfo::setWalkFunction(previous);
        fakeWalks.clear();
    }
    FakeHeap(const FakeHeap&) = delete;
    FakeHeap& operator=(const FakeHeap&) = delete;

private:
    OxHeapInfo::WalkFunction previous;
};

void snapOf(const std::vector<FakeBlock>& blocks, OxHeapInfo& picture) {
    FakeHeap heap({blocks});
    picture.snap();
}

std::uintptr_t addressAt(const OxHeapInfo& picture, unsigned int i) {
    return reinterpret_cast<std::uintptr_t>(picture.getEntry(i)->address);
}

std::vector<std::uintptr_t> addressesOf(const OxHeapInfo& picture) {
    std::vector<std::uintptr_t> result;
    for (unsigned int i = 0; i < picture.getCount(); i++) {
        result.push_back(addressAt(picture, i));
    }
    return result;
}

// A size that belongs to the address, so that an entry split in a sort shows.
size_t sizeFor(std::uintptr_t address) {
    return static_cast<size_t>(address % 997) + 1;
}

std::vector<FakeBlock> blocksAt(const std::vector<std::uintptr_t>& addresses) {
    std::vector<FakeBlock> blocks;
    blocks.reserve(addresses.size());
    for (std::uintptr_t a : addresses) {
        blocks.push_back({a, sizeFor(a), static_cast<int>(a % 2)});
    }
    return blocks;
}

void collect(const char* text, void* userData) {
    static_cast<std::vector<std::string>*>(userData)->push_back(text);
}

std::string pointerText(const void* address) {
    std::ostringstream text;
    text << address;
    return text.str();
}

std::string hexText(size_t value) {
    char buffer[32];
    std::snprintf(buffer, sizeof buffer, "%zx", value);
    return buffer;
}

} // namespace

TEST(OxHeapInfoTest, SnapCountsInTheFirstWalkAndFillsInTheSecond) {
    OxHeapInfo picture;
    EXPECT_EQ(picture.getCount(), 0u);
    EXPECT_EQ(picture.getEntry(0), nullptr);

    std::vector<FakeBlock> heap = {
        {0x1000, 16, 1}, {0x1100, 32, 0}, {0x1200, 48, 1}, {0x1300, 64, 1}, {0x1400, 80, 0}};
    snapOf(heap, picture);
    ASSERT_EQ(picture.getCount(), 5u);
    EXPECT_EQ(picture.getUsedCount(), 3u);
    EXPECT_EQ(picture.getUsedBytes(), 16u + 48u + 64u);
    for (unsigned int i = 0; i < 5; i++) {
        EXPECT_EQ(addressAt(picture, i), heap[i].address);
        EXPECT_EQ(picture.getEntry(i)->size, heap[i].size);
        EXPECT_EQ(picture.getEntry(i)->state, heap[i].used != 0 ? 2u : 1u);
    }
    EXPECT_EQ(picture.getEntry(5), nullptr);

    // The heap grew between the walks: the used count is the first walk's,
    // the used bytes the second's, and no entry is stored beyond the count.
    {
        FakeHeap changing({{{0x10, 8, 1}, {0x20, 8, 0}},
                           {{0x10, 8, 1}, {0x20, 8, 0}, {0x30, 100, 1}, {0x40, 200, 1}}});
        picture.snap();
    }
    EXPECT_EQ(picture.getCount(), 2u);
    EXPECT_EQ(picture.getUsedCount(), 1u);
    EXPECT_EQ(picture.getUsedBytes(), 308u);
    EXPECT_EQ(picture.getEntry(2), nullptr);

    // It shrank: the entries not filled stay cleared (state 0, unset).
    {
        FakeHeap shrinking({{{0x10, 8, 1}, {0x20, 8, 1}, {0x30, 8, 1}}, {{0x10, 8, 1}}});
        picture.snap();
    }
    ASSERT_EQ(picture.getCount(), 3u);
    EXPECT_EQ(picture.getUsedCount(), 3u);
    EXPECT_EQ(picture.getUsedBytes(), 8u);
    EXPECT_EQ(picture.getEntry(1)->state, 0u);
    EXPECT_EQ(picture.getEntry(2)->address, nullptr);

    // An empty heap leaves no picture, and so does release.
    snapOf({}, picture);
    EXPECT_EQ(picture.getCount(), 0u);
    EXPECT_EQ(picture.getEntry(0), nullptr);
    snapOf(heap, picture);
    picture.release();
    EXPECT_EQ(picture.getCount(), 0u);
    EXPECT_EQ(picture.getUsedCount(), 0u);
    EXPECT_EQ(picture.getUsedBytes(), 0u);
    EXPECT_EQ(picture.getEntry(0), nullptr);
}

TEST(OxHeapInfoTest, InstalledSourceIsReplacedAndRestored) {
    OxHeapInfo::WalkFunction before = OxHeapInfo::setWalkFunction(fakeWalk);
    EXPECT_EQ(OxHeapInfo::setWalkFunction(nullptr), &fakeWalk);
    EXPECT_EQ(OxHeapInfo::setWalkFunction(before), nullptr);
}

TEST(OxHeapInfoTest, SortOrdersByAddressLikeStdSort) {
    std::mt19937_64 random(1234);
    std::vector<std::vector<std::uintptr_t>> inputs = {
        {}, {0x40}, {0x20, 0x10}, {0x10, 0x20}, {0x30, 0x10, 0x20}};
    std::vector<std::uintptr_t> many(2000);
    for (std::uintptr_t& a : many) {
        a = random() & ~std::uintptr_t(0xF);
    }
    inputs.push_back(many);
    std::vector<std::uintptr_t> sorted = many;
    std::sort(sorted.begin(), sorted.end());
    inputs.push_back(sorted);
    inputs.emplace_back(sorted.rbegin(), sorted.rend());
    std::vector<std::uintptr_t> repeats(500);
    for (std::uintptr_t& a : repeats) {
        a = 0x1000 + 0x10 * (random() % 7);
    }
    inputs.push_back(repeats);
    inputs.emplace_back(37, 0x5550);
    for (int length = 3; length <= 12; length++) {
        std::vector<std::uintptr_t> small(length);
        for (std::uintptr_t& a : small) {
            a = 0x100 * (random() % 9 + 1);
        }
        inputs.push_back(small);
    }

    for (const std::vector<std::uintptr_t>& input : inputs) {
        OxHeapInfo picture;
        snapOf(blocksAt(input), picture);
        picture.sort();
        std::vector<std::uintptr_t> expected = input;
        std::sort(expected.begin(), expected.end());
        ASSERT_EQ(addressesOf(picture), expected) << "input of " << input.size();
        for (unsigned int i = 0; i < picture.getCount(); i++) {
            ASSERT_EQ(picture.getEntry(i)->size, sizeFor(addressAt(picture, i)));
        }
    }
}

TEST(OxHeapInfoTest, DiffListsBlocksBetweenTheOthersAndNotAboveThem) {
    // Delivered out of order: diff sorts both pictures itself.
    OxHeapInfo newer, older;
    snapOf(blocksAt({0x60, 0x10, 0x25, 0x40, 0x20, 0x55, 0x30, 0x5}), newer);
    snapOf(blocksAt({0x50, 0x20, 0x30}), older);
    std::unique_ptr<OxHeapInfo> result(newer.diff(older));
    ASSERT_NE(result, nullptr);
    // 0x5 and 0x10 lie below older's blocks, 0x25 and 0x40 between them;
    // 0x55 and 0x60 lie above 0x50 and are not reached.
    EXPECT_EQ(addressesOf(*result), (std::vector<std::uintptr_t>{0x5, 0x10, 0x25, 0x40}));
    for (unsigned int i = 0; i < result->getCount(); i++) {
        EXPECT_EQ(result->getEntry(i)->size, sizeFor(addressAt(*result, i)));
        EXPECT_EQ(result->getEntry(i)->state, addressAt(*result, i) % 2 != 0 ? 2u : 1u);
    }
    EXPECT_EQ(result->getUsedCount(), 0u);
    EXPECT_EQ(result->getUsedBytes(), 0u);
    EXPECT_EQ(addressesOf(newer),
              (std::vector<std::uintptr_t>{0x5, 0x10, 0x20, 0x25, 0x30, 0x40, 0x55, 0x60}));
    EXPECT_EQ(addressesOf(older), (std::vector<std::uintptr_t>{0x20, 0x30, 0x50}));

    // With itself, and against or from a picture without entries: nothing.
    OxHeapInfo empty;
    for (auto pair : {std::make_pair(&newer, &newer), std::make_pair(&newer, &empty),
                      std::make_pair(&empty, &newer)}) {
        result.reset(pair.first->diff(*pair.second));
        ASSERT_NE(result, nullptr);
        EXPECT_EQ(result->getCount(), 0u);
        EXPECT_EQ(result->getEntry(0), nullptr);
    }

    // Random pictures against a set computation: a block is listed when the
    // other picture lacks its address and has some address above it.
    std::mt19937 random(99);
    for (int round = 0; round < 20; round++) {
        // Distinct addresses, as a heap has them, each in one picture, both or neither.
        std::vector<std::uintptr_t> mine, theirs;
        for (std::uintptr_t a = 0x10; a <= 0x10 * 400; a += 0x10) {
            unsigned int where = random() % 4;
            if (where == 0 || where == 2) {
                mine.push_back(a);
            }
            if (where == 1 || where == 2) {
                theirs.push_back(a);
            }
        }
        std::shuffle(mine.begin(), mine.end(), random);
        std::shuffle(theirs.begin(), theirs.end(), random);
        std::set<std::uintptr_t> other(theirs.begin(), theirs.end());
        std::vector<std::uintptr_t> expected;
        for (std::uintptr_t a : mine) {
            if (other.count(a) == 0 && !other.empty() && a < *other.rbegin()) {
                expected.push_back(a);
            }
        }
        std::sort(expected.begin(), expected.end());
        OxHeapInfo a, b;
        snapOf(blocksAt(mine), a);
        snapOf(blocksAt(theirs), b);
        result.reset(a.diff(b));
        ASSERT_NE(result, nullptr);
        EXPECT_EQ(addressesOf(*result), expected) << "round " << round;
    }
}

TEST(OxHeapInfoTest, MemusageListsEveryEntryAndShowsUsedBlocks) {
    static const char longBlock[] = "Hello world!!!!!ABCD"; // 20 bytes shown
    static const char shortBlock[] = "abcde";
    std::uintptr_t longAddress = reinterpret_cast<std::uintptr_t>(longBlock);
    std::uintptr_t shortAddress = reinterpret_cast<std::uintptr_t>(shortBlock);
    // The free block's address is never read, whatever the type.
    std::vector<FakeBlock> heap = {{longAddress, 20, 1}, {0x1000, 0x1a0, 0}, {shortAddress, 5, 1}};
    OxHeapInfo picture;
    snapOf(heap, picture);

    std::vector<std::string>
        flushes; // outlives the print object, whose destructor flushes once more
    OxPrt prt;
    prt.setPrtCallback(collect);
    prt.setUserData(&flushes);
    OxPrt::adjustIndent(2);
    const std::string in = "   ";
    auto line = [&in](const char* state, std::uintptr_t address, size_t size) {
        return in + state + in + "block at " + pointerText(fakePointer(address)) + " of size 0x" +
               hexText(size) + "\n";
    };
    const std::string usedLong = line("USED ", longAddress, 20);
    const std::string freeLine = line("FREE ", 0x1000, 0x1a0);
    const std::string usedShort = line("USED ", shortAddress, 5);
    const std::string headRow =
        "000000 48 65 6c 6c 6f 20 77 6f 72 6c 64 21 21 21 21 21 | Hello world!!!!!\n";
    const std::string tailRow =
        "000010 41 42 43 44 " + std::string(36, ' ') + "| ABCD" + std::string(12, ' ') + "\n\n";
    const std::string shortRow =
        "000000 61 62 63 64 65 " + std::string(33, ' ') + "| abcde" + std::string(11, ' ') + "\n\n";

    EXPECT_EQ(picture.memusage(prt, OxHeapInfo::MEMUSAGE_TOTAL), 25u);
    EXPECT_TRUE(flushes.empty());

    struct Case {
        int type;
        std::vector<std::string> texts;
    };
    const Case cases[] = {
        {1, {usedLong + headRow, freeLine, usedShort + shortRow, ""}},
        {2, {usedLong + headRow + tailRow, freeLine, usedShort + shortRow, ""}},
        {7, {usedLong, freeLine, usedShort, ""}},
    };
    for (const Case& c : cases) {
        flushes.clear();
        EXPECT_EQ(picture.memusage(prt, static_cast<OxHeapInfo::MEMUSAGE_TYPE>(c.type)), 25u);
        EXPECT_EQ(flushes, c.texts) << "type " << c.type;
    }

    // A never filled entry (the heap shrank between the walks) lists as free.
    {
        FakeHeap shrinking({{{0x10, 8, 1}, {0x20, 8, 1}}, {{0x10, 8, 0}}});
        picture.snap();
    }
    flushes.clear();
    picture.memusage(prt, OxHeapInfo::MEMUSAGE_FULL);
    EXPECT_EQ(flushes, (std::vector<std::string>{line("FREE ", 0x10, 8), line("FREE ", 0, 0), ""}));

    // Without a picture: one flush, of nothing.
    picture.release();
    flushes.clear();
    EXPECT_EQ(picture.memusage(prt, OxHeapInfo::MEMUSAGE_HEADS), 0u);
    EXPECT_EQ(flushes, std::vector<std::string>{""});
    EXPECT_EQ(picture.memusage(prt, OxHeapInfo::MEMUSAGE_TOTAL), 0u);
    EXPECT_EQ(flushes.size(), 1u);
    OxPrt::adjustIndent(-2);

    std::ostrstream stream;
    EXPECT_EQ(picture.dump(&stream), &stream);
    EXPECT_EQ(stream.pcount(), 0);
}
