#include "oxbase/io/OxInput.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/io/detail/OxByteOrder.h"
#include "oxbase/platform/detail/OxPlatformFs.h"

#include <algorithm>
#include <cstring>

using namespace oxbase::detail;

using OxByteOrder::bitCast;

namespace {

constexpr unsigned int kHexBlock = 2048;

std::ios_base::seekdir seekDirection(unsigned int direction, bool& valid) {
    valid = true;
    switch (direction) {
    case 0:
        return std::ios_base::beg;
    case 1:
        return std::ios_base::cur;
    case 2:
        return std::ios_base::end;
    default:
        valid = false;
        return std::ios_base::beg;
    }
}

} // namespace

double swapd(double value) {
    return bitCast<double>(OxByteOrder::swap64(bitCast<std::uint64_t>(value)));
}

float swapf(float value) {
    return bitCast<float>(OxByteOrder::swap32(bitCast<std::uint32_t>(value)));
}

OxInput::OxInput(const char* name, OxFile::FILE_MODE mode)
    : OxFile(name), stream(nullptr), fileLength(0) {
    const char* text = filename != nullptr ? filename : "";
    stream = OxPlatformOpenInput(text, mode == FILE_MODE_BINARY);
    if (!stream->good()) {
        OxMsg::Log(OxMsgFileOpen, text);
        readState();
        delete stream;
        stream = nullptr;
        return;
    }
    std::streambuf* buffer = stream->rdbuf();
    std::streampos end = buffer->pubseekoff(0, std::ios_base::end, std::ios_base::in);
    if (end == std::streampos(std::streamoff(-1))) {
        OxMsg::Log(OxMsgFileShortRead, text);
        return;
    }
    fileLength = static_cast<long long>(std::streamoff(end));
    if (buffer->pubseekoff(0, std::ios_base::beg, std::ios_base::in) ==
        std::streampos(std::streamoff(-1))) {
        OxMsg::Log(OxMsgFileShortRead, text);
    }
}

OxInput::~OxInput() {
    if (stream != nullptr) {
        stream->close();
        delete stream;
    }
}

bool OxInput::readValueBytes(unsigned char* bytes, unsigned int size, long long& result) {
    const char* text = filename != nullptr ? filename : "";
    result = 0;
    if (stream == nullptr) {
        OxMsg::Log(OxMsgFileRead, text);
        return false;
    }
    if (!stream->good()) {
        OxMsg::Log(OxMsgFileRead, text);
        readState();
        return false;
    }
    // What istream::read does, without its sentry: the state is known to be
    // clean and the stream has no tie, so only the buffer read remains.
    long long delivered = static_cast<long long>(
        stream->rdbuf()->sgetn(reinterpret_cast<char*>(bytes), static_cast<std::streamsize>(size)));
    if (delivered != static_cast<long long>(size)) {
        stream->setstate(std::ios_base::eofbit | std::ios_base::failbit);
        OxMsg::Log(OxMsgFileRead, text);
        readState();
        result = delivered;
        return false;
    }
    result = size;
    return true;
}

bool OxInput::readUnit(unsigned char* unit, long long& result) {
    return readValueBytes(unit, 2, result);
}

template <class T> long long OxInput::readNumber(T& value) {
    unsigned char bytes[sizeof(T)];
    long long result;
    if (readValueBytes(bytes, sizeof(T), result)) {
        value = OxByteOrder::fromBigEndian<T>(bytes);
    }
    return result;
}

long long OxInput::read(char& value) {
    return readNumber(value);
}
long long OxInput::read(unsigned char& value) {
    return readNumber(value);
}
long long OxInput::read(short& value) {
    return readNumber(value);
}
long long OxInput::read(unsigned short& value) {
    return readNumber(value);
}
long long OxInput::read(int& value) {
    return readNumber(value);
}
long long OxInput::read(unsigned int& value) {
    return readNumber(value);
}
long long OxInput::read(float& value) {
    return readNumber(value);
}
long long OxInput::read(double& value) {
    return readNumber(value);
}

long long OxInput::read(long long& value) {
    // The 64-bit form of the layout is an unsigned 32-bit value on disk.
    std::uint32_t onDisk = 0;
    long long result = readNumber(onDisk);
    if (result == 4) {
        value = static_cast<long long>(onDisk);
    }
    return result;
}

long long OxInput::read(char* buffer, unsigned int length) {
    const char* text = filename != nullptr ? filename : "";
    if (stream == nullptr || (buffer == nullptr && length != 0)) {
        OxMsg::Log(OxMsgFileRead, text);
        return 0;
    }
    stream->read(buffer, static_cast<std::streamsize>(length));
    long long delivered = static_cast<long long>(stream->gcount());
    if (!stream->good()) {
        OxMsg::Log(OxMsgFileRead, text);
        readState();
        return 0;
    }
    if (delivered != static_cast<long long>(length)) {
        OxMsg::Log(OxMsgFileShortRead, text);
        return delivered;
    }
    return length;
}

long long OxInput::read(unsigned char* buffer, unsigned int length) {
    return read(reinterpret_cast<char*>(buffer), length);
}

long long OxInput::readText(char* buffer, unsigned int length) {
    const char* text = filename != nullptr ? filename : "";
    if (stream == nullptr || (buffer == nullptr && length != 0)) {
        OxMsg::Log(OxMsgFileRead, text);
        return 0;
    }
    if (!stream->good()) {
        OxMsg::Log(OxMsgFileRead, text);
        readState();
        return 0;
    }
    stream->read(buffer, static_cast<std::streamsize>(length));
    if (stream->bad()) {
        OxMsg::Log(OxMsgFileRead, text);
        readState();
        return 0;
    }
    // A short read has set the end-of-file and failure flags, as a line
    // read at the end of a file does: the stream is done, not broken.
    return static_cast<long long>(stream->gcount());
}

long long OxInput::readUStoC(char* buffer, unsigned int count, unsigned int& stored) {
    stored = 0;
    if (buffer == nullptr && count != 0) {
        OxMsg::Log(OxMsgFileRead, filename != nullptr ? filename : "");
        return 0;
    }
    if (count == 0) {
        return 0;
    }
    for (unsigned int i = 0; i < count; i++) {
        unsigned char unit[2];
        long long result;
        if (!readUnit(unit, result)) {
            return result;
        }
        buffer[i] = static_cast<char>(unit[1] & 0x7f);
        stored++;
    }
    return 2LL * count;
}

long long OxInput::readDECUStoC(char* buffer, unsigned int count, unsigned int& stored) {
    stored = 0;
    if (buffer == nullptr && count != 0) {
        OxMsg::Log(OxMsgFileRead, filename != nullptr ? filename : "");
        return 0;
    }
    unsigned int units = (count + 1u) >> 1;
    if (units == 0) {
        return 0;
    }
    for (unsigned int u = 0; u < units; u++) {
        unsigned char unit[2];
        long long result;
        if (!readUnit(unit, result)) {
            return result;
        }
        buffer[2 * static_cast<size_t>(u)] = static_cast<char>(unit[0] & 0x7f);
        buffer[2 * static_cast<size_t>(u) + 1] = static_cast<char>(unit[1] & 0x7f);
        stored += (u + 1 == units && (count & 1u) != 0) ? 1 : 2;
    }
    return units;
}

OxBool OxInput::getline(char* buffer, unsigned int size, char delimiter) {
    if (stream == nullptr || buffer == nullptr) {
        OxMsg::Log(OxMsgFileRead, filename != nullptr ? filename : "");
        return OxFalse;
    }
    stream->getline(buffer, static_cast<std::streamsize>(size), delimiter);
    return OxToBool(stream->good());
}

OxBool OxInput::eof() const {
    return OxToBool(stream != nullptr && stream->eof());
}

OxBool OxInput::isGood() const {
    return OxToBool(stream != nullptr && stream->good());
}

long long OxInput::getFilePosition() const {
    if (stream == nullptr || stream->fail()) {
        return -1;
    }
    // Asked of the buffer: the stream's tellg would set the failure flag
    // once the end-of-file flag is set.
    std::streampos position = stream->rdbuf()->pubseekoff(0, std::ios_base::cur, std::ios_base::in);
    return static_cast<long long>(std::streamoff(position));
}

OxBool OxInput::seek(int offset, unsigned int direction) {
    if (stream == nullptr) {
        return OxFalse;
    }
    bool valid;
    std::ios_base::seekdir way = seekDirection(direction, valid);
    if (!valid) {
        OxMsg::Log(OxMsgFileShortRead, filename != nullptr ? filename : "");
        return OxFalse;
    }
    std::streampos position =
        stream->rdbuf()->pubseekoff(offset, way, std::ios_base::in | std::ios_base::out);
    return OxToBool(position != std::streampos(std::streamoff(-1)));
}

OxBool OxInput::hexDump(std::ostrstream* out) {
    if (fileLength < 1 || out == nullptr) {
        return OxFalse;
    }
    if (seek(0, 0) != OxTrue) {
        OxMsg::Log(OxMsgFileShortRead, filename != nullptr ? filename : "");
        return OxFalse;
    }
    *out << "OxInput (Binary File):" << '\n';
    unsigned char* block = new unsigned char[kHexBlock];
    const std::uint32_t limit = static_cast<std::uint32_t>(fileLength);
    std::uint32_t offset = 0;
    while (eof() != OxTrue && offset < limit) {
        std::memset(block, 0, kHexBlock);
        unsigned int want = std::min<std::uint32_t>(kHexBlock, limit - offset);
        long long got = read(block, want);
        if (got <= 0) {
            break; // a failed stream delivers nothing more: do not spin
        }
        OxPrt::printHex(out, block, static_cast<size_t>(got), offset);
        offset += static_cast<std::uint32_t>(got);
    }
    delete[] block;
    return OxTrue;
}

std::ostrstream* OxInput::dump(std::ostrstream* out) const {
    if (out != nullptr) {
        *out << "OxInput (Binary File):" << '\n';
    }
    return out;
}

void OxInput::readState() const {
    if (stream == nullptr) {
        return;
    }
    logStreamState(stream->rdstate());
}
