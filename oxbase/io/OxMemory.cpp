#include "oxbase/io/OxMemory.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/detail/OxByteOrder.h"

#include <cstdint>
#include <cstring>

using namespace oxbase::detail;

OxMemory::OxMemory(unsigned char* bytes, unsigned int size)
    : buffer(bytes), length(bytes != nullptr ? size : 0), current(bytes) {}

OxMemory::~OxMemory() {}

bool OxMemory::fits(size_t size) const {
    // Strictly below the length: the last byte is never handed out.
    size_t offset = static_cast<size_t>(current - buffer);
    if (buffer == nullptr || offset >= length || size >= length - offset) {
        OxMsg::Log(OxMsgMemoryPastEnd);
        return false;
    }
    return true;
}

int OxMemory::read(char& value) {
    if (!fits(1)) {
        return 0;
    }
    value = static_cast<char>(*current++);
    return 1;
}

int OxMemory::read(unsigned char& value) {
    if (!fits(1)) {
        return 0;
    }
    value = *current++;
    return 1;
}

template <class T> int OxMemory::readNumber(T& value) {
    if (!fits(sizeof(T))) {
        return 0;
    }
    value = OxByteOrder::fromBigEndian<T>(current);
    current += sizeof(T);
    return static_cast<int>(sizeof(T));
}

int OxMemory::read(short& value) {
    return readNumber(value);
}

int OxMemory::read(unsigned short& value) {
    return readNumber(value);
}

int OxMemory::read(int& value) {
    return readNumber(value);
}

int OxMemory::read(unsigned int& value) {
    return readNumber(value);
}

int OxMemory::read(float& value) {
    return readNumber(value);
}

int OxMemory::read(double& value) {
    return readNumber(value);
}

int OxMemory::read(char* target, unsigned int count) {
    return read(reinterpret_cast<unsigned char*>(target), count);
}

int OxMemory::read(unsigned char* target, unsigned int count) {
    if (!fits(count)) {
        return 0;
    }
    if (count != 0) {
        if (target == nullptr) {
            OxMsg::Log(OxMsgMemoryPastEnd);
            return 0;
        }
        std::memcpy(target, current, count);
        current += count;
    }
    return static_cast<int>(count);
}

OxBool OxMemory::seek(size_t offset, OxMemory::DIR direction) {
    // Where a clamped seek past the end lands: the last byte (the start of
    // an empty buffer).
    unsigned char* last = length != 0 ? buffer + (length - 1) : buffer;
    if (direction == DIR_CURRENT) {
        std::uint64_t now = static_cast<std::uint64_t>(current - buffer);
        std::uint64_t target = now + static_cast<std::uint64_t>(offset);
        if (static_cast<std::int64_t>(target) < 0) {
            current = buffer;
            OxMsg::Log(OxMsgMemoryBeforeStart);
            return OxFalse;
        }
        if (target >= length) {
            current = last;
            OxMsg::Log(OxMsgMemoryBeyondEnd);
            return OxFalse;
        }
        current = buffer + target;
        return OxTrue;
    }
    if (direction == DIR_BEGIN) {
        if (offset > length) {
            current = last;
            OxMsg::Log(OxMsgMemoryBeyondEnd);
            return OxFalse;
        }
        current = buffer + offset;
        return OxTrue;
    }
    return OxTrue;
}

std::ostrstream* OxMemory::dump(std::ostrstream* stream) const {
    return stream;
}
