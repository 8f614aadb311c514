// OxCsvRecords.h: the records of a CSV read, built in the document's store.
//
// Each data line becomes an element "record" under the root, with one
// attribute per non-empty field named after its column. The record, its
// attributes, their values and the attribute list are carved out of the
// store (OxXmlStore) one behind the other, without a heap block per field,
// and the names are shared: each column's name is looked up once per read.
//
//   OxCsvRecords records(store, *root, columnNames, ',');
//   records.take(line);   // a trimmed line that is neither blank nor a comment
#ifndef OXBASE_DOC_DETAIL_OXCSVRECORDS_H
#define OXBASE_DOC_DETAIL_OXCSVRECORDS_H

#include "oxbase/core/OxGList.h"

#include <cstddef>

class OxXmlAttribute;
class OxXmlElement;

namespace oxbase {
namespace detail {

class OxXmlStore;

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

class OxCsvRecords {
public:
    /// Records go under `root` (a node of `store`), their fields are named
    /// by `columnNames` (a field behind the last name is "column<N>", N its
    /// zero-based position). Both must outlive this object.
    OxCsvRecords(OxXmlStore& store, OxXmlElement& root, OxGList<char*> const& columnNames,
                 char separator);
    OxCsvRecords(const OxCsvRecords&) = delete;
    OxCsvRecords& operator=(const OxCsvRecords&) = delete;
    /// Gives back the names it looked up; fields of a record left unfinished
    /// by std::bad_alloc are destroyed.
    ~OxCsvRecords();

    /// Adds the record of `line` (NUL-terminated; a NUL is written over the
    /// separator behind each field). Without memory std::bad_alloc, and no
    /// part of the record stays.
    void take(char* line);

private:
    /// The shared name of the field at `position`, looked up once per read.
    char const* columnName(unsigned int position);

    OxXmlStore& store;
    OxXmlElement& root;
    OxGList<char*> const& columns;
    char separator;
    char const* recordName = nullptr;
    OxGList<char const*> names;      ///< one use held of each, null while not looked up
    OxGList<bool> known;             ///< whether names[i] was looked up
    OxGList<OxXmlAttribute*> fields; ///< the record in progress
};

} // namespace detail
} // namespace oxbase

#endif
