// OxXmlRecords.h: the nodes of a read document before anyone asks for them.
//
// A read document holds far more nodes than its callers ever look at, and an
// OxXmlElement object with its list slot costs about 72 bytes and a
// constructor; an OxXmlAttribute with its slot about 40 more. The readers
// therefore leave each node as a compact record in the document's store
// (OxXmlStore), in reading order:
//
//   - a tag (kTag): its sibling and first child, its value text, its shape
//     (the element name and the attribute names, shared by every tag that
//     has the same ones) and the attribute values behind it, each
//     NUL-terminated; an empty element tag (kLeaf) without the first child
//     and the value, which it cannot have, and a tag whose value ends on
//     its line (kValued) with that value behind its attribute values;
//   - CSV records (kCsv): blocks of the trimmed lines of consecutive
//     records, with the shape of their read (the name "record" and the
//     column names);
//   - any other node (kNode): a comment, CDATA or DOCTYPE node inside an
//     element, an OxXmlElement object of its own that the store owns until
//     its parent's children are built.
//
// An element made from a record keeps the record for what it has not built
// yet: its attributes and its children are "pending" (OxXmlElement). It
// counts them without building anything; the first operation that needs
// them as objects builds all of them at once, in order, with exactly the
// names, values and parent they would have had. From then on they are
// ordinary objects and the record is never read again for them.
//
//   OxXmlRecord* root = store.newTag(shape, values, length);  // reader
//   OxXmlElement* element = OxXmlElement::fromRecord(root, true);
//   element->getNbChildElements();   // counts the records, builds nothing
//   element->getChild(0);            // builds every child of the element
#ifndef OXBASE_DOC_DETAIL_OXXMLRECORDS_H
#define OXBASE_DOC_DETAIL_OXXMLRECORDS_H

#include "oxbase/core/OxGList.h"
#include "oxbase/doc/detail/OxXmlNames.h"

#include <cstddef>
#include <cstdint>
#include <cstring>

class OxXmlElement;

namespace oxbase {
namespace detail {

class OxXmlStore;

/// The column names of one CSV read: one shared name per field position
/// (null for an empty header field), held by the store, and the separator.
/// Positions behind the header get "column<N>".
struct OxCsvColumns {
    char separator = ',';
    OxGList<char const*> names{0};
};

/// What the records of one kind of node have in common: their kind and
/// store, the element name, and for tags the names of their attributes (an
/// array of `count` shared names behind the shape), for CSV records the
/// columns. Every name is held by the store.
struct OxXmlShape {
    /// kTag a start tag, kLeaf an empty element tag ("/>", no value and no
    /// children: a record without the room for them), kValued a start tag
    /// whose value stands behind it on its line (the value must end there
    /// with the end tag: no children, and the value behind the attribute
    /// values), kCsv a CSV record, kNode any other node.
    enum Kind : std::uint8_t { kTag, kLeaf, kValued, kCsv, kNode };

    char const* name;
    OxCsvColumns const* columns; ///< kCsv
    OxXmlStore* store;           ///< where the records and their nodes live
    std::uint32_t count;         ///< tags: attributes of every tag of the shape
    Kind kind;

    bool isTag() const { return kind == kTag || kind == kLeaf || kind == kValued; }
    char const** names() { return reinterpret_cast<char const**>(this + 1); }
    char const* const* names() const { return reinterpret_cast<char const* const*>(this + 1); }
    static std::size_t bytes(unsigned int count) {
        return sizeof(OxXmlShape) + count * sizeof(char const*);
    }
};

static_assert(sizeof(OxXmlShape) % alignof(char const*) == 0,
              "the attribute names follow the shape aligned");

/// The head of every record: the next sibling (null for the last) and the
/// shape. What follows depends on the shape's kind: a leaf has its
/// attribute values right behind the head, `shape->count` texts, each
/// NUL-terminated, a value that is no text (an attribute without value)
/// written as a single blank, which no trimmed value can be; a valued tag
/// has its own value behind them, NUL-terminated too.
struct OxXmlRecord {
    OxXmlRecord* next;
    OxXmlShape const* shape;

    /// For tags: the first child and the value (null when there is none).
    inline OxXmlRecord* firstChild();
    inline char* value();
    /// For tags: where the attribute values begin.
    inline char* values();
    /// For tags: calls `take(name, value)` for each attribute in list order.
    template <class Take> void forEachTagAttribute(Take take) {
        char const* const* names = shape->names();
        char* text = values();
        for (std::uint32_t i = 0; i < shape->count; i++) {
            std::size_t length = std::strlen(text);
            take(names[i], text[0] == ' ' ? nullptr : text);
            text += length + 1;
        }
    }
};

/// A start tag: the head, the first child and the value, then the
/// attribute values as a leaf has them.
struct OxXmlTagRecord : OxXmlRecord {
    OxXmlRecord* first; ///< null without children
    char* text;         ///< the value, a text of the store, or null
};

OxXmlRecord* OxXmlRecord::firstChild() {
    return shape->kind == OxXmlShape::kTag ? static_cast<OxXmlTagRecord*>(this)->first : nullptr;
}

char* OxXmlRecord::value() {
    if (shape->kind == OxXmlShape::kTag) {
        return static_cast<OxXmlTagRecord*>(this)->text;
    }
    if (shape->kind != OxXmlShape::kValued) {
        return nullptr;
    }
    char* text = values();
    for (std::uint32_t i = 0; i < shape->count; i++) {
        text += std::strlen(text) + 1;
    }
    return text;
}

char* OxXmlRecord::values() {
    return shape->kind == OxXmlShape::kTag
               ? reinterpret_cast<char*>(static_cast<OxXmlTagRecord*>(this) + 1)
               : reinterpret_cast<char*>(this + 1);
}

/// The records of consecutive CSV lines as the reader leaves them: their
/// trimmed lines one behind the other, each NUL-terminated, behind the head
/// (a few bytes of head per block, none per line).
struct OxXmlCsvBlock : OxXmlRecord {
    std::uint32_t lines;
    std::size_t bytes; ///< of the lines, their NULs included

    char* text() { return reinterpret_cast<char*>(this + 1); }
};

/// One CSV record as its element refers to it, made when the element is
/// built: its count of non-empty fields and its line in a block.
struct OxXmlCsvRecord : OxXmlRecord {
    std::uint32_t count; ///< non-empty fields
    char* text;

    char* line() { return text; }
    /// Calls `take(name, value)` for each non-empty field in list order. The
    /// fields are trimmed in place and their ends written into the line on
    /// the way, so this runs once per record, and `take` must not fail.
    template <class Take> void forEachAttribute(Take take);
};

/// Any other node: an object of its own, owned by the store until a parent
/// takes it (then null).
struct OxXmlNodeRecord : OxXmlRecord {
    OxXmlElement* node;
};

/// Calls `take(start, length, last)` for each field of `line`, the empty ones
/// included, `last` being true for the field that ends the line. The end of
/// the text is tested before the separator, so every separator value is safe,
/// NUL included (the whole line is then one field). `take` may write a NUL
/// over the separator that ends its field.
template <class Take> void splitCsvFields(char* line, char separator, Take take) {
    // (The line is NUL-terminated: see countCsvFields for a counted one.)
    char* start = line;
    for (char* p = line;; p++) {
        bool last = *p == '\0';
        if (!last && *p != separator) {
            continue;
        }
        take(start, static_cast<std::size_t>(p - start), last);
        if (last) {
            return;
        }
        start = p + 1;
    }
}

/// Counts the non-empty fields of the `length` characters at `line` (the
/// fields as splitCsvFields finds them) into `count`, and gives in `covered`
/// the position behind the last of them (0 without any).
inline void countCsvFields(char const* line, std::size_t length, char separator,
                           unsigned int& count, unsigned int& covered) {
    count = 0;
    covered = 0;
    unsigned int position = 0;
    std::size_t fieldLength = 0;
    for (std::size_t i = 0; i < length; i++) {
        if (line[i] != separator) {
            fieldLength++;
            continue;
        }
        if (fieldLength != 0) {
            count++;
            covered = position + 1;
        }
        fieldLength = 0;
        position++;
    }
    if (fieldLength != 0) {
        count++;
        covered = position + 1;
    }
}

template <class Take> void OxXmlCsvRecord::forEachAttribute(Take take) {
    // Each non-empty field is an attribute named after its position, its
    // value the field trimmed in place (white space alone gives an empty
    // text, as setValue makes it).
    OxCsvColumns const* table = shape->columns;
    unsigned int position = 0;
    splitCsvFields(line(), table->separator,
                   [&take, &position, table](char* start, std::size_t length, bool) {
                       if (length != 0) {
                           char* first = start;
                           char* last = start + length;
                           OxXmlNames::trim(first, last);
                           *last = '\0';
                           take(table->names.data[position], first);
                       }
                       position++;
                   });
}

} // namespace detail
} // namespace oxbase

#endif
