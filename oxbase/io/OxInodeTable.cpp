// OxInodeTable.cpp: per-device sets of inode numbers with quadratic probing.
#include "oxbase/io/OxInodeTable.h"

#include "oxbase/core/HashTable.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/platform/detail/OxPlatformFs.h"

#include <iostream>

using namespace oxbase::detail;

namespace {

const unsigned int initialSize = 13;

bool tracing() {
    return OxPrt::getTraceThreshold() >= 99;
}

} // namespace

// ---- OxInodeDevice ----

OxInodeDevice::OxInodeDevice(std::uint64_t id) : deviceId(id) {
    size = initialSize;
    array = new Slot[size];
}

OxInodeDevice::~OxInodeDevice() {
    delete[] array;
    array = nullptr;
    size = 0;
}

unsigned int OxInodeDevice::findPos(std::uint64_t element) const {
    unsigned int currentPos = static_cast<unsigned int>(element % size);
    unsigned int collisionNum = 0;
    // The load stays below one half of a prime size, so a free slot comes
    // within size / 2 probes; the bound only guards against probing forever.
    while (collisionNum < size && array[currentPos].ref > 0 &&
           array[currentPos].element != element) {
        collisionNum++;
        unsigned long long next =
            static_cast<unsigned long long>(currentPos) + 2ull * collisionNum - 1;
        while (next >= size) {
            next -= size;
        }
        currentPos = static_cast<unsigned int>(next);
    }
    return currentPos;
}

OxBool OxInodeDevice::insert(std::uint64_t element) {
    unsigned int currentPos = findPos(element);
    if (tracing()) {
        std::cerr << "  currentPos = " << currentPos << "\n" << std::flush;
    }
    OxBool result = OxTrue;
    if (array[currentPos].ref > 0) {
        array[currentPos].ref++;
        result = OxFalse;
    } else {
        array[currentPos].element = element;
        array[currentPos].ref = 1;
        count++;
        if (count >= size / 2) {
            Slot* oldArray = array;
            unsigned int oldSize = size;
            size = HashTable::nextPrime(2 * oldSize);
            count = 0;
            array = new Slot[size];
            for (unsigned int i = 0; i < oldSize; i++) {
                if (oldArray[i].ref > 0) {
                    insert(oldArray[i].element);
                }
            }
            delete[] oldArray;
        }
    }
    // The closing lines read the slot at the position found before any
    // growth, in whatever array is current now.
    if (tracing()) {
        std::cerr << "  array[currentPos].ref = " << array[currentPos].ref << "\n"
                  << "  array[currentPos].element = " << array[currentPos].element << "\n"
                  << std::flush;
    }
    return result;
}

OxBool OxInodeDevice::contains(std::uint64_t inode) const {
    if (inode == 0) {
        return OxFalse;
    }
    return OxToBool(array[findPos(inode)].ref > 0);
}

OxBool OxInodeDevice::add(const OxStat* status) {
    if (status == nullptr) {
        return OxTrue;
    }
    if (OxPlatformStatDevice(*status) != deviceId) {
        return OxFalse;
    }
    std::uint64_t inode = OxPlatformStatInode(*status);
    if (inode == 0) {
        return OxTrue;
    }
    if (contains(inode) == OxTrue) {
        return OxFalse;
    }
    insert(inode);
    return OxTrue;
}

OxBool OxInodeDevice::exists(const OxStat* status) const {
    if (status == nullptr || OxPlatformStatDevice(*status) != deviceId) {
        return OxFalse;
    }
    return contains(OxPlatformStatInode(*status));
}

std::ostrstream* OxInodeDevice::dump(std::ostrstream* s) const {
    if (s == nullptr) {
        return s;
    }
    *s << "---- OxInodeDevice\n";
    *s << "device idenitifier: " << deviceId << "\n";
    *s << "Inode table: \n";
    *s << "---- End of OxInodeDevice\n";
    return s;
}

// ---- OxInodeTable ----

OxInodeTable::~OxInodeTable() {
    for (unsigned int i = 0; i < devices.getLength(); i++) {
        delete devices[i];
    }
    devices.makeEmpty();
}

OxInodeDevice* OxInodeTable::find(const OxStat* status) const {
    if (status == nullptr) {
        return nullptr;
    }
    std::uint64_t id = OxPlatformStatDevice(*status);
    for (unsigned int i = 0; i < devices.getLength(); i++) {
        if (devices[i]->getDeviceId() == id) {
            return devices[i];
        }
    }
    return nullptr;
}

OxBool OxInodeTable::add(const OxStat* status) {
    if (status == nullptr) {
        return OxFalse;
    }
    OxInodeDevice* device = find(status);
    if (device == nullptr) {
        devices.reserve(devices.length + 1); // the room first: append cannot fail then
        device = new OxInodeDevice(OxPlatformStatDevice(*status));
        devices.append(device);
    }
    return device->add(status);
}

OxBool OxInodeTable::exists(const OxStat* status) const {
    OxInodeDevice* device = find(status);
    return device != nullptr ? device->exists(status) : OxFalse;
}

std::ostrstream* OxInodeTable::dump(std::ostrstream* s) const {
    if (s == nullptr) {
        return s;
    }
    *s << "---- OxInodeTable\n";
    *s << "Inode tables:\n";
    for (unsigned int i = 0; i < devices.getLength(); i++) {
        devices[i]->dump(s);
    }
    *s << "---- End of OxInodeTable\n";
    return s;
}
