#include "oxbase/doc/detail/OxCsvRecords.h"

#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/detail/OxXmlStore.h"

#include <cstdio>
#include <new>

namespace oxbase {
namespace detail {

OxCsvRecords::OxCsvRecords(OxXmlStore& recordStore, OxXmlElement& recordRoot,
                           OxGList<char*> const& columnNames, char fieldSeparator)
    : store(recordStore), root(recordRoot), columns(columnNames), separator(fieldSeparator) {
    // Last: the lists above are destroyed should this fail.
    recordName = OxXmlNames::acquire("record", 6);
}

OxCsvRecords::~OxCsvRecords() {
    for (unsigned int i = 0; i < fields.length; i++) {
        OxXmlStore::discard(fields.data[i]);
    }
    for (unsigned int i = 0; i < names.length; i++) {
        OxXmlNames::release(names.data[i]);
    }
    OxXmlNames::release(recordName);
}

char const* OxCsvRecords::columnName(unsigned int position) {
    while (names.length <= position) {
        known.reserve(names.length + 1);
        names.append(nullptr);
        known.append(false);
    }
    if (!known.data[position]) {
        if (position < columns.getLength()) {
            names.data[position] = OxXmlNames::acquire(columns.data[position]);
        } else {
            char generated[24];
            std::snprintf(generated, sizeof generated, "column%u", position);
            names.data[position] = OxXmlNames::acquire(generated);
        }
        known.data[position] = true;
    }
    return names.data[position];
}

void OxCsvRecords::take(char* line) {
    OxXmlElement* record = store.newElementShared(recordName);
    if (!withMemory([&] { root.addChild(record); })) {
        OxXmlStore::discard(record);
        throw std::bad_alloc();
    }
    record->setParent(&root);
    unsigned int position = 0;
    splitCsvFields(line, separator, [this, &position](char* start, std::size_t length, bool) {
        if (length != 0) {
            char const* name = columnName(position);
            OxXmlAttribute* field = store.newAttributeShared(name);
            if (!withMemory([&] { fields.append(field); })) {
                OxXmlStore::discard(field);
                throw std::bad_alloc();
            }
            store.setValue(field, start, length);
        }
        position++;
    });
    store.addAttributes(record, fields.data, fields.length);
    fields.length = 0; // the record has them
}

} // namespace detail
} // namespace oxbase
