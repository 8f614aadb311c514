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

} // namespace

OxXmlStore::~OxXmlStore() {
    // The nodes that no parent took first: they are objects of the heap.
    for (unsigned int i = 0; i < nodes.length; i++) {
        OxXmlElement::release(nodes.data[i]->node);
    }
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
    delete[] shapes;
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

OxXmlElement* OxXmlStore::newElement() {
    // Elements and child lists are made when a caller first asks for them,
    // and go to areas of their own: the walks over a built tree (the
    // destruction above all) then run through memory in order.
    void* memory = allocateIn(sizeof(OxXmlElement), nodeCursor, nodeEnd);
    auto* element = ::new (memory) OxXmlElement(static_cast<char const*>(nullptr));
    element->storage = OxXmlElement::kStoredNode;
    return element;
}

OxGList<OxXmlElement*>* OxXmlStore::newChildList(unsigned int count) {
    using List = OxGList<OxXmlElement*>;
    // The list object and its slots, one block; the slots are pointers.
    void* memory = allocateIn(sizeof(List) + count * sizeof(void*), nodeCursor, nodeEnd);
    auto* list = ::new (memory) List(0);
    list->data = reinterpret_cast<OxXmlElement**>(static_cast<char*>(memory) + sizeof(List));
    list->capacity = count;
    list->length = 0;
    return list;
}

namespace {
std::size_t mixPointer(std::size_t hash, void const* pointer) {
    auto bits = static_cast<std::uint64_t>(reinterpret_cast<std::uintptr_t>(pointer));
    return static_cast<std::size_t>((hash ^ bits) * 0x9E3779B97F4A7C15ULL);
}

/// The hash of a tag shape: its names (the shared texts, by address).
std::size_t shapeHash(char const* name, char const* const* attributeNames, unsigned int count) {
    std::size_t hash = mixPointer(0, name);
    for (unsigned int n = 0; n < count; n++) {
        hash = mixPointer(hash, attributeNames[n]);
    }
    return hash;
}
} // namespace

OxXmlShape** OxXmlStore::findShape(char const* name, char const* const* attributeNames,
                                   unsigned int count, OxXmlShape::Kind kind, std::size_t hash) {
    std::size_t mask = shapeSlots - 1;
    for (std::size_t slot = (hash >> 20) & mask;; slot = (slot + 1) & mask) {
        OxXmlShape* shape = shapes[slot];
        if (shape == nullptr) {
            return &shapes[slot];
        }
        if (shape->name == name && shape->count == count && shape->kind == kind &&
            (count == 0 ||
             std::memcmp(shape->names(), attributeNames, count * sizeof(char const*)) == 0)) {
            return &shapes[slot];
        }
    }
}

void OxXmlStore::growShapes() {
    std::size_t slots = shapeSlots == 0 ? 64 : shapeSlots * 2;
    auto** bigger = new OxXmlShape*[slots]();
    OxXmlShape** old = shapes;
    std::size_t oldSlots = shapeSlots;
    shapes = bigger;
    shapeSlots = slots;
    for (std::size_t i = 0; i < oldSlots; i++) {
        OxXmlShape* shape = old[i];
        if (shape != nullptr) {
            *findShape(shape->name, shape->names(), shape->count, shape->kind,
                       shapeHash(shape->name, shape->names(), shape->count)) = shape;
        }
    }
    delete[] old;
}

OxXmlShape const* OxXmlStore::tagShape(char const* name, char const* const* attributeNames,
                                       unsigned int count, OxXmlShape::Kind kind) {
    if ((shapeCount + 1) * 2 > shapeSlots) {
        growShapes();
    }
    OxXmlShape** slot =
        findShape(name, attributeNames, count, kind, shapeHash(name, attributeNames, count));
    if (*slot == nullptr) {
        auto* shape =
            ::new (allocate(OxXmlShape::bytes(count))) OxXmlShape{name, nullptr, this, count, kind};
        if (count > 0) {
            std::memcpy(static_cast<void*>(shape->names()), attributeNames,
                        count * sizeof(char const*));
        }
        *slot = shape;
        shapeCount++;
    }
    return *slot;
}

OxXmlShape const* OxXmlStore::csvShape(char const* name, OxCsvColumns const* columns) {
    return ::new (allocate(OxXmlShape::bytes(0)))
        OxXmlShape{name, columns, this, 0, OxXmlShape::kCsv};
}

OxXmlRecord* OxXmlStore::newTag(OxXmlShape const* shape, char const* values, std::size_t length) {
    OxXmlRecord* record = nullptr;
    if (shape->kind != OxXmlShape::kTag) {
        record = ::new (allocate(sizeof(OxXmlRecord) + length)) OxXmlRecord;
    } else {
        auto* tag = ::new (allocate(sizeof(OxXmlTagRecord) + length)) OxXmlTagRecord;
        tag->first = nullptr;
        tag->text = nullptr;
        record = tag;
    }
    record->next = nullptr;
    record->shape = shape;
    if (length > 0) {
        std::memcpy(record->values(), values, length);
    }
    return record;
}

OxXmlCsvBlock* OxXmlStore::newCsvBlock(OxXmlShape const* shape, char const* line,
                                       std::size_t length) {
    void* memory = allocate(sizeof(OxXmlCsvBlock) + length + 1);
    auto* block = ::new (memory) OxXmlCsvBlock;
    block->next = nullptr;
    block->shape = shape;
    block->lines = 1;
    block->bytes = length + 1;
    std::memcpy(block->text(), line, length);
    block->text()[length] = '\0';
    return block;
}

bool OxXmlStore::addCsvLine(OxXmlCsvBlock* block, char const* line, std::size_t length) {
    if (block->text() + block->bytes != cursor ||
        static_cast<std::size_t>(end - cursor) <= length || block->lines == UINT32_MAX) {
        return false;
    }
    std::memcpy(cursor, line, length);
    cursor[length] = '\0';
    cursor += length + 1;
    block->bytes += length + 1;
    block->lines++;
    return true;
}

OxXmlCsvRecord* OxXmlStore::newCsvRecord(OxXmlShape const* shape, unsigned int count, char* text) {
    void* memory = allocateIn(sizeof(OxXmlCsvRecord), nodeCursor, nodeEnd);
    auto* record = ::new (memory) OxXmlCsvRecord;
    record->next = nullptr;
    record->shape = shape;
    record->count = count;
    record->text = text;
    return record;
}

OxXmlNodeRecord* OxXmlStore::newNode(OxXmlElement* node) {
    static const OxXmlShape kNodeShape{nullptr, nullptr, nullptr, 0, OxXmlShape::kNode};
    nodes.reserve(nodes.length + 1);
    auto* record = ::new (allocate(sizeof(OxXmlNodeRecord))) OxXmlNodeRecord;
    record->next = nullptr;
    record->shape = &kNodeShape;
    record->node = node;
    nodes.append(record); // within the room made above
    return record;
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

} // namespace detail
} // namespace oxbase
