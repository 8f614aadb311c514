#include "oxbase/doc/detail/OxCsvRecords.h"

#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlStore.h"

#include <cstdio>
#include <new>

namespace oxbase {
namespace detail {

OxCsvRecords::OxCsvRecords(OxXmlStore& recordStore, OxXmlTagRecord& recordRoot,
                           OxGList<char*> const& columnNames, char fieldSeparator)
    : store(recordStore), root(recordRoot), header(columnNames), separator(fieldSeparator) {
    columns = store.newColumns(separator);
    shape = store.csvShape(store.holdText("record"), columns);
}

void OxCsvRecords::cover(unsigned int positions) {
    OxGList<char const*>& names = columns->names;
    while (names.length < positions) {
        unsigned int position = names.length;
        names.reserve(position + 1);
        if (position < header.length) {
            names.append(store.holdText(header.data[position]));
        } else {
            char generated[24];
            std::snprintf(generated, sizeof generated, "column%u", position);
            names.append(store.holdText(generated));
        }
    }
}

void OxCsvRecords::take(char const* line, std::size_t length) {
    // Count the non-empty fields and find the last one's position: the
    // columns must name it before any record refers to it.
    unsigned int count = 0;
    unsigned int position = 0;
    unsigned int covered = 0;
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
    cover(covered);
    OxXmlRecord* record = store.newCsv(shape, count, line, length);
    if (last == nullptr) {
        root.firstChild = record;
    } else {
        last->next = record;
    }
    last = record;
}

} // namespace detail
} // namespace oxbase
