#include "oxbase/diag/OxHeapInfo.h"

#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/platform/detail/OxPlatformHeap.h"

#include <cstdint>
#include <new>

using namespace oxbase::detail;

namespace {
std::uintptr_t addressOf(const OxHeapInfo::HeapEntry& entry) {
    return reinterpret_cast<std::uintptr_t>(entry.address);
}

constexpr unsigned int kStateFree = 1;
constexpr unsigned int kStateUsed = 2;
} // namespace

OxHeapInfo::OxHeapInfo() {
    init();
}

OxHeapInfo::~OxHeapInfo() {
    release();
}

void OxHeapInfo::init() {
    delete[] entries;
    entries = nullptr;
    count = 0;
    usedCount = 0;
    usedBytes = 0;
}

void OxHeapInfo::release() {
    init();
}

void OxHeapInfo::snap() {
    release();
    OxHeapWalkEntry counting;
    while (OxPlatformHeapWalk(&counting) == OxHeapWalkOk) {
        count++;
        if (counting.used != 0) {
            usedCount++;
        }
    }
    if (count == 0) {
        return;
    }
    if (!withMemory([&] { entries = new HeapEntry[count + 1](); })) {
        init(); // no memory for the picture: no picture
        return;
    }
    unsigned int filled = 0;
    OxHeapWalkEntry filling;
    while (OxPlatformHeapWalk(&filling) == OxHeapWalkOk) {
        if (filling.used != 0) {
            usedBytes += filling.size;
        }
        if (filled < count) {
            entries[filled].address = filling.address;
            entries[filled].size = filling.size;
            entries[filled].state = filling.used != 0 ? kStateUsed : kStateFree;
            filled++;
        }
    }
}

void OxHeapInfo::sort() {
    qsort(0, count - 1);
}

void OxHeapInfo::swap(HeapEntry& a, HeapEntry& b) {
    HeapEntry kept = a;
    a = b;
    b = kept;
}

// Median of three, the pivot parked at right - 1, and no cut-over for short
// ranges. The median step leaves an address at `left` that is not above the
// pivot, which stops `j`, and the pivot at right - 1 stops `i`, so neither
// index leaves the range; `i` is always above `left`, so `i` - 1 cannot wrap.
void OxHeapInfo::qsort(unsigned int left, unsigned int right) {
    if (entries == nullptr || count == 0) {
        return;
    }
    while (right > left) {
        unsigned int center = left + (right - left) / 2;
        if (addressOf(entries[center]) < addressOf(entries[left])) {
            swap(entries[left], entries[center]);
        }
        if (addressOf(entries[right]) < addressOf(entries[left])) {
            swap(entries[left], entries[right]);
        }
        if (addressOf(entries[right]) < addressOf(entries[center])) {
            swap(entries[center], entries[right]);
        }
        if (right - left < 2) {
            return; // two entries: in order after the median step
        }
        std::uintptr_t pivot = addressOf(entries[center]);
        swap(entries[center], entries[right - 1]);
        unsigned int i = left;
        unsigned int j = right - 1;
        for (;;) {
            while (addressOf(entries[++i]) < pivot) {
            }
            while (pivot < addressOf(entries[--j])) {
            }
            if (i >= j) {
                break;
            }
            swap(entries[i], entries[j]);
        }
        swap(entries[i], entries[right - 1]);
        qsort(left, i - 1);
        left = i + 1;
    }
}

OxHeapInfo* OxHeapInfo::diff(OxHeapInfo& other) {
    sort();
    other.sort();
    // One walk in step through both pictures; `copy` null only counts.
    auto walk = [this, &other](HeapEntry* copy) {
        unsigned int found = 0;
        unsigned int i = 0;
        unsigned int j = 0;
        while (i < count && j < other.count) {
            std::uintptr_t mine = addressOf(entries[i]);
            std::uintptr_t theirs = addressOf(other.entries[j]);
            if (mine < theirs) {
                if (copy != nullptr) {
                    copy[found] = entries[i];
                }
                found++;
                i++;
            } else if (mine == theirs) {
                i++;
                j++;
            } else {
                j++;
            }
        }
        return found;
    };
    OxHeapInfo* result = nullptr;
    if (!withMemory([&] { result = new OxHeapInfo; })) {
        return nullptr;
    }
    unsigned int found = walk(nullptr);
    if (found == 0) {
        return result;
    }
    if (!withMemory([&] { result->entries = new HeapEntry[found](); })) {
        delete result;
        return nullptr;
    }
    result->count = walk(result->entries);
    return result;
}

size_t OxHeapInfo::memusage(OxPrt& print, MEMUSAGE_TYPE type) {
    if (type == MEMUSAGE_TOTAL) {
        return usedBytes;
    }
    for (unsigned int i = 0; i < count && entries != nullptr; i++) {
        const HeapEntry& entry = entries[i];
        std::ostrstream& stream = *print.getStr();
        oxIndent(stream) << (entry.state == kStateUsed ? "USED " : "FREE ");
        oxIndent(stream) << "block at " << entry.address << " of size 0x" << std::hex << entry.size
                         << std::dec << "\n";
        if (entry.state == kStateUsed && (type == MEMUSAGE_HEADS || type == MEMUSAGE_FULL)) {
            size_t shown = entry.size;
            if (type == MEMUSAGE_HEADS && shown > 16) {
                shown = 16;
            }
            OxPrt::printHex(&stream, static_cast<const unsigned char*>(entry.address), shown);
        }
        print.flushPrt();
    }
    print.flushPrt();
    return usedBytes;
}

const OxHeapInfo::HeapEntry* OxHeapInfo::getEntry(unsigned int index) const {
    return entries != nullptr && index < count ? &entries[index] : nullptr;
}

OxHeapInfo::WalkFunction OxHeapInfo::setWalkFunction(WalkFunction function) {
    return OxPlatformSetHeapWalk(function);
}

OxBool OxHeapInfo::isPlatformWalkAvailable() {
    return OxToBool(OxPlatformNativeHeapWalkAvailable());
}
