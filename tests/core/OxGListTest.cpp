#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxGBinaryTree.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <sstream>
#include <string>
#include <vector>

namespace {
/// The elements of `list`, in order.
template <class T> std::vector<T> contents(const OxGList<T>& list) {
    return std::vector<T>(list.data, list.data + list.getLength());
}

/// Appends `count` values (10, 11, ...) to `list`, checking that each append
/// returns the new element's index; gives the capacity after each append.
std::vector<unsigned int> capacitiesWhileAppending(OxGList<unsigned int>& list,
                                                   unsigned int count) {
    std::vector<unsigned int> seen;
    for (unsigned int i = 0; i < count; i++) {
        unsigned int index = list.getLength();
        EXPECT_EQ(list.append(10 + i), index);
        seen.push_back(list.capacity);
    }
    return seen;
}
using Sizes = std::vector<unsigned int>;
} // namespace

TEST(OxGList, GrowthFollowsPowersOfTwo) {
    OxGList<unsigned int> list;
    EXPECT_EQ(list.capacity, 4u);
    EXPECT_EQ(capacitiesWhileAppending(list, 9), (Sizes{4, 4, 4, 4, 8, 8, 8, 8, 16}));
    EXPECT_EQ(list[0], 10u);
    // An emptied list starts from one element.
    list.makeEmpty();
    EXPECT_EQ(list.data, nullptr);
    EXPECT_EQ(capacitiesWhileAppending(list, 3), (Sizes{1, 2, 4}));

    OxGList<unsigned int> reserved;
    reserved.reserve(3);
    EXPECT_EQ(reserved.capacity, 4u);
    reserved.reserve(5);
    EXPECT_EQ(reserved.capacity, 8u);
    reserved.makeEmpty();
    reserved.reserve(1);
    EXPECT_EQ(reserved.capacity, 1u);

    OxGList<unsigned int> sized(3);
    EXPECT_EQ(sized.capacity, 4u);
    OxGList<unsigned int> bare(0);
    EXPECT_EQ(bare.data, nullptr);
    EXPECT_EQ(capacitiesWhileAppending(bare, 1), Sizes{1});
    EXPECT_EQ(bare[0], 10u);
}

TEST(OxGList, RangeReportOnlyBeyondLength) {
    OxGList<unsigned int> list;
    list.append(7);
    list.append(8);
    testing::internal::CaptureStdout();
    list[2] = 9; // index equal to length: within capacity and not reported
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    testing::internal::CaptureStdout();
    list.set(3, 1);
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              "Ooops, trying to access element 3 in OxList of length 2\n");

    // Index equal to length at full capacity, and on a list without storage:
    // not reported, and no memory outside the array is touched (AddressSanitizer
    // watches the build of the sanitizer preset).
    list.append(10);
    list.append(11);
    ASSERT_EQ(list.capacity, list.getLength());
    list[4] = 12;
    EXPECT_EQ(list[4], 0u);
    list.makeEmpty();
    list[0] = 5;
    list.set(0, 6);
    EXPECT_EQ(list.capacity, 0u);
}

TEST(OxGList, AppendOfItsOwnElementAtFullCapacity) {
    // The element is read before the array it lives in is replaced.
    OxGList<std::string> words;
    for (const char* w : {"alpha", "beta", "gamma", "delta"}) {
        words.append(w);
    }
    ASSERT_EQ(words.capacity, 4u);
    words.append(words[1]);
    ASSERT_EQ(words.getLength(), 5u);
    EXPECT_EQ(words[4], "beta");
    EXPECT_EQ(words[1], "beta");
}

TEST(OxGList, CopySharesPointeesAndRemoveNullsKeepsOrder) {
    int a = 1, b = 2, c = 3;
    auto* list = new OxGList<int*>;
    list->append(&a);
    list->append(nullptr);
    list->append(&b);
    list->append(nullptr);
    list->append(&c);
    {
        OxGList<int*> copy(*list);
        EXPECT_EQ(copy.capacity, 8u);
        EXPECT_EQ(copy[4], &c);
    }
    list->removeNulls();
    EXPECT_EQ(contents(*list), (std::vector<int*>{&a, &b, &c}));
    EXPECT_EQ(list->capacity, 8u);
    delete list; // through the base pointer: the pointees stay
    EXPECT_EQ(c, 3);
}

TEST(OxGList, SortOnBothPathsAndRemoveDuplicates) {
    std::mt19937 random(12345);
    for (unsigned int size : {0u, 1u, 2u, 9u, 10u, 11u, 100u, 1000u}) {
        std::vector<unsigned int> values(size);
        for (unsigned int& v : values) {
            v = random() % 50; // many equal keys
        }
        OxGList<unsigned int> list;
        for (unsigned int v : values) {
            list.append(v);
        }
        list.sort();
        std::sort(values.begin(), values.end());
        ASSERT_EQ(contents(list), values) << "size " << size;
        list.removeDuplicates();
        values.erase(std::unique(values.begin(), values.end()), values.end());
        ASSERT_EQ(contents(list), values) << "size " << size;
    }
    OxGList<unsigned int> runs;
    for (unsigned int v : {1u, 1u, 2u, 2u, 2u, 3u}) {
        runs.append(v);
    }
    runs.removeDuplicates();
    EXPECT_EQ(contents(runs), (Sizes{1, 2, 3}));
}

TEST(OxGBinaryTree, AscendingInsertStaysBalanced) {
    OxGBinaryTree<int> tree;
    EXPECT_EQ(tree.find(3), tree.nullNode);
    for (unsigned int key = 1; key <= 7; key++) {
        tree.insert(key, static_cast<int>(key * 10));
    }
    EXPECT_EQ(tree.root->key, 4u);
    EXPECT_EQ(tree.root->level, 3u);
    EXPECT_EQ(tree.root->left->key, 2u);
    EXPECT_EQ(tree.root->right->key, 6u);
    tree.insert(5, 999);
    EXPECT_EQ(tree.find(5)->value, 50);
    EXPECT_EQ(tree.find(8), tree.nullNode);

    // A large tree keeps every key findable and its depth logarithmic.
    OxGBinaryTree<unsigned int> large;
    for (unsigned int key = 0; key < 100000; key++) {
        large.insert(key * 7919u % 100003u, key);
    }
    for (unsigned int key = 0; key < 100000; key += 97) {
        ASSERT_EQ(large.find(key * 7919u % 100003u)->value, key);
    }
    EXPECT_LE(large.root->level, 18u);
}

TEST(OxGBinaryTree, DumpText) {
    OxGBinaryTree<int> tree;
    std::ostrstream stream;
    tree.dump(&stream, nullptr);
    tree.dump(&stream, tree.root);
    EXPECT_EQ(oxtest::streamText(stream),
              "Warning: current node is NULL.\nCurrent node is a terminal node.\n");

    tree.insert(2, 0);
    tree.insert(1, 0);
    std::ostrstream two;
    tree.dump(&two, tree.root);
    // Keys 1 and 2: the skew makes 1 the root with 2 as its right child.
    std::ostringstream expected;
    expected << "Current node = " << std::hex << static_cast<const void*>(tree.root) << std::dec
             << ", key = 1\n"
             << "  Left child is a terminal node, Right child = " << std::hex
             << static_cast<const void*>(tree.root->right) << std::dec << "\n"
             << "Current node = " << std::hex << static_cast<const void*>(tree.root->right)
             << std::dec << ", key = 2\n"
             << "  Left child is a terminal node, Right child is a terminal node\n";
    EXPECT_EQ(oxtest::streamText(two), expected.str());
}
