// OxXmlStore.h: the storage of the nodes and texts of a read document.
//
// A read document holds many small objects: a 40 MB model has about half a
// million elements and more than a million attributes, each with a value
// text. Taking each of them from the general heap costs a block header per
// text, a walk of the heap to free each one, and memory that is never
// touched together. The readers of OxXmlFile and OxCsvFile therefore build
// their nodes in a store that the document owns: elements, value texts, the
// pending attributes of each element (OxXmlPendingAttributes) and the exact
// child lists of read elements are carved one behind the other out of large
// slabs, in reading order, and the slabs go back to the heap at once when
// the document goes.
//
//   OxXmlStore store;
//   OxXmlElement * record = store.newElement("record", 6);
//   store.setPendingPairs(record, pairs, 2);   // its two attributes, pending
//   // ... the tree is destroyed (OxXmlElement::release), then the store
//
// Nothing of this is visible to callers: a stored node behaves as any other.
// It owns its texts logically (they live exactly as long as the node can),
// getValue gives a stable pointer, setValue replaces a stored text by a heap
// copy, and pending attributes become objects when they are first needed. A
// node knows that it is stored by a flag; the document destroys its tree
// before its store, and a stored node is never handed to the heap's delete.
// The store holds one use of every name that a pending attribute or a read
// element refers to, and the column names of each CSV read.
//
// Without memory std::bad_alloc, and nothing is taken from the store.
#ifndef OXBASE_DOC_DETAIL_OXXMLSTORE_H
#define OXBASE_DOC_DETAIL_OXXMLSTORE_H

#include "oxbase/core/OxGList.h"
#include "oxbase/doc/detail/OxXmlNames.h"

#include <cstddef>
#include <cstring>

class OxXmlElement;

namespace oxbase {
namespace detail {

struct OxCsvColumns;
struct OxXmlPendingPair;

class OxXmlStore {
public:
    OxXmlStore() = default;
    OxXmlStore(const OxXmlStore&) = delete;
    OxXmlStore& operator=(const OxXmlStore&) = delete;
    /// Gives every slab, name and column table back. The nodes built here
    /// must be gone before.
    ~OxXmlStore();

    /// An element (XML_TYPE_ELEMENT) named by the shared text of the
    /// `length` characters at `name` (trimmed; none when empty).
    OxXmlElement* newElement(char const* name, std::size_t length);
    /// The same with a name that this store holds (holdName): the element
    /// takes no use of its own.
    OxXmlElement* newElementHeld(char const* heldName);
    /// Gives `element` (of this store, without children) the `count`
    /// children at `list` as an exact list in the store. Nothing for a count
    /// of 0.
    void setChildren(OxXmlElement* element, OxXmlElement* const* list, unsigned int count);
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
    /// The same for the value of a stored element.
    void setValue(OxXmlElement* element, char const* text, std::size_t length);
    /// Holds one use of `sharedName` (OxXmlNames) until the store goes, so
    /// that pending attributes may refer to it; returns it.
    char const* holdName(char const* sharedName);
    /// The shared text of `text` (OxXmlNames::acquire, null for a null or
    /// empty text), held by the store until it goes.
    char const* holdText(char const* text);
    /// Column names for the records of one CSV read, to be filled by the
    /// caller with names it holds here; they go with the store.
    OxCsvColumns* newColumns(char separator);
    /// Gives `element` (of this store, without attributes) the `count`
    /// attributes of `pairs` as pending attributes; their names must be held
    /// here. Nothing for a count of 0.
    void setPendingPairs(OxXmlElement* element, OxXmlPendingPair const* pairs, unsigned int count);
    /// Gives `element` (of this store, without attributes) the `count`
    /// non-empty fields of the `length` characters of `line` (a trimmed CSV
    /// line), named by `columns`, as pending attributes. Nothing for a count
    /// of 0.
    void setPendingLine(OxXmlElement* element, OxCsvColumns const* columns, unsigned int count,
                        char const* line, std::size_t length);

    /// Destroys an element (stored or not) that no place in a document holds.
    static void discard(OxXmlElement* element);

    /// Bytes of slabs taken from the heap.
    std::size_t getBytes() const { return bytes; }

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

    struct Slab {
        Slab* next;
    };
    Slab* slabs = nullptr;
    char* cursor = nullptr;
    char* end = nullptr;
    char* listCursor = nullptr; ///< the area of the child lists
    char* listEnd = nullptr;
    std::size_t nextSlabBytes = 0;
    std::size_t bytes = 0;
    OxGList<char const*> names{0};
    OxGList<OxCsvColumns*> tables{0};
};

} // namespace detail
} // namespace oxbase

#endif
