// OxPlatformHeap.h: walking the blocks of the process heap.
//
// A walk is a loop over one OxHeapWalkEntry that starts zeroed: each call
// of OxPlatformHeapWalk delivers the next block (its address, size and
// whether it is in use) and answers OxHeapWalkOk, or answers another
// status when the walk has ended. The source of the blocks can be replaced
// by installing a function of the same form (a test installs one that
// delivers fake blocks); installing null brings back the platform's own.
//
//   OxHeapWalkEntry entry;
//   while (OxPlatformHeapWalk(&entry) == OxHeapWalkOk) { total += entry.size; }
//
// The platform's own source:
// - Windows: the runtime's _heapwalk with its _HEAPINFO record.
// - Linux with glibc: a walker of glibc's main arena, the heap that grows by
//   brk. It starts at the arena's first chunk (the start of the brk area,
//   found in /proc/self/stat and checked against the [heap] line of
//   /proc/self/maps, both read with open/read into stack buffers) and goes
//   from chunk to chunk by their size fields up to the top chunk, never past
//   the current break (sbrk(0)). Every chunk is validated before it is read
//   further: aligned to 2 * sizeof(size_t), at least the minimum chunk size,
//   wholly inside the arena, and without the NON_MAIN_ARENA and IS_MMAPPED
//   bits. The walk ends at the first chunk that does not validate; what was
//   delivered before counts. A block is in use when the PREV_INUSE bit of
//   the chunk after it is set.
//   What a block is: `address` is the pointer malloc handed out for it, and
//   `size` the bytes usable from there (the chunk size less its size field),
//   which is the requested size whenever malloc needed no rounding.
//   The top chunk, the untouched memory at the end of the arena, is
//   delivered as the last block, free.
//   Limits: blocks that glibc serves by mmap (large ones) and the arenas of
//   other threads are not part of the walk. Blocks held in glibc's
//   per-thread caches (tcache) and fastbins are in use as far as the arena
//   knows, so they are delivered as used. The walk reads the arena without
//   lock: it is taken while no other thread allocates.
//   At the start of its first walk (before the arena is located for it)
//   the walker checks that malloc really is glibc's main arena: a small
//   block is allocated, and nothing of the heap is read unless its address
//   lies in the located arena; then its chunk header must validate and
//   agree with malloc_usable_size, and the chain of chunks from the first
//   one must reach it; then it is freed. Under valgrind, with a preloaded
//   allocator or from another thread's arena this fails and the walk ends
//   at once, without reading the heap. A success is remembered for the
//   rest of the process (later walks allocate nothing), a failure is
//   checked again at the next walk.
// - Built with AddressSanitizer (or another sanitizer that replaces malloc),
//   with a C library other than glibc, or on any other platform: every walk
//   ends at once.
#ifndef OXBASE_PLATFORM_DETAIL_OXPLATFORMHEAP_H
#define OXBASE_PLATFORM_DETAIL_OXPLATFORMHEAP_H

#include "oxbase/platform/OxHeapWalk.h"

namespace oxbase {
namespace detail {

/// One step of a walk with the installed source, or the platform's own when
/// none is installed. A null `entry` gives OxHeapWalkBad.
OxHeapWalkStatus OxPlatformHeapWalk(OxHeapWalkEntry* entry);
/// Installs `function` as the source of every later walk; null brings back
/// the platform's own. Returns the source installed before (null for the
/// platform's own).
OxHeapWalkFunction OxPlatformSetHeapWalk(OxHeapWalkFunction function);
/// One step of the platform's own source, whatever is installed.
OxHeapWalkStatus OxPlatformNativeHeapWalk(OxHeapWalkEntry* entry);
/// Whether the platform's own source delivers blocks in this process (on
/// Linux: runs the allocator check described above). False means its walks
/// end at once.
bool OxPlatformNativeHeapWalkAvailable();

} // namespace detail
} // namespace oxbase

#endif
