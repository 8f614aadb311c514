#include "oxbase/doc/detail/OxXmlStore.h"

#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/detail/OxXmlNames.h"

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

bool isWhite(char c) {
    return OxXmlNames::isWhite(c);
}

/// An attribute list that is an exact array in the store: the list object
/// and its slots, one block.
template <class T> OxGList<T>* storedList(void* memory, unsigned int count) {
    auto* list = ::new (memory) OxGList<T>(0);
    list->data = reinterpret_cast<T*>(static_cast<char*>(memory) + sizeof(OxGList<T>));
    list->capacity = count;
    list->length = 0;
    return list;
}
} // namespace

OxXmlStore::~OxXmlStore() {
    while (slabs != nullptr) {
        Slab* next = slabs->next;
        delete[] reinterpret_cast<char*>(slabs);
        slabs = next;
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

char* OxXmlStore::copyTrimmed(char const* text, std::size_t length) {
    if (length == 0) {
        return nullptr;
    }
    char const* first = text;
    char const* last = text + length;
    while (first < last && isWhite(*first)) {
        first++;
    }
    while (last > first && isWhite(last[-1])) {
        last--;
    }
    auto count = static_cast<std::size_t>(last - first);
    if (cursor == nullptr || static_cast<std::size_t>(end - cursor) < count + 1) {
        grow(count + 1);
    }
    char* copy = cursor;
    std::memcpy(copy, first, count);
    copy[count] = '\0';
    cursor += count + 1;
    return copy;
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

OxXmlAttribute* OxXmlStore::newAttribute(char const* name, std::size_t length) {
    void* memory = allocate(sizeof(OxXmlAttribute));
    char const* shared = OxXmlNames::acquire(name, length);
    auto* attribute = ::new (memory) OxXmlAttribute(static_cast<char const*>(nullptr));
    attribute->name = shared;
    attribute->storage = OxXmlAttribute::kStoredNode;
    return attribute;
}

OxXmlAttribute* OxXmlStore::newAttributeShared(char const* sharedName) {
    void* memory = allocate(sizeof(OxXmlAttribute));
    auto* attribute = ::new (memory) OxXmlAttribute(static_cast<char const*>(nullptr));
    attribute->name = OxXmlNames::share(sharedName);
    attribute->storage = OxXmlAttribute::kStoredNode;
    return attribute;
}

void OxXmlStore::setValue(OxXmlAttribute* attribute, char const* text, std::size_t length) {
    char* copy = copyTrimmed(text, length);
    if ((attribute->storage & OxXmlAttribute::kStoredValue) == 0) {
        delete[] attribute->value;
    }
    attribute->value = copy;
    attribute->storage |= OxXmlAttribute::kStoredValue;
}

void OxXmlStore::setValue(OxXmlElement* element, char const* text, std::size_t length) {
    char* copy = copyTrimmed(text, length);
    if ((element->storage & OxXmlElement::kStoredValue) == 0) {
        delete[] element->value;
    }
    element->value = copy;
    element->storage |= OxXmlElement::kStoredValue;
}

void OxXmlStore::addAttributes(OxXmlElement* element, OxXmlAttribute* const* list,
                               unsigned int count) {
    if (count == 0) {
        return;
    }
    if (element->attributes != nullptr || (element->storage & OxXmlElement::kStoredNode) == 0) {
        element->reserveAttributes(element->getNbAttributes() + count);
        for (unsigned int i = 0; i < count; i++) {
            element->addAttribute(list[i]);
        }
        return;
    }
    using List = OxGList<OxXmlAttribute*>;
    // The slots are pointers to attributes.
    void* memory = allocate(sizeof(List) + count * sizeof(void*));
    List* stored = storedList<OxXmlAttribute*>(memory, count);
    for (unsigned int i = 0; i < count; i++) {
        stored->data[i] = list[i];
    }
    stored->length = count;
    element->attributes = stored;
    element->storage |= OxXmlElement::kStoredAttributes;
}

void OxXmlStore::discard(OxXmlAttribute* attribute) {
    OxXmlAttribute::release(attribute);
}

void OxXmlStore::discard(OxXmlElement* element) {
    OxXmlElement::release(element);
}

} // namespace detail
} // namespace oxbase
