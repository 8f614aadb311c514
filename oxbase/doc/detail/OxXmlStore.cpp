#include "oxbase/doc/detail/OxXmlStore.h"

#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlPendingAttributes.h"

#include <cctype>
#include <cstdint>
#include <cstring>
#include <new>

namespace oxbase {
namespace detail {

namespace {
/// Slabs of 60 KiB: below the size from which the heap maps fresh pages for
/// each block (128 KiB with glibc), so that the slabs of a document that went
/// are taken again by the next one instead of new memory from the system.
constexpr std::size_t kFirstSlab = 60 * 1024;
constexpr std::size_t kLargestSlab = 60 * 1024;
/// The slab header, rounded to the largest fundamental alignment.
constexpr std::size_t kHeader = 16;

} // namespace

OxXmlStore::~OxXmlStore() {
    // The oldest slab goes first. Slabs lie in the heap in the order they
    // were taken; freed newest first, each would come back to the top of the
    // heap and be handed back to the system on its own (a system call and a
    // flush of the address translations per slab: half a second for a 40 MB
    // document here). Oldest first, they join into one free block below the
    // newest, and the heap gives the memory back at most once.
    Slab* oldest = nullptr;
    while (slabs != nullptr) {
        Slab* next = slabs->next;
        slabs->next = oldest;
        oldest = slabs;
        slabs = next;
    }
    while (oldest != nullptr) {
        Slab* next = oldest->next;
        delete[] reinterpret_cast<char*>(oldest);
        oldest = next;
    }
    for (unsigned int i = 0; i < names.length; i++) {
        OxXmlNames::release(names.data[i]);
    }
    for (unsigned int i = 0; i < tables.length; i++) {
        delete tables.data[i];
    }
}

void OxXmlStore::grow(std::size_t size) {
    newSlab(size, cursor, end);
}

void OxXmlStore::newSlab(std::size_t size, char*& areaCursor, char*& areaEnd) {
    nextSlabBytes = nextSlabBytes == 0 ? kFirstSlab : nextSlabBytes;
    std::size_t slabBytes = nextSlabBytes;
    while (slabBytes < kHeader + size) {
        slabBytes *= 2;
    }
    char* memory = new char[slabBytes];
    slabs = new (memory) Slab{slabs};
    areaCursor = memory + kHeader;
    areaEnd = memory + slabBytes;
    bytes += slabBytes;
    if (nextSlabBytes < kLargestSlab) {
        nextSlabBytes *= 2;
    }
}

void* OxXmlStore::allocateIn(std::size_t size, char*& areaCursor, char*& areaEnd) {
    auto misalign = reinterpret_cast<std::uintptr_t>(areaCursor) % alignof(void*);
    std::size_t skip = misalign == 0 ? 0 : alignof(void*) - misalign;
    if (areaCursor == nullptr || static_cast<std::size_t>(areaEnd - areaCursor) < skip + size) {
        newSlab(size, areaCursor, areaEnd);
        skip = 0;
    }
    void* block = areaCursor + skip;
    areaCursor += skip + size;
    return block;
}

void* OxXmlStore::allocate(std::size_t size) {
    return allocateIn(size, cursor, end);
}

OxXmlElement* OxXmlStore::newElement(char const* name, std::size_t length) {
    void* memory = allocate(sizeof(OxXmlElement));
    char const* shared = OxXmlNames::acquire(name, length);
    auto* element = ::new (memory) OxXmlElement(static_cast<char const*>(nullptr));
    element->name = shared;
    element->storage = OxXmlElement::kStoredNode;
    return element;
}

OxXmlElement* OxXmlStore::newElementHeld(char const* heldName) {
    void* memory = allocate(sizeof(OxXmlElement));
    auto* element = ::new (memory) OxXmlElement(static_cast<char const*>(nullptr));
    element->name = heldName;
    element->storage = OxXmlElement::kStoredNode | OxXmlElement::kHeldName;
    return element;
}

void OxXmlStore::setChildren(OxXmlElement* element, OxXmlElement* const* list, unsigned int count) {
    if (count == 0) {
        return;
    }
    using List = OxGList<OxXmlElement*>;
    // The list object and its slots, one block; the slots are pointers.
    // Lists have slabs of their own: a list is made when its element ends,
    // and among the element's descendants it would stand in the way of
    // everything that walks the tree in document order.
    void* memory = allocateIn(sizeof(List) + count * sizeof(void*), listCursor, listEnd);
    auto* stored = ::new (memory) List(0);
    stored->data = reinterpret_cast<OxXmlElement**>(static_cast<char*>(memory) + sizeof(List));
    std::memcpy(static_cast<void*>(stored->data), list, count * sizeof(void*));
    stored->capacity = count;
    stored->length = count;
    element->children = stored;
    element->storage |= OxXmlElement::kStoredChildren;
}

void OxXmlStore::setValue(OxXmlElement* element, char const* text, std::size_t length) {
    char* copy = copyValue(text, length);
    if ((element->storage & OxXmlElement::kStoredValue) == 0) {
        delete[] element->value;
    }
    element->value = copy;
    element->storage |= OxXmlElement::kStoredValue;
}

char const* OxXmlStore::holdName(char const* sharedName) {
    names.reserve(names.length + 1);
    names.append(OxXmlNames::share(sharedName));
    return sharedName;
}

char const* OxXmlStore::holdText(char const* text) {
    char const* name = OxXmlNames::acquire(text);
    try {
        names.reserve(names.length + 1);
    } catch (const std::bad_alloc&) {
        OxXmlNames::release(name);
        throw;
    }
    names.append(name);
    return name;
}

OxCsvColumns* OxXmlStore::newColumns(char separator) {
    tables.reserve(tables.length + 1);
    auto* columns = new OxCsvColumns;
    columns->separator = separator;
    tables.append(columns);
    return columns;
}

void OxXmlStore::setPendingPairs(OxXmlElement* element, OxXmlPendingPair const* pairs,
                                 unsigned int count) {
    if (count == 0) {
        return;
    }
    void* memory = allocate(OxXmlPendingAttributes::pairsBytes(count));
    auto* pending = ::new (memory) OxXmlPendingAttributes{count, OxXmlPendingAttributes::kPairs};
    std::memcpy(static_cast<void*>(pending->pairs()), pairs, count * sizeof(OxXmlPendingPair));
    element->pending = pending;
    element->storage |= OxXmlElement::kPendingAttributes;
}

void OxXmlStore::setPendingLine(OxXmlElement* element, OxCsvColumns const* columns,
                                unsigned int count, char const* line, std::size_t length) {
    if (count == 0) {
        return;
    }
    void* memory = allocate(OxXmlPendingAttributes::lineBytes(length));
    auto* pending = ::new (memory) OxXmlPendingAttributes{count, OxXmlPendingAttributes::kCsvLine};
    pending->columns() = columns;
    char* text = pending->line();
    std::memcpy(text, line, length);
    text[length] = '\0';
    element->pending = pending;
    element->storage |= OxXmlElement::kPendingAttributes;
}

void OxXmlStore::discard(OxXmlElement* element) {
    OxXmlElement::release(element);
}

} // namespace detail
} // namespace oxbase
