// OxXmlPendingAttributes.h: the attributes of a read element before anyone
// asks for them.
//
// A read document holds far more attributes than its callers ever look at,
// and an OxXmlAttribute object with its list slot costs about 40 bytes and a
// constructor. The readers therefore record each element's attributes in a
// compact form in the document's store (OxXmlStore): an XML tag as pairs of
// a shared name and a stored value text, a CSV record as its trimmed line
// and the column names of its read. The element counts them without more
// ado; the first operation that needs the objects (a getter by index or
// name, dump, write, a mutator) builds them all at once, in order, with
// exactly the names and values they would have had (OxXmlElement). From
// then on the element holds ordinary attributes and the pending form is
// never read again.
//
//   OxXmlPendingAttributes* pending = store.newPairs(pairs, 3);
//   store.setPending(element, pending);
//   element->getNbAttributes();   // 3, nothing built
//   element->getAttribute(0);     // builds the three attributes
#ifndef OXBASE_DOC_DETAIL_OXXMLPENDINGATTRIBUTES_H
#define OXBASE_DOC_DETAIL_OXXMLPENDINGATTRIBUTES_H

#include "oxbase/core/OxGList.h"
#include "oxbase/doc/detail/OxXmlNames.h"

#include <cstddef>
#include <cstdint>

namespace oxbase {
namespace detail {

/// One attribute of a tag as read: its shared name (OxXmlNames, held by the
/// store) and its trimmed value text in the store (null: no value).
struct OxXmlPendingPair {
    char const* name;
    char* value;
};

/// The column names of one CSV read: one shared name per field position
/// (null for an empty header field), held by the store, and the separator.
/// Positions behind the header get "column<N>".
struct OxCsvColumns {
    char separator = ',';
    OxGList<char const*> names{0};
};

/// The pending attributes of one element, in the store. A header, followed
/// by `count` pairs (kPairs) or by a pointer to the columns and the record's
/// line, NUL-terminated (kCsvLine).
struct OxXmlPendingAttributes {
    enum Kind : std::uint8_t { kPairs, kCsvLine };

    std::uint32_t count; ///< attributes it stands for, at least 1
    Kind kind;

    /// The room of the pointer to the columns (an object pointer).
    static constexpr std::size_t kColumnsBytes = sizeof(void*);

    /// Calls `take(name, value)` for each attribute in list order. The CSV
    /// form writes the ends of its values into its line on the way, so this
    /// runs once per element, and `take` must not fail.
    template <class Take> void forEach(Take take);

    OxXmlPendingPair* pairs() { return reinterpret_cast<OxXmlPendingPair*>(this + 1); }
    OxCsvColumns const*& columns() { return *reinterpret_cast<OxCsvColumns const**>(this + 1); }
    char* line() { return reinterpret_cast<char*>(this + 1) + kColumnsBytes; }

    /// Bytes of a pending form with `count` pairs, and of one with a line of
    /// `length` characters.
    static std::size_t pairsBytes(unsigned int count) {
        return sizeof(OxXmlPendingAttributes) + count * sizeof(OxXmlPendingPair);
    }
    static std::size_t lineBytes(std::size_t length) {
        return sizeof(OxXmlPendingAttributes) + kColumnsBytes + length + 1;
    }
};

static_assert(sizeof(OxXmlPendingAttributes) % alignof(void*) == 0,
              "the pairs and the column pointer follow the header aligned");

/// Calls `take(start, length, last)` for each field of `line`, the empty ones
/// included, `last` being true for the field that ends the line. The end of
/// the text is tested before the separator, so every separator value is safe,
/// NUL included (the whole line is then one field). `take` may write a NUL
/// over the separator that ends its field.
template <class Take> void splitCsvFields(char* line, char separator, Take take) {
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

template <class Take> void OxXmlPendingAttributes::forEach(Take take) {
    if (kind == kPairs) {
        OxXmlPendingPair* pair = pairs();
        for (std::uint32_t i = 0; i < count; i++) {
            take(pair[i].name, pair[i].value);
        }
        return;
    }
    // A CSV record: each non-empty field is an attribute named after its
    // position, its value the field trimmed in place (white space alone
    // gives an empty text, as setValue makes it).
    OxCsvColumns const* table = columns();
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
