#include "oxbase/core/detail/OxSlabPool.h"

#include "oxbase/platform/detail/OxSanitizer.h"

#include <new>

namespace oxbase {
namespace detail {

namespace {
constexpr std::size_t kFirstSlabBytes = 4096;
constexpr std::size_t kLargestSlabBytes = 65536;
/// The slab header rounded to the largest fundamental alignment, so that the
/// blocks behind it are aligned as a heap block would be.
constexpr std::size_t kHeaderBytes = 16;
} // namespace

void* OxSlabPool::allocate() noexcept {
    void* block = nullptr;
    if (freeBlocks != nullptr) {
        FreeBlock* first = freeBlocks;
        OX_UNPOISON(first, blockSize);
        freeBlocks = first->next;
        block = first;
    } else {
        if ((unused == nullptr || static_cast<std::size_t>(unusedEnd - unused) < blockSize) &&
            !grow()) {
            return nullptr;
        }
        block = unused;
        unused += blockSize;
        OX_UNPOISON(block, blockSize);
    }
    live++;
    return block;
}

void OxSlabPool::release(void* block) noexcept {
    if (block == nullptr) {
        return;
    }
    // Under AddressSanitizer a block released twice is poisoned already, and
    // this write is reported.
    freeBlocks = new (block) FreeBlock{freeBlocks};
    OX_POISON(block, blockSize);
    if (--live == 0) {
        shrink();
    }
}

void* OxSlabPool::allocateObject(std::size_t size) {
    if (size != objectSize) {
        return ::operator new(size);
    }
    void* block = allocate();
    if (block == nullptr) {
        throw std::bad_alloc();
    }
    return block;
}

void* OxSlabPool::allocateObject(std::size_t size, std::nothrow_t const&) noexcept {
    return size == objectSize ? allocate() : ::operator new(size, std::nothrow);
}

void OxSlabPool::releaseObject(void* memory, std::size_t size) noexcept {
    if (size == objectSize) {
        release(memory);
    } else {
        ::operator delete(memory);
    }
}

void OxSlabPool::releaseObject(void* memory) noexcept {
    auto* address = static_cast<char*>(memory);
    for (Slab* slab = slabs; slab != nullptr; slab = slab->next) {
        auto* start = reinterpret_cast<char*>(slab);
        if (address >= start && address < start + slab->bytes) {
            release(memory);
            return;
        }
    }
    ::operator delete(memory);
}

bool OxSlabPool::grow() noexcept {
    std::size_t bytes = slabs == nullptr ? kFirstSlabBytes : slabs->bytes * 2;
    if (bytes > kLargestSlabBytes) {
        bytes = kLargestSlabBytes;
    }
    while (bytes < kHeaderBytes + blockSize) {
        bytes *= 2;
    }
    // The slab is created with new char[] and stays poisoned but for the
    // blocks handed out; a pool never reads the unused part.
    char* memory = new (std::nothrow) char[bytes];
    if (memory == nullptr) {
        return false;
    }
    auto* slab = new (memory) Slab{slabs, bytes};
    slabs = slab;
    unused = reinterpret_cast<char*>(slab) + kHeaderBytes;
    unusedEnd = reinterpret_cast<char*>(slab) + bytes;
    OX_POISON(unused, static_cast<std::size_t>(unusedEnd - unused));
    return true;
}

void OxSlabPool::shrink() noexcept {
    while (slabs != nullptr) {
        Slab* newest = slabs;
        slabs = newest->next;
        OX_UNPOISON(newest, newest->bytes);
        delete[] reinterpret_cast<char*>(newest);
    }
    freeBlocks = nullptr;
    unused = nullptr;
    unusedEnd = nullptr;
}

} // namespace detail
} // namespace oxbase
