// OxHeapWalk.h: the blocks of a heap walk, as the public interface names them.
//
// OxHeapInfo takes its pictures from a heap walk: a loop over one entry that
// starts zeroed, each step delivering the next block. A caller may install a
// walk function of its own (OxHeapInfo::setWalkFunction), for example one
// that delivers the blocks of its own allocator.
//
//   OxHeapWalkStatus mine(OxHeapWalkEntry * entry);   // next block, or OxHeapWalkEnd
//   OxHeapInfo::setWalkFunction(mine);
#ifndef OXBASE_PLATFORM_OXHEAPWALK_H
#define OXBASE_PLATFORM_OXHEAPWALK_H

#include <cstddef>
#include <cstdint>

/// The result of one step of a heap walk.
enum OxHeapWalkStatus : int {
    OxHeapWalkOk = 0,  ///< a block was delivered
    OxHeapWalkEnd = 1, ///< the walk has ended
    OxHeapWalkBad = 2  ///< the walk met something it could not read; ended as well
};

/// One position of a heap walk. Zeroed (as a new object is) it starts a walk;
/// after each successful step it describes the block delivered. `cursor` is
/// the source's own bookkeeping and is left alone by callers.
struct OxHeapWalkEntry {
    void* address = nullptr; ///< the block
    std::size_t size = 0;    ///< its size in bytes
    int used = 0;            ///< non-zero for a block in use
    std::uintptr_t cursor[3] = {0, 0, 0};
};

/// A source of heap blocks: fills `entry` with the block after the one it
/// describes (the first block for a zeroed entry) and answers
/// OxHeapWalkOk, or answers another status at the end.
using OxHeapWalkFunction = OxHeapWalkStatus (*)(OxHeapWalkEntry* entry);

#endif
