// OxXmlStore.h: the storage of the records and texts of a read document.
//
// A read document holds many small things: a 40 MB model has about half a
// million elements and more than a million attributes, each with a value
// text. Taking each of them from the general heap costs a block header per
// text, a walk of the heap to free each one, and memory that is never
// touched together. The readers of OxXmlFile and OxCsvFile therefore leave
// what they read in a store that the document owns: the records of the
// nodes (OxXmlRecords.h), their shapes and their value texts are carved one
// behind the other out of large slabs, in reading order, and the slabs go
// back to the heap at once when the document goes.
//
//   OxXmlStore store;
//   OxXmlShape const* shape = store.tagShape(name, names, 2, OxXmlShape::kLeaf);
//   OxXmlRecord* tag = store.newTag(shape, "1\0" "2\0", 4);
//   // ... the tree is destroyed, then the store
//
// Nothing of this is visible to callers: the elements built from records
// behave as any other. Their texts live exactly as long as the nodes can
// (the document destroys its tree before its store), getValue gives a
// stable pointer, and setValue replaces a stored text by a heap copy. The
// store holds one use of every name that a record refers to, and owns the
// objects of kNode records that no parent has taken.
//
// Without memory std::bad_alloc, and nothing is taken from the store.
#ifndef OXBASE_DOC_DETAIL_OXXMLSTORE_H
#define OXBASE_DOC_DETAIL_OXXMLSTORE_H

#include "oxbase/core/OxGList.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlRecords.h"

#include <cstddef>
#include <cstring>

class OxXmlElement;

namespace oxbase {
namespace detail {

class OxXmlStore {
public:
    OxXmlStore() = default;
    OxXmlStore(const OxXmlStore&) = delete;
    OxXmlStore& operator=(const OxXmlStore&) = delete;
    /// Gives every slab, name, shape and column table back, and deletes the
    /// objects of kNode records that no parent took. The elements built from
    /// records must be gone before.
    ~OxXmlStore();

    /// The shape of the tags of `kind` (kTag, kLeaf or kValued) named `name`
    /// (held here, or null) with the `count` attributes named `names` (held
    /// here), in this order: the same object for every tag alike.
    OxXmlShape const* tagShape(char const* name, char const* const* names, unsigned int count,
                               OxXmlShape::Kind kind);
    /// A shape for the records of one CSV read, named `name` (held here).
    OxXmlShape const* csvShape(char const* name, OxCsvColumns const* columns);
    /// A tag of `shape`, without sibling, children or value (but for a valued
    /// tag's), followed by the `length` bytes at `values` (the attribute
    /// values and a valued tag's value as OxXmlRecord lays them out).
    OxXmlRecord* newTag(OxXmlShape const* shape, char const* values, std::size_t length);
    /// A block of CSV records of `shape` holding the record of the `length`
    /// characters at `line`.
    OxXmlCsvBlock* newCsvBlock(OxXmlShape const* shape, char const* line, std::size_t length);
    /// Adds the record of the `length` characters at `line` to `block`, the
    /// last thing made here: false, and nothing changed, when the slab it
    /// is in has no room left (a new block takes it then).
    bool addCsvLine(OxXmlCsvBlock* block, char const* line, std::size_t length);
    /// The record of one line `text` of a block, with `count` non-empty
    /// fields, made in the area of the built elements.
    OxXmlCsvRecord* newCsvRecord(OxXmlShape const* shape, unsigned int count, char* text);
    /// A kNode record of `node`, which the store owns from then on (and the
    /// caller still when this fails).
    OxXmlNodeRecord* newNode(OxXmlElement* node);
    /// An element (XML_TYPE_ELEMENT, no name) in the store: it goes with
    /// the store, its destructor alone is run (OxXmlElement::release).
    OxXmlElement* newElement();
    /// An empty child list with room for exactly `count` children, in the
    /// store (OxXmlElement moves it to the heap when it has to grow).
    OxGList<OxXmlElement*>* newChildList(unsigned int count);
    /// A copy of [text, text + length) trimmed as setValue trims, in the
    /// store: null for length 0, an empty text for white space alone.
    char* copyValue(char const* text, std::size_t length) {
        if (length == 0) {
            return nullptr;
        }
        char const* first = text;
        char const* last = text + length;
        OxXmlNames::trim(first, last);
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
    /// Holds one use of `sharedName` (OxXmlNames) until the store goes, so
    /// that records may refer to it; returns it.
    char const* holdName(char const* sharedName);
    /// The shared text of `text` (OxXmlNames::acquire, null for a null or
    /// empty text), held by the store until it goes.
    char const* holdText(char const* text);
    /// Column names for the records of one CSV read, to be filled by the
    /// caller with names it holds here; they go with the store.
    OxCsvColumns* newColumns(char separator);

private:
    /// `size` bytes aligned for a pointer.
    void* allocate(std::size_t size);
    /// Makes room for `size` bytes at `cursor`.
    void grow(std::size_t size);
    /// A new slab of at least `size` bytes (and a header) for the area that
    /// `areaCursor` and `areaEnd` describe.
    void newSlab(std::size_t size, char*& areaCursor, char*& areaEnd);
    /// `size` bytes aligned for a pointer in that area.
    void* allocateIn(std::size_t size, char*& areaCursor, char*& areaEnd);
    /// The slot of `shapes` for the shape (name, names, count): the one that
    /// holds it or the empty one where it goes.
    OxXmlShape** findShape(char const* name, char const* const* names, unsigned int count,
                           OxXmlShape::Kind kind, std::size_t hash);
    /// Doubles the table of shapes.
    void growShapes();

    struct Slab {
        Slab* next;
    };
    Slab* slabs = nullptr;
    char* cursor = nullptr;
    char* end = nullptr;
    char* nodeCursor = nullptr; ///< the area of built elements and lists
    char* nodeEnd = nullptr;
    std::size_t nextSlabBytes = 0;
    OxGList<char const*> names{0};
    OxGList<OxCsvColumns*> tables{0};
    OxGList<OxXmlNodeRecord*> nodes{0};
    /// The tag shapes, open addressing over a power of two of slots, at most
    /// half of them used.
    OxXmlShape** shapes = nullptr;
    std::size_t shapeSlots = 0;
    std::size_t shapeCount = 0;
};

} // namespace detail
} // namespace oxbase

#endif
