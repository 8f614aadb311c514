// OxXmlStore.h: the storage of the nodes and texts of a read document.
//
// A read document holds many small objects: a 40 MB model has about half a
// million elements and more than a million attributes, each with a value
// text. Taking each of them from the general heap costs a block header per
// text, a walk of the heap to free each one, and memory that is never
// touched together. The readers of OxXmlFile and OxCsvFile therefore build
// their nodes in a store that the document owns: elements, attributes, their
// value texts and the attribute lists are carved one behind the other out of
// large slabs, in reading order, and the slabs go back to the heap at once
// when the document goes.
//
//   OxXmlStore store;
//   OxXmlElement * record = store.newElement("record", 6);
//   store.addAttributes(record, &attribute, 1);   // the element's list
//   // ... the tree is destroyed (OxXmlElement::release), then the store
//
// Nothing of this is visible to callers: a stored node behaves as any other.
// It owns its texts logically (they live exactly as long as the node can),
// getValue gives a stable pointer, setValue replaces a stored text by a heap
// copy, addAttribute moves a full stored list to the heap. A node knows that
// it is stored by a flag; the document destroys its tree before its store,
// and a stored node is never handed to the heap's delete.
//
// Without memory std::bad_alloc, and nothing is taken from the store.
#ifndef OXBASE_DOC_DETAIL_OXXMLSTORE_H
#define OXBASE_DOC_DETAIL_OXXMLSTORE_H

#include <cstddef>

class OxXmlAttribute;
class OxXmlElement;

namespace oxbase {
namespace detail {

class OxXmlStore {
public:
    OxXmlStore() = default;
    OxXmlStore(const OxXmlStore&) = delete;
    OxXmlStore& operator=(const OxXmlStore&) = delete;
    /// Gives every slab back. The nodes built here must be gone before.
    ~OxXmlStore();

    /// An element (XML_TYPE_ELEMENT) named by the shared text of the
    /// `length` characters at `name` (trimmed; none when empty).
    OxXmlElement* newElement(char const* name, std::size_t length);
    /// The same with a name already shared (OxXmlNames): one user more.
    OxXmlElement* newElementShared(char const* sharedName);
    /// An attribute named by the shared text of [name, name + length),
    /// without a value.
    OxXmlAttribute* newAttribute(char const* name, std::size_t length);
    /// The same with a name already shared (OxXmlNames): one user more.
    OxXmlAttribute* newAttributeShared(char const* sharedName);
    /// Gives `attribute` (of this store) the value [text, text + length),
    /// trimmed as setValue trims: no value for length 0, an empty text for
    /// white space alone.
    void setValue(OxXmlAttribute* attribute, char const* text, std::size_t length);
    /// The same for the value of a stored element.
    void setValue(OxXmlElement* element, char const* text, std::size_t length);
    /// Appends `count` attributes to the list of `element` (a stored element
    /// without attributes gets a stored list of exactly that size; any other
    /// appends them one by one).
    void addAttributes(OxXmlElement* element, OxXmlAttribute* const* list, unsigned int count);

    /// Destroys a stored attribute that no element holds yet (its memory
    /// stays with the store).
    static void discard(OxXmlAttribute* attribute);
    /// Destroys an element (stored or not) that no place in a document holds.
    static void discard(OxXmlElement* element);

    /// Bytes of slabs taken from the heap.
    std::size_t getBytes() const { return bytes; }

private:
    /// `size` bytes aligned for a pointer.
    void* allocate(std::size_t size);
    /// A copy of the trimmed [text, text + length) and a terminating zero;
    /// null for length 0.
    char* copyTrimmed(char const* text, std::size_t length);
    /// Makes room for `size` bytes at `cursor`.
    void grow(std::size_t size);

    struct Slab {
        Slab* next;
    };
    Slab* slabs = nullptr;
    char* cursor = nullptr;
    char* end = nullptr;
    std::size_t nextSlabBytes = 0;
    std::size_t bytes = 0;
};

} // namespace detail
} // namespace oxbase

#endif
