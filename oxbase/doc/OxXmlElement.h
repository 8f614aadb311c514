// OxXmlElement.h: the node of the document model.
//
// An element has a name, attributes, child elements and a text value. A node
// without a name holds a declaration, comment, CDATA section or DOCTYPE as raw
// text in its value. An element owns its strings, attributes and children;
// trees of any depth are destroyed, dumped and written without recursion.
// Names are shared between elements and attributes of equal name, and the
// elements themselves come from a pool, so that a large document costs
// little more than its text. The attributes and children of a read element
// are built when they are first needed (see "Pending nodes" below).
//
//   OxXmlElement * part = new OxXmlElement("part");
//   part->addAttribute(new OxXmlAttribute("vec3d", OxVec3d(1, 2, 3)));
//   OxVec3d p;  part->getPoint(p);   // (1, 2, 3)
#ifndef OXBASE_DOC_OXXMLELEMENT_H
#define OXBASE_DOC_OXXMLELEMENT_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"
#include "oxbase/doc/OxXmlAttribute.h"

#include <cstddef>
#include <cstdint>
#include <new>

class OxXmlFile;
class OxCsvFile;
namespace oxbase {
namespace detail {
class OxXmlReader;
class OxXmlStore;
struct OxXmlRecord;
} // namespace detail
} // namespace oxbase

class OXBASE_API OxXmlElement {
public:
    /// What a node stands for. Nothing branches on it: a raw node is told
    /// from an element by having no name.
    enum XML_ELEMENT_TYPE : std::int32_t {
        XML_TYPE_ELEMENT = 1,
        XML_TYPE_DECLARATION = 2,
        XML_TYPE_COMMENT = 3, ///< comments and CDATA sections
        XML_TYPE_DOCTYPE = 4
    };

    /// An element named by a trimmed copy of `name` (null for null or empty).
    explicit OxXmlElement(char const* name);
    OxXmlElement(XML_ELEMENT_TYPE type, char const* name);
    OxXmlElement(const OxXmlElement&) = delete;
    OxXmlElement& operator=(const OxXmlElement&) = delete;
    /// Frees the strings and deletes every attribute and the whole subtree
    /// (without recursion, so any depth is safe). Does not touch `parent`.
    virtual ~OxXmlElement();

    /// Elements come from a pool of their own (a read document holds many):
    /// a block costs the object's size and no heap header. Objects of a
    /// derived class of another size use the general heap.
    static void* operator new(std::size_t size);
    static void* operator new(std::size_t size, std::nothrow_t const&) noexcept;
    static void operator delete(void* memory, std::size_t size);
    static void operator delete(void* memory, std::nothrow_t const&) noexcept;

    // ---- Tree ----

    /// Appends `attribute` (null too); the element takes ownership.
    void addAttribute(OxXmlAttribute* attribute);
    /// Makes room for `count` attributes in all, so that a caller that knows
    /// how many it will add (a CSV record) does not grow the list step by
    /// step. Changes nothing that can be read.
    void reserveAttributes(unsigned int count);
    /// Appends `child` (null too); the element takes ownership. The child's
    /// parent is not set: that is setParent.
    void addChild(OxXmlElement* child);
    void setParent(OxXmlElement* newParent) { parent = newParent; }
    OxXmlElement* getParent() const { return parent; }
    /// Deletes the child at `index` and leaves a null slot (the length stays).
    /// OxTrue with no children at all or on a null slot; OxFalse for an index
    /// not below the length.
    OxBool deleteChild(unsigned int index);
    /// Deletes every child named exactly `childName`, then removes all null
    /// slots, keeping the order of the rest. Always OxTrue.
    OxBool deleteChildren(char const* childName);

    // ---- Reading ----

    char const* getName() const { return name; }
    char const* getValue() const { return value; }
    char const* getXsiType() const { return xsiType; }
    XML_ELEMENT_TYPE getType() const { return type; }
    /// List lengths, null slots counted; 0 without a list. Builds nothing
    /// (pending children are counted by a walk over their records).
    unsigned int getNbAttributes() const;
    unsigned int getNbChildElements() const;
    /// The entry at `index`, or null (no list, index not below the length,
    /// or a null slot). This and every other operation that hands out or
    /// changes attributes or children builds pending ones first
    /// (std::bad_alloc when that fails, and they stay pending).
    OxXmlAttribute* getAttribute(unsigned int index) const;
    OxXmlElement* getChild(unsigned int index) const;
    /// The first attribute named exactly `attributeName` (case matters), or null.
    OxXmlAttribute* getAttributeByName(char const* attributeName) const;
    /// Its value, or null.
    char const* getAttributeValue(char const* attributeName) const;
    /// The first child named exactly `childName`, or null.
    OxXmlElement* getChildByName(char const* childName) const;
    /// All children named exactly `childName`, in order; the list owns nothing.
    OxGList<OxXmlElement const*> getChildrenByName(char const* childName) const;
    /// Whether both names exist and are equal.
    OxBool isNamed(char const* otherName) const;
    /// Whether the attribute exists with the value "yes" exactly.
    OxBool isYes(char const* attributeName) const;

    // ---- Writing ----

    /// Each replaces its text by a trimmed copy (null or empty: none).
    void setName(char const* newName);
    void setValue(char const* newValue);
    /// As setValue, but takes over `newValue`, a new[] array, and trims it in
    /// place instead of copying it: for long texts gathered by a reader.
    void adoptValue(char* newValue);
    void setXsiType(char const* newType);

    // ---- Typed getters ----
    //
    // The value is split on blanks and tabs; each token is trimmed and read
    // by atof (atol for indices): text that is no number counts as 0. A
    // missing attribute or one without value is no failure: OxTrue, output
    // untouched. Too few numbers: OxFalse, output untouched. Extra numbers
    // are ignored.

    /// Three numbers of "color", set by OxColor::setColor.
    OxBool getColor(OxColor& color) const;
    /// Every number of "indices", appended to `indices` (a null list: OxTrue).
    /// OxFalse when the value holds no number at all.
    OxBool getIndices(OxGList<unsigned int>* indices) const;
    /// Two, three or four numbers of "vec2d", "vec3d" or "vec4d".
    OxBool getPoint(OxVec2d& point) const;
    OxBool getPoint(OxVec3d& point) const;
    OxBool getPoint(OxVec4d& point) const;
    /// Two, three or four numbers of the named attribute (null name: OxFalse).
    OxBool getPoint(char const* attributeName, OxVec2d& point) const;
    OxBool getPoint(char const* attributeName, OxVec3d& point) const;
    OxBool getPoint(char const* attributeName, OxVec4d& point) const;

    /// The readable form of the node, its attributes and its subtree, by the
    /// dump convention (without recursion). Returns `stream`.
    virtual std::ostrstream* dump(std::ostrstream* stream) const;

    // ---- Pending nodes ----
    //
    // The readers leave what they read as compact records in the document's
    // store (oxbase/doc/detail/OxXmlRecords.h): an element made from a record
    // has its attributes and its children pending, counted but not yet
    // objects. The first call that needs the attributes as objects builds
    // all of them at once, in list order, with the names and values they
    // were read with; the first that needs the children builds every child
    // of the element the same way (each with its own attributes and
    // children pending). From then on they are ordinary objects, and each
    // pointer handed out stays valid as long as its object does. Building
    // is invisible but for its cost and for std::bad_alloc, which leaves
    // them pending. Const getters build too: the objects are part of the
    // element's state, not a change of it.

private:
    friend class OxXmlFile;
    friend class OxCsvFile;
    friend class oxbase::detail::OxXmlStore;
    friend class oxbase::detail::OxXmlReader;
    /// Where the object and its parts live: bits of `storage`. A stored
    /// element was made in a document's store (OxXmlStore) and goes with it;
    /// a stored value is a text there, which setValue replaces by a heap
    /// copy, so callers see no difference; a stored child list is an exact
    /// array there, moved to the heap by addChild. With pending attributes `pending`
    /// is set instead of `attributes`, with pending children `childRecords`
    /// instead of `children`: both are the element's record, and the
    /// attributes built from it keep their values in the store. A held name
    /// is one whose use the store holds for the element (setName takes a
    /// use of its own).
    enum : std::uint8_t {
        kStoredNode = 1,
        kStoredValue = 2,
        kPendingAttributes = 4,
        kPendingChildren = 8,
        kHeldName = 16,
        kStoredChildren = 32
    };
    /// The node of `record` (a record of a document's store): a new element
    /// of that store for a tag or CSV record, its attributes and children pending; the
    /// record's own node for a kNode record, which the caller takes over
    /// from the store. `topLevel`: the record may still get children (the
    /// reader makes a top-level element at its start tag).
    static OxXmlElement* fromRecord(oxbase::detail::OxXmlRecord* record, bool topLevel);
    /// Destroys `element` and its subtree as their storage requires (null is
    /// ignored): the way a document and a parent end the nodes they own.
    static void release(OxXmlElement* element);
    /// The attribute list, pending attributes built first (std::bad_alloc
    /// when that fails, and they stay pending); null without attributes.
    OxGList<OxXmlAttribute*>* attributeList() const {
        if ((storage & kPendingAttributes) != 0) {
            buildPendingAttributes();
        }
        return attributes;
    }
    /// The child list, pending children built first (as attributeList).
    OxGList<OxXmlElement*>* childList() const {
        if ((storage & kPendingChildren) != 0) {
            buildPendingChildren();
        }
        return children;
    }
    /// The record of the pending attributes when it is a read XML tag (null
    /// otherwise), for the writer, which writes them as they stand.
    oxbase::detail::OxXmlRecord* pendingTag() const;
    /// Turns the pending attributes into objects in a list of their own.
    /// The element is never a const object: only fromRecord makes pending
    /// attributes and children, on the elements it builds.
    void buildPendingAttributes() const;
    /// Turns the pending children into objects in a list of their own.
    void buildPendingChildren() const;
    /// Reads up to `count` numbers of attribute `attributeName` into `numbers`.
    /// 1: all found; 0: attribute or value missing; -1: too few or no copy.
    int readNumbers(char const* attributeName, double* numbers, unsigned int count) const;
    /// The `count` coordinates of `point` from attribute `attributeName`, as
    /// the named getPoint reads them (defined where they are instantiated).
    template <class Point>
    OxBool readPoint(char const* attributeName, Point& point, unsigned int count) const;
    /// Writes the node's own lines and attributes (not the children).
    void dumpNode(std::ostrstream& stream) const;

    XML_ELEMENT_TYPE type;
    std::uint8_t storage = 0;
    char* xsiType = nullptr;
    char const* name = nullptr; ///< shared with equal names (OxXmlNames)
    char* value = nullptr;
    OxXmlElement* parent = nullptr;
    union {
        OxGList<OxXmlElement*>* children = nullptr;
        oxbase::detail::OxXmlRecord* childRecords; ///< with kPendingChildren
    };
    union {
        OxGList<OxXmlAttribute*>* attributes = nullptr;
        oxbase::detail::OxXmlRecord* pending; ///< with kPendingAttributes
    };
};

#endif
