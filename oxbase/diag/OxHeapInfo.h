// OxHeapInfo.h: pictures of the process heap, compared and listed.
//
// `snap` records the address, size and state (free or used) of every block
// that the heap walk delivers. Two pictures compared with `diff` give the
// blocks that only the newer one has: the blocks made in between, as far as
// they lie below the highest address of the older picture. `memusage` lists
// a picture, with a hexadecimal table of each used block if asked.
//
//   OxHeapInfo before, after;
//   before.snap();  buildModel();  after.snap();
//   OxHeapInfo * fresh = after.diff(before);
//   OxPrt prt;  fresh->memusage(prt, OxHeapInfo::MEMUSAGE_HEADS);  delete fresh;
//
// The blocks come from the heap walk of oxbase/platform/detail/OxPlatformHeap.h:
// the runtime's _heapwalk on Windows, a validating walker of glibc's main
// arena on Linux (brk heap only: mmap'ed blocks and other threads' arenas
// are not seen; cached and fastbin blocks count as used; the top chunk is
// the last block, free), and a walk that ends at once under sanitizers, with
// other allocators and elsewhere. `setWalkFunction` installs another source
// for every picture taken afterwards.
//
// A listing with hexadecimal tables reads the used blocks of the picture:
// print a picture while its blocks are still alive.
#ifndef OXBASE_DIAG_OXHEAPINFO_H
#define OXBASE_DIAG_OXHEAPINFO_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"
#include "oxbase/platform/OxHeapWalk.h"

#include <cstddef>

class OxPrt;

class OXBASE_API OxHeapInfo {
public:
    /// One block of a picture.
    struct HeapEntry {
        void* address;      ///< the block
        size_t size;        ///< its size in bytes
        unsigned int state; ///< 0 unset, 1 free, 2 used
    };

    /// How much `memusage` writes. Other values give the listing without tables.
    enum MEMUSAGE_TYPE : int {
        MEMUSAGE_TOTAL = 0, ///< nothing, only the result
        MEMUSAGE_HEADS = 1, ///< the listing, and at most 16 bytes of each used block
        MEMUSAGE_FULL = 2   ///< the listing, and each used block in full
    };

    /// A source of blocks, as OxPlatformHeapWalk takes it.
    using WalkFunction = OxHeapWalkFunction;

    /// No picture; every count 0.
    OxHeapInfo();
    OxHeapInfo(const OxHeapInfo&) = delete;
    OxHeapInfo& operator=(const OxHeapInfo&) = delete;
    /// Releases the picture.
    virtual ~OxHeapInfo();

    /// Replaces the picture by a new one of the heap. Walks twice: the first
    /// walk counts the blocks (and the used ones), then the entries are
    /// allocated, and the second walk adds up the sizes of the used blocks
    /// and fills the entries, storing no more blocks than the first walk
    /// counted. A heap without blocks (or an entry array that cannot be
    /// allocated) leaves no picture.
    void snap();
    /// Drops the picture: no entries, every count 0.
    void release();
    /// Orders the entries by ascending address (quicksort, median of three).
    void sort();
    /// A new picture, owned by the caller, of the blocks of this picture
    /// whose address the other one lacks, in ascending order. The walk ends
    /// with the end of `other`, so blocks above its highest address are left
    /// out. Sorts both pictures. The result's used count and bytes are 0;
    /// without any such block it has no entries. Null only when memory for
    /// the result runs out.
    OxHeapInfo* diff(OxHeapInfo& other);
    /// With MEMUSAGE_TOTAL: nothing written. Otherwise one line for each
    /// entry on the stream of `print`, "USED " or "FREE ", "block at ", the
    /// address (as an ostream writes a pointer), " of size 0x" and the size in
    /// hexadecimal, both parts indented; with MEMUSAGE_HEADS or MEMUSAGE_FULL
    /// a hexadecimal table of each used block follows its line, read from the
    /// block itself. `print` is flushed after each entry and once at the end.
    /// Returns the used bytes of the picture.
    size_t memusage(OxPrt& print, MEMUSAGE_TYPE type);
    /// Writes nothing; returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const { return stream; }

    /// The number of entries of the picture.
    unsigned int getCount() const { return count; }
    /// How many blocks the (first) walk of `snap` found in use.
    unsigned int getUsedCount() const { return usedCount; }
    /// The sum of the sizes of the used blocks, from the second walk of `snap`.
    size_t getUsedBytes() const { return usedBytes; }
    /// Entry `index`, owned by the picture and valid until it changes; null
    /// beyond the end. Entries are contiguous: entry 0 is the whole array.
    const HeapEntry* getEntry(unsigned int index) const;

    /// Installs `function` as the source of the blocks of later pictures;
    /// null brings back the platform's own. Returns the source installed
    /// before (null for the platform's own).
    static WalkFunction setWalkFunction(WalkFunction function);
    /// Whether the platform's own source delivers blocks in this process.
    static OxBool isPlatformWalkAvailable();

private:
    void init();
    void qsort(unsigned int left, unsigned int right);
    void swap(HeapEntry& a, HeapEntry& b);

    unsigned int count = 0;
    unsigned int usedCount = 0;
    size_t usedBytes = 0;
    HeapEntry* entries = nullptr;
};

#endif
