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
    while (slabs != nullptr) {
        Slab* next = slabs->next;
        delete[] reinterpret_cast<char*>(slabs);
        slabs = next;
    }
    for (unsigned int i = 0; i < names.length; i++) {
        OxXmlNames::release(names.data[i]);
    }
    for (unsigned int i = 0; i < tables.length; i++) {
        delete tables.data[i];
    }
}

void OxXmlStore::grow(std::size_t size) {
    nextSlabBytes = nextSlabBytes == 0 ? kFirstSlab : nextSlabBytes;
    std::size_t slabBytes = nextSlabBytes;
    while (slabBytes < kHeader + size) {
        slabBytes *= 2;
    }
    char* memory = new char[slabBytes];
    slabs = new (memory) Slab{slabs};
    cursor = memory + kHeader;
    end = memory + slabBytes;
    bytes += slabBytes;
    if (nextSlabBytes < kLargestSlab) {
        nextSlabBytes *= 2;
    }
}

void* OxXmlStore::allocate(std::size_t size) {
    auto misalign = reinterpret_cast<std::uintptr_t>(cursor) % alignof(void*);
    std::size_t skip = misalign == 0 ? 0 : alignof(void*) - misalign;
    if (cursor == nullptr || static_cast<std::size_t>(end - cursor) < skip + size) {
        grow(size);
        skip = 0;
    }
    void* block = cursor + skip;
    cursor += skip + size;
    return block;
}

OxXmlElement* OxXmlStore::newElement(char const* name, std::size_t length) {
    void* memory = allocate(sizeof(OxXmlElement));
    char const* shared = OxXmlNames::acquire(name, length);
    auto* element = ::new (memory) OxXmlElement(static_cast<char const*>(nullptr));
    element->name = shared;
    element->storage = OxXmlElement::kStoredNode;
    return element;
}

OxXmlElement* OxXmlStore::newElementShared(char const* sharedName) {
    void* memory = allocate(sizeof(OxXmlElement));
    auto* element = ::new (memory) OxXmlElement(static_cast<char const*>(nullptr));
    element->name = OxXmlNames::share(sharedName);
    element->storage = OxXmlElement::kStoredNode;
    return element;
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
