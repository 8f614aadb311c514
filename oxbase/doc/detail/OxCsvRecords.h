// OxCsvRecords.h: the records of a CSV read, left in the document's store.
//
// Each data line becomes an element "record" under the root, with one
// attribute per non-empty field named after its column. A record is left in
// the store (OxXmlStore) as its trimmed line, in blocks of consecutive
// lines (OxXmlCsvBlock): the elements and their attributes are built only
// when a caller asks for them, so that reading a line costs a scan and a
// copy. Each column's name is looked up
// once per read.
//
//   OxCsvRecords records(store, *rootRecord, columnNames, ',');
//   records.take(line, length);   // a trimmed line, neither blank nor a comment
#ifndef OXBASE_DOC_DETAIL_OXCSVRECORDS_H
#define OXBASE_DOC_DETAIL_OXCSVRECORDS_H

#include "oxbase/core/OxGList.h"
#include "oxbase/doc/detail/OxXmlRecords.h"

#include <cstddef>

namespace oxbase {
namespace detail {

class OxXmlStore;

class OxCsvRecords {
public:
    /// Records go under `root` (a record of `store`), their fields are named
    /// by `columnNames` as they are now (a field behind the last name is
    /// "column<N>", N its zero-based position). Both must outlive this
    /// object; the names taken from `columnNames` stay with the store.
    OxCsvRecords(OxXmlStore& store, OxXmlTagRecord& root, OxGList<char*> const& columnNames,
                 char separator);
    OxCsvRecords(const OxCsvRecords&) = delete;
    OxCsvRecords& operator=(const OxCsvRecords&) = delete;
    ~OxCsvRecords() = default;

    /// Adds the record of the `length` characters at `line` (trimmed, no NUL
    /// among them). Without memory std::bad_alloc, and no part of the record
    /// stays.
    void take(char const* line, std::size_t length);

private:
    /// Makes the column table name every position below `positions`.
    void cover(unsigned int positions);

    OxXmlStore& store;
    OxXmlTagRecord& root;
    OxXmlCsvBlock* last = nullptr; ///< the last block so far
    OxGList<char*> const& header;
    OxCsvColumns* columns = nullptr;
    char separator;
    OxXmlShape const* shape = nullptr; ///< "record", the columns
};

} // namespace detail
} // namespace oxbase

#endif
