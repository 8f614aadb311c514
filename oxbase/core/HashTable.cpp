// HashTable.cpp: quadratic probing over a prime-sized array of entry pointers.
#include "oxbase/core/HashTable.h"

#include <cstring>
#include <iostream>

namespace {

/// The text every never-used slot answers to a find.
const OxString& emptyText() {
    static const OxString empty;
    return empty;
}

bool sameText(const OxString& a, const OxString& b) {
    return std::strcmp(a.getString(), b.getString()) == 0;
}

void tracePosition(unsigned int pos) {
    std::cerr << "  currentPos = " << pos << "\n";
}

void traceRef(unsigned int ref) {
    std::cerr << "  array[currentPos].ref = " << ref << "\n";
}

void traceElement(const OxString& text) {
    std::cerr << "  array[currentPos].element = " << text.getString() << "\n";
}

} // namespace

HashTable::~HashTable() {
    releaseTable();
    tableSize = 0;
}

void HashTable::init() {
    releaseTable();
    tableSize = 13;
    allocateTable();
    currentSize = 0;
}

const HashTable& HashTable::operator=(const HashTable& other) {
    if (this == &other) {
        return *this;
    }
    releaseTable();
    tableSize = other.tableSize;
    allocateTable();
    if (array != nullptr && other.array != nullptr) {
        for (unsigned int i = 0; i < tableSize; i++) {
            if (other.array[i] != nullptr) {
                array[i] = new HashEntry;
                array[i]->element = other.array[i]->element;
                array[i]->ref = other.array[i]->ref;
            }
        }
    }
    currentSize = other.currentSize;
    return *this;
}

OxBool HashTable::inUse(unsigned int pos) const {
    return OxToBool(array[pos] != nullptr && array[pos]->ref != 0);
}

unsigned int HashTable::findPos(const OxString& x) const {
    unsigned int pos = x.hash() % tableSize;
    unsigned long long step = 0;
    // The load stays below one half of a prime size, so a free slot comes
    // within tableSize / 2 probes; the bound only guards a table filled by
    // some misuse from probing forever.
    for (unsigned int probes = 0;
         probes < tableSize && inUse(pos) && !sameText(array[pos]->element, x); probes++) {
        step += 2;
        unsigned long long next = static_cast<unsigned long long>(pos) - 1 + step;
        while (next >= tableSize) {
            next -= tableSize;
        }
        pos = static_cast<unsigned int>(next);
    }
    return pos;
}

OxBool HashTable::insert(const OxString& x) {
    if (array == nullptr) {
        init(); // a table that never ran init starts with 13 slots
    }
    unsigned int currentPos = findPos(x);
    tracePosition(currentPos);
    if (inUse(currentPos)) {
        array[currentPos]->ref++;
        traceRef(array[currentPos]->ref);
        traceElement(array[currentPos]->element);
        return OxFalse;
    }
    if (array[currentPos] == nullptr) {
        array[currentPos] = new HashEntry;
    }
    array[currentPos]->element = x;
    array[currentPos]->ref++;
    currentSize++;

    if (currentSize >= tableSize / 2) {
        HashEntry** oldArray = array;
        unsigned int oldSize = tableSize;
        currentSize = 0;
        tableSize = nextPrime(2 * oldSize);
        allocateTable();
        for (unsigned int i = 0; i < oldSize; i++) {
            HashEntry* entry = oldArray[i];
            if (entry == nullptr) {
                continue;
            }
            if (entry->ref != 0) {
                reinsert(entry); // the entry moves, its place in memory stays
            } else {
                delete entry;
            }
        }
        delete[] oldArray;
    }

    // The closing lines read the slot at the position found before any
    // growth, in whatever array is current now.
    const HashEntry* slot = array[currentPos];
    traceRef(slot != nullptr ? slot->ref : 0);
    traceElement(slot != nullptr ? slot->element : emptyText());
    return OxTrue;
}

void HashTable::reinsert(HashEntry* entry) {
    unsigned int pos = findPos(entry->element);
    tracePosition(pos);
    // A fresh array holds no text twice, so the probe ends on a free slot;
    // a never-used one holds no entry that could be lost.
    delete array[pos];
    array[pos] = entry;
    entry->ref = 1;
    currentSize++;
    traceRef(entry->ref);
    traceElement(entry->element);
}

OxBool HashTable::remove(const OxString& x) {
    if (array == nullptr) {
        return OxTrue;
    }
    unsigned int currentPos = findPos(x);
    HashEntry* slot = array[currentPos];
    unsigned int ref = slot != nullptr ? slot->ref : 0;
    tracePosition(currentPos);
    traceRef(ref);
    if (ref != 0) {
        traceElement(slot->element);
        slot->ref--;
    }
    return OxToBool(slot == nullptr || slot->ref == 0);
}

const OxString& HashTable::find(const OxString& x) {
    if (array == nullptr) {
        found = OxFalse;
        return emptyText();
    }
    unsigned int pos = findPos(x);
    found = inUse(pos);
    return array[pos] != nullptr ? array[pos]->element : emptyText();
}

OxBool HashTable::isFound(const OxString& x) const {
    if (array == nullptr) {
        return OxFalse;
    }
    return inUse(findPos(x));
}

const HashEntry* HashTable::findEntry(const OxString& x) {
    if (array == nullptr) {
        found = OxFalse;
        return nullptr;
    }
    unsigned int pos = findPos(x);
    found = inUse(pos);
    return found ? array[pos] : nullptr;
}

unsigned int HashTable::getRef(const OxString& x) const {
    if (array == nullptr) {
        return 0;
    }
    unsigned int pos = findPos(x);
    return inUse(pos) ? array[pos]->ref : 0;
}

void HashTable::makeEmpty() {
    for (unsigned int i = 0; i < tableSize; i++) {
        if (array[i] != nullptr) {
            array[i]->ref = 0;
        }
    }
}

OxBool HashTable::isPrime(unsigned int n) {
    if (n < 9) {
        return OxTrue;
    }
    // 64-bit square so that divisors near 65536 cannot wrap.
    for (unsigned long long divisor = 3; divisor * divisor <= n; divisor += 2) {
        if (n % divisor == 0) {
            return OxFalse;
        }
    }
    return OxTrue;
}

unsigned int HashTable::nextPrime(unsigned int n) {
    if (n % 2 == 0) {
        n++;
    }
    while (!isPrime(n)) {
        n += 2;
    }
    return n;
}

void HashTable::allocateTable() {
    array = tableSize != 0 ? new HashEntry*[tableSize]() : nullptr;
}

void HashTable::releaseTable() {
    if (array != nullptr) {
        for (unsigned int i = 0; i < tableSize; i++) {
            delete array[i];
        }
        delete[] array;
    }
    array = nullptr;
}
