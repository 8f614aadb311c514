#include "oxbase/diag/OxCounters.h"

#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxPrt.h"

#include <cstring>

OxCounter::OxCounter(const char* name) : name(OxString::dup(name)) {}

OxCounter::~OxCounter() {
    delete[] name;
}

void OxCounter::addToCount(int amount) {
    if (amount >= 0) {
        count += static_cast<unsigned int>(amount);
        return;
    }
    // The magnitude in unsigned arithmetic, so that the most negative int has one too.
    unsigned int magnitude = 0u - static_cast<unsigned int>(amount);
    count = magnitude < count ? count - magnitude : 0u;
}

std::ostrstream* OxCounter::dump(std::ostrstream* stream) const {
    if (stream == nullptr) {
        return stream;
    }
    *stream << "Counter name: " << (name != nullptr ? name : OxString::str_null)
            << ", count: " << count << "\n";
    return stream;
}

OxCounters::~OxCounters() {
    for (unsigned int i = 0; i < length; i++) {
        delete data[i];
    }
}

void OxCounters::add(OxCounter* counter) {
    if (counter == nullptr || counter->getName() == nullptr ||
        getByName(counter->getName()) != nullptr) {
        return;
    }
    append(counter);
}

void OxCounters::add(const char* name) {
    if (name == nullptr || getByName(name) != nullptr) {
        return;
    }
    reserve(length + 1); // the room first: append then cannot fail and lose the counter
    append(new OxCounter(name));
}

OxCounter* OxCounters::getByName(const char* name) const {
    if (name == nullptr) {
        return nullptr;
    }
    for (unsigned int i = 0; i < length; i++) {
        OxCounter* counter = data[i];
        if (counter != nullptr && counter->getName() != nullptr &&
            std::strcmp(counter->getName(), name) == 0) {
            return counter;
        }
    }
    return nullptr;
}

unsigned int OxCounters::getCount(const char* name) const {
    const OxCounter* counter = getByName(name);
    return counter != nullptr ? counter->getCount() : 0u;
}

void OxCounters::increment(const char* name) {
    OxCounter* counter = getByName(name);
    if (counter != nullptr) {
        counter->increment();
    }
}

void OxCounters::decrement(const char* name) {
    OxCounter* counter = getByName(name);
    if (counter != nullptr) {
        counter->decrement();
    }
}

void OxCounters::addToCount(const char* name, int amount) {
    OxCounter* counter = getByName(name);
    if (counter != nullptr && amount != 0) {
        counter->addToCount(amount);
    }
}

std::ostrstream* OxCounters::dump(std::ostrstream* stream) const {
    if (stream == nullptr) {
        return stream;
    }
    for (unsigned int i = 0; i < length; i++) {
        const OxCounter* counter = data[i];
        if (counter != nullptr) {
            oxIndent(*stream) << "counter[" << i << "]: ";
            counter->dump(stream);
        }
    }
    return stream;
}
