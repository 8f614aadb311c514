// OxSlabPool.h: fixed-size blocks carved from large slabs.
//
// A class whose objects are many and small (the nodes and attributes of a
// read document) takes its memory from a pool of its own: a block costs its
// size and nothing more, where the general heap adds a header and rounds up
// (a 64-byte node takes 80 bytes there). Freed blocks are kept on a list for
// the next allocation; when the last block of the pool is freed, every slab
// goes back to the heap, so a document that is destroyed gives its memory
// back as it would with plain new and delete.
//
//   static OxSlabPool pool(sizeof(Node));
//   void* memory = pool.allocate();   // null when the heap is exhausted
//   pool.release(memory);
//
// A class routes its own operator new and delete through allocateObject and
// releaseObject, which send objects of any other size (a derived class) to
// the general heap.
//
// The constructor is constexpr and the class has no destructor, so a static
// pool is ready before any code runs and still usable while other statics
// are destroyed; it holds no memory while no block is in use. No lock: one
// thread at a time, as everywhere in the library.
#ifndef OXBASE_CORE_DETAIL_OXSLABPOOL_H
#define OXBASE_CORE_DETAIL_OXSLABPOOL_H

#include <cstddef>
#include <new>

namespace oxbase {
namespace detail {

class OxSlabPool {
public:
    /// A pool of blocks of `blockSize` bytes (rounded up to a pointer's
    /// alignment). No memory is taken until the first allocate.
    constexpr explicit OxSlabPool(std::size_t blockSize)
        : objectSize(blockSize),
          blockSize(blockSize < sizeof(void*)
                        ? sizeof(void*)
                        : (blockSize + alignof(void*) - 1) / alignof(void*) * alignof(void*)) {}
    OxSlabPool(const OxSlabPool&) = delete;
    OxSlabPool& operator=(const OxSlabPool&) = delete;

    std::size_t getBlockSize() const { return blockSize; }
    /// Blocks handed out and not yet released.
    std::size_t getLiveCount() const { return live; }

    /// One block, aligned for any object of at most the block size whose
    /// alignment is that of a pointer; null when no slab could be had.
    void* allocate() noexcept;
    /// Returns a block of this pool (null is ignored).
    void release(void* block) noexcept;

    /// For a class-specific operator new: a block when `size` is the size
    /// the pool was made for, else memory of the general heap; on failure
    /// std::bad_alloc as from a plain new.
    void* allocateObject(std::size_t size);
    /// The same, null on failure (for `new (std::nothrow)`).
    void* allocateObject(std::size_t size, std::nothrow_t const&) noexcept;
    /// For a class-specific sized operator delete: the counterpart of
    /// allocateObject for an object of `size` bytes.
    void releaseObject(void* memory, std::size_t size) noexcept;
    /// For a placement operator delete, which is not told the size: the
    /// pool tells its blocks by their address (a walk over the slabs, for
    /// the rare constructor that fails).
    void releaseObject(void* memory) noexcept;

private:
    struct Slab {
        Slab* next;
        std::size_t bytes; ///< the whole slab, header included
    };
    struct FreeBlock {
        FreeBlock* next;
    };

    /// Takes a new slab from the heap: twice the size of the last, from
    /// 4 KiB up to 64 KiB. False when the heap has no such block.
    bool grow() noexcept;
    /// Frees every slab (no block is in use).
    void shrink() noexcept;

    std::size_t objectSize; ///< the size of the objects the pool was made for
    std::size_t blockSize;
    std::size_t live = 0;
    FreeBlock* freeBlocks = nullptr;
    Slab* slabs = nullptr;  ///< newest first
    char* unused = nullptr; ///< the part of the newest slab not yet handed out
    char* unusedEnd = nullptr;
};

} // namespace detail
} // namespace oxbase

#endif
