#include "oxbase/platform/detail/OxPlatformHeap.h"

#include "oxbase/platform/detail/OxSanitizer.h"

#include <cstdlib>
#include <cstring>

#ifdef _WIN32
#include <malloc.h>
#endif

// Sanitizers that put their own allocator in place of malloc.
#if defined(__has_feature)
#if __has_feature(memory_sanitizer) || __has_feature(thread_sanitizer) ||                          \
    __has_feature(hwaddress_sanitizer)
#define OX_MALLOC_REPLACED 1
#endif
#endif
#if defined(OX_ADDRESS_SANITIZER) || defined(__SANITIZE_THREAD__) || defined(__SANITIZE_HWADDRESS__)
#define OX_MALLOC_REPLACED 1
#endif

// <cstdlib> has brought in the C library's feature header, so __GLIBC__ is
// known by now.
#if !defined(_WIN32) && defined(__linux__) && defined(__GLIBC__) && !defined(OX_MALLOC_REPLACED)
#define OX_GLIBC_ARENA_WALK 1
#include <fcntl.h>
#include <malloc.h>
#include <unistd.h>
#endif

namespace oxbase {
namespace detail {

namespace {
OxHeapWalkFunction installedWalk = nullptr;
} // namespace

OxHeapWalkStatus OxPlatformHeapWalk(OxHeapWalkEntry* entry) {
    if (entry == nullptr) {
        return OxHeapWalkBad;
    }
    return installedWalk != nullptr ? installedWalk(entry) : OxPlatformNativeHeapWalk(entry);
}

OxHeapWalkFunction OxPlatformSetHeapWalk(OxHeapWalkFunction function) {
    OxHeapWalkFunction previous = installedWalk;
    installedWalk = function;
    return previous;
}

#if defined(_WIN32)

// _heapwalk keeps its position in _pentry, which is the block's address: a
// null address starts the walk, as it does in the entry.
OxHeapWalkStatus OxPlatformNativeHeapWalk(OxHeapWalkEntry* entry) {
    if (entry == nullptr) {
        return OxHeapWalkBad;
    }
    _HEAPINFO info;
    info._pentry = static_cast<int*>(entry->address);
    info._size = entry->size;
    info._useflag = entry->used != 0 ? _USEDENTRY : _FREEENTRY;
    int status = _heapwalk(&info);
    if (status != _HEAPOK) {
        return status == _HEAPEND ? OxHeapWalkEnd : OxHeapWalkBad;
    }
    entry->address = info._pentry;
    entry->size = info._size;
    entry->used = info._useflag == _USEDENTRY ? 1 : 0;
    return OxHeapWalkOk;
}

bool OxPlatformNativeHeapWalkAvailable() {
    return true;
}

#elif defined(OX_GLIBC_ARENA_WALK)

namespace {

// The chunk layout of glibc's malloc: a chunk starts with the size of the
// chunk before it (valid only while that one is free) and its own size,
// whose three low bits are flags; the memory handed out starts behind these
// two words.
constexpr std::uintptr_t kWord = sizeof(std::size_t);
constexpr std::uintptr_t kHeaderBytes = 2 * kWord;
constexpr std::uintptr_t kChunkAlign = 2 * kWord;
constexpr std::uintptr_t kMinChunk = 4 * kWord;
// malloc aligns the memory it hands out, and so the first chunk, to this.
constexpr std::uintptr_t kMallocAlign = alignof(std::max_align_t) > kChunkAlign
                                            ? alignof(std::max_align_t)
                                            : kChunkAlign;
constexpr std::size_t kPrevInUse = 0x1;
constexpr std::size_t kIsMmapped = 0x2;
constexpr std::size_t kNonMainArena = 0x4;
constexpr std::size_t kFlagBits = 0x7;

// The walk keeps the next chunk, the end of the arena and its phase in the cursor.
enum : std::uintptr_t { kNext = 0, kEnd = 1, kPhase = 2 };
enum : std::uintptr_t { kStarting = 0, kWalking = 1, kEnded = 2 };

struct Arena {
    std::uintptr_t first = 0; ///< the first chunk
    std::uintptr_t end = 0;   ///< the current break: no chunk reaches beyond it
};

// Chunk addresses are reckoned as integers; these two turn them into pointers.
std::size_t readWord(std::uintptr_t address) {
    std::size_t value = 0;
    // NOLINTNEXTLINE(performance-no-int-to-ptr): an address inside the located arena
    std::memcpy(&value, reinterpret_cast<const void*>(address), sizeof value);
    return value;
}

// The current break, or 0 when it cannot be had.
std::uintptr_t currentBreak() {
    auto now = reinterpret_cast<std::uintptr_t>(sbrk(0));
    return now == ~std::uintptr_t(0) ? 0 : now; // sbrk fails with (void *) -1
}

// Reads a file of /proc through a stack buffer, handing each character to
// `consume`; false when the file cannot be opened or read. Nothing is
// allocated, so the heap does not move while it is being located.
template <class Consumer> bool readProcFile(const char* path, Consumer& consume) {
    int fd = open(path, O_RDONLY | O_CLOEXEC);
    if (fd < 0) {
        return false;
    }
    char buffer[4096];
    bool ok = true;
    for (;;) {
        ssize_t got = read(fd, buffer, sizeof buffer);
        if (got < 0) {
            ok = false;
            break;
        }
        if (got == 0) {
            break;
        }
        for (ssize_t i = 0; i < got; i++) {
            consume(buffer[i]);
        }
    }
    close(fd);
    return ok;
}

int hexDigit(char c) {
    if (c >= '0' && c <= '9') {
        return c - '0';
    }
    if (c >= 'a' && c <= 'f') {
        return c - 'a' + 10;
    }
    if (c >= 'A' && c <= 'F') {
        return c - 'A' + 10;
    }
    return -1;
}

// Finds the line of /proc/self/maps that ends in "[heap]" and keeps its
// address range ("start-end perms ...").
class HeapLineFinder {
public:
    void operator()(char c) {
        if (c == '\n') {
            endLine();
            return;
        }
        if (field == 0 || field == 1) {
            int digit = hexDigit(c);
            if (digit >= 0) {
                std::uintptr_t& value = field == 0 ? lineStart : lineEnd;
                value = value * 16 + static_cast<std::uintptr_t>(digit);
            } else {
                field = (field == 0 && c == '-') ? 1 : 2;
            }
        }
        std::memmove(tail, tail + 1, sizeof tail - 1);
        tail[sizeof tail - 1] = c;
    }

    bool found = false;
    std::uintptr_t start = 0;
    std::uintptr_t end = 0;

private:
    void endLine() {
        if (!found && std::memcmp(tail, "[heap]", sizeof tail) == 0 && lineStart < lineEnd) {
            found = true;
            start = lineStart;
            end = lineEnd;
        }
        field = 0;
        lineStart = 0;
        lineEnd = 0;
        std::memset(tail, 0, sizeof tail);
    }

    int field = 0; ///< 0: start address, 1: end address, 2: the rest of the line
    std::uintptr_t lineStart = 0;
    std::uintptr_t lineEnd = 0;
    char tail[6] = {};
};

// Takes field 47 of /proc/self/stat, start_brk: where the brk area began.
// Fields are counted from 1; the second is the command name in parentheses,
// which may hold blanks and parentheses itself, so counting starts behind
// the last ')' of the line, with field 3.
class StartBrkFinder {
public:
    void operator()(char c) {
        if (c == ')') {
            field = 2;
            inField = false;
            valid = false;
            value = 0;
            return;
        }
        if (field < 2) {
            return;
        }
        if (c == ' ' || c == '\n') {
            inField = false;
            return;
        }
        if (!inField) {
            inField = true;
            field++;
            if (field == 47) {
                valid = true;
            }
        }
        if (field == 47 && valid) {
            if (c >= '0' && c <= '9') {
                value = value * 10 + static_cast<std::uintptr_t>(c - '0');
            } else {
                valid = false;
            }
        }
    }

    bool valid = false;
    std::uintptr_t value = 0;

private:
    int field = 0;
    bool inField = false;
};

// Where the arena lies now. The brk area begins at start_brk (or, when that
// cannot be read, at the start of the [heap] mapping) and ends at the
// current break; it must lie inside the [heap] mapping, so that every chunk
// the walk validates can be read.
bool locateArena(Arena& arena) {
    HeapLineFinder heapLine;
    if (!readProcFile("/proc/self/maps", heapLine) || !heapLine.found) {
        return false;
    }
    StartBrkFinder startBrk;
    std::uintptr_t start = heapLine.start;
    if (readProcFile("/proc/self/stat", startBrk) && startBrk.valid &&
        startBrk.value >= heapLine.start && startBrk.value < heapLine.end) {
        start = startBrk.value;
    }
    std::uintptr_t brk = currentBreak();
    if (brk <= start || brk > heapLine.end) {
        return false;
    }
    std::uintptr_t first =
        ((start + kHeaderBytes + kMallocAlign - 1) & ~(kMallocAlign - 1)) - kHeaderBytes;
    if (first >= brk || brk - first < kMinChunk) {
        return false;
    }
    arena.first = first;
    arena.end = brk;
    return true;
}

// The size of the chunk at `chunk` when it validates, else 0.
std::size_t validChunkSize(std::uintptr_t chunk, std::uintptr_t end) {
    if (chunk % kChunkAlign != 0 || chunk >= end || end - chunk < kMinChunk) {
        return 0;
    }
    std::size_t field = readWord(chunk + kWord);
    if ((field & (kIsMmapped | kNonMainArena)) != 0) {
        return 0;
    }
    std::size_t size = field & ~kFlagBits;
    if (size < kMinChunk || size % kChunkAlign != 0 || size > end - chunk) {
        return 0;
    }
    return size;
}

// Whether the chunk chain from the arena's first chunk reaches `target`.
bool chainReaches(const Arena& arena, std::uintptr_t target) {
    std::uintptr_t chunk = arena.first;
    while (chunk < target) {
        std::size_t size = validChunkSize(chunk, arena.end);
        if (size == 0) {
            return false;
        }
        chunk += size;
    }
    return chunk == target;
}

// Allocates a small block and checks that glibc's main arena served it.
// The heap is read only once the block is known to lie in the brk area.
// The allocation goes through a volatile pointer so that the pair of calls
// cannot be optimised away.
bool mallocIsMainArena() {
    void* (*volatile allocate)(std::size_t) = std::malloc;
    void (*volatile release)(void*) = std::free;
    void* probe = allocate(3 * kWord);
    if (probe == nullptr) {
        return false;
    }
    bool ok = false;
    Arena arena;
    auto address = reinterpret_cast<std::uintptr_t>(probe);
    if (locateArena(arena) && address >= arena.first + kHeaderBytes && address < arena.end) {
        std::uintptr_t chunk = address - kHeaderBytes;
        std::size_t size = validChunkSize(chunk, arena.end);
        ok = size != 0 && (readWord(arena.first + kWord) & kPrevInUse) != 0 &&
             malloc_usable_size(probe) == size - kWord && chainReaches(arena, chunk);
    }
    release(probe);
    return ok;
}

bool mainArenaChecked = false;

bool mainArenaUsable() {
    if (!mainArenaChecked) {
        mainArenaChecked = mallocIsMainArena();
    }
    return mainArenaChecked;
}

OxHeapWalkStatus endWalk(OxHeapWalkEntry* entry, OxHeapWalkStatus status) {
    entry->cursor[kPhase] = kEnded;
    return status;
}

} // namespace

OxHeapWalkStatus OxPlatformNativeHeapWalk(OxHeapWalkEntry* entry) {
    if (entry == nullptr) {
        return OxHeapWalkBad;
    }
    std::uintptr_t* cursor = entry->cursor;
    if (cursor[kPhase] == kStarting) {
        Arena arena;
        if (!mainArenaUsable() || !locateArena(arena)) {
            return endWalk(entry, OxHeapWalkEnd);
        }
        // The first chunk has no chunk before it, and glibc marks that as in use.
        if (validChunkSize(arena.first, arena.end) == 0 ||
            (readWord(arena.first + kWord) & kPrevInUse) == 0) {
            return endWalk(entry, OxHeapWalkBad);
        }
        cursor[kNext] = arena.first;
        cursor[kEnd] = arena.end;
        cursor[kPhase] = kWalking;
    }
    if (cursor[kPhase] != kWalking) {
        return OxHeapWalkEnd;
    }
    // A caller may free between two steps, and the arena may shrink then:
    // the walk never reads beyond the break as it is now.
    std::uintptr_t brk = currentBreak();
    if (brk < cursor[kEnd]) {
        cursor[kEnd] = brk;
    }
    std::uintptr_t chunk = cursor[kNext];
    std::uintptr_t end = cursor[kEnd];
    std::size_t size = validChunkSize(chunk, end);
    if (size == 0) {
        return endWalk(entry, OxHeapWalkBad);
    }
    // NOLINTNEXTLINE(performance-no-int-to-ptr): the memory malloc handed out for the chunk
    entry->address = reinterpret_cast<void*>(chunk + kHeaderBytes);
    entry->size = size - kWord;
    std::uintptr_t next = chunk + size;
    if (end - next < kMinChunk) {
        // The top chunk: it reaches the break, and no chunk follows it.
        entry->used = 0;
        cursor[kPhase] = kEnded;
        return OxHeapWalkOk;
    }
    entry->used = (readWord(next + kWord) & kPrevInUse) != 0 ? 1 : 0;
    cursor[kNext] = next;
    return OxHeapWalkOk;
}

bool OxPlatformNativeHeapWalkAvailable() {
    return mainArenaUsable();
}

#else

OxHeapWalkStatus OxPlatformNativeHeapWalk(OxHeapWalkEntry* entry) {
    return entry == nullptr ? OxHeapWalkBad : OxHeapWalkEnd;
}

bool OxPlatformNativeHeapWalkAvailable() {
    return false;
}

#endif

} // namespace detail
} // namespace oxbase
