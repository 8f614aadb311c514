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
    // The columns must name the last non-empty field before any record
    // refers to it.
    unsigned int count = 0;
    unsigned int covered = 0;
    countCsvFields(line, length, separator, count, covered);
    cover(covered);
    if (last != nullptr && store.addCsvLine(last, line, length)) {
        return;
    }
    OxXmlCsvBlock* block = store.newCsvBlock(shape, line, length);
    if (last == nullptr) {
        root.first = block;
    } else {
        last->next = block;
    }
    last = block;
}

} // namespace detail
} // namespace oxbase
