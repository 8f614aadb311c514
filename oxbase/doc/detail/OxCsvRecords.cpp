#include "oxbase/doc/detail/OxCsvRecords.h"

#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlStore.h"

#include <cstdio>
#include <new>

namespace oxbase {
namespace detail {

OxCsvRecords::OxCsvRecords(OxXmlStore& recordStore, OxXmlElement& recordRoot,
                           OxGList<char*> const& columnNames, char fieldSeparator)
    : store(recordStore), root(recordRoot), header(columnNames), separator(fieldSeparator) {
    columns = store.newColumns(separator);
    // Last: nothing to give back should this fail.
    recordName = OxXmlNames::acquire("record", 6);
}

OxCsvRecords::~OxCsvRecords() {
    OxXmlNames::release(recordName);
}

void OxCsvRecords::cover(unsigned int positions) {
    OxGList<char const*>& names = columns->names;
    while (names.length < positions) {
        unsigned int position = names.length;
        char const* name = nullptr;
        if (position < header.length) {
            name = OxXmlNames::acquire(header.data[position]);
        } else {
            char generated[24];
            std::snprintf(generated, sizeof generated, "column%u", position);
            name = OxXmlNames::acquire(generated);
        }
        // The store holds the name for the records; this use goes.
        bool held = withMemory([&] {
            store.holdName(name);
            names.reserve(position + 1);
        });
        OxXmlNames::release(name);
        if (!held) {
            throw std::bad_alloc();
        }
        names.append(name);
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
    OxXmlElement* record = store.newElementShared(recordName);
    bool placed = withMemory([&] {
        store.setPendingLine(record, columns, count, line, length);
        root.addChild(record);
    });
    if (!placed) {
        OxXmlStore::discard(record);
        throw std::bad_alloc();
    }
    record->setParent(&root);
}

} // namespace detail
} // namespace oxbase
