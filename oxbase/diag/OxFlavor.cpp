#include "oxbase/diag/OxFlavor.h"

#include "oxbase/core/OxString.h"

#include <cstring>

OxFlavorEntry::OxFlavorEntry(const char* name, unsigned int id) {
    if (name == nullptr) {
        return;
    }
    this->name = OxString::dup(name);
    this->id = id;
}

OxFlavorEntry::~OxFlavorEntry() {
    delete[] name;
}

std::ostrstream* OxFlavorEntry::dump(std::ostrstream* stream) const {
    if (stream == nullptr || name == nullptr) {
        return stream;
    }
    *stream << "Flavor ID = " << id << ", name = \"" << name << "\"\n";
    return stream;
}

OxFlavor::OxFlavor(const OxGList<OxFlavorEntry*>& flavors) {
    for (unsigned int i = 0; i < flavors.getLength(); i++) {
        const OxFlavorEntry* entry = flavors[i];
        entries.append(entry != nullptr ? new OxFlavorEntry(entry->getName(), entry->getID())
                                        : nullptr);
    }
}

OxFlavor::~OxFlavor() {
    for (unsigned int i = 0; i < entries.getLength(); i++) {
        delete entries[i];
    }
}

OxBool OxFlavor::convertToID(const char* name, unsigned int& number) const {
    if (name == nullptr) {
        return OxFalse;
    }
    for (unsigned int i = 0; i < entries.getLength(); i++) {
        const OxFlavorEntry* entry = entries[i];
        if (entry != nullptr && entry->getName() != nullptr &&
            std::strcmp(entry->getName(), name) == 0) {
            number = i;
            return OxTrue;
        }
    }
    return OxFalse;
}

OxBool OxFlavor::addFlavor(const char* name) {
    unsigned int number = 0;
    if (convertToID(name, number) == OxFalse) {
        return OxFalse;
    }
    addFlavor(number);
    return OxTrue;
}

void OxFlavor::addFlavor(unsigned int number) {
    if (isSet(number) == OxFalse) {
        active.append(number);
    }
}

OxBool OxFlavor::isSet(unsigned int number) const {
    for (unsigned int i = 0; i < active.getLength(); i++) {
        if (active[i] == number) {
            return OxTrue;
        }
    }
    return OxFalse;
}

void OxFlavor::clear() {
    active.makeEmpty();
}

std::ostrstream* OxFlavor::dump(std::ostrstream* stream) const {
    if (stream == nullptr || active.getLength() == 0) {
        return stream;
    }
    *stream << "Active flavors:"
            << "\n";
    for (unsigned int i = 0; i < active.getLength(); i++) {
        unsigned int number = active[i];
        const char* name = nullptr;
        if (number < entries.getLength()) {
            const OxFlavorEntry* entry = entries[number];
            name = entry != nullptr ? entry->getName() : nullptr;
        } else if (number > entries.getLength()) {
            // The list's own report of an access beyond its end; the slot
            // itself is not touched.
            oxbase::detail::reportListRange(number, entries.getLength());
        }
        *stream << "  " << (name != nullptr ? name : OxString::str_null) << "\n";
    }
    return stream;
}
