#include "oxbase/io/OxOutput.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/detail/OxByteOrder.h"
#include "oxbase/platform/detail/OxPlatformFs.h"
#include "oxbase/platform/detail/OxPlatformPath.h"

#include <cstring>
#include <string>

using namespace oxbase::detail;

namespace {

constexpr int kErrorNoEntry = 2; // ENOENT on every platform the library serves

const char* nameText(const char* name) {
    return name != nullptr ? name : "";
}

/// Whether something at `path` is removed before the open: whatever exists
/// there except a device, FIFO or socket, which is opened as it stands, so
/// that writing to /dev/null or to a pipe never turns it into a regular file.
/// A symbolic link is removed itself, never what it points to; a directory
/// cannot be removed this way and gives 182.
bool isReplaceable(const char* path) {
    OxStat status;
    return OxPlatformLinkStat(path, &status) == 0 && !OxPlatformIsSpecialMode(status);
}

} // namespace

OxOutput::OxOutput(const char* name, OxFile::FILE_MODE mode) : OxFile(name), stream(nullptr) {
    const char* text = nameText(filename);
    // The directory part ends at the last separator ('\\', and '/' on POSIX).
    const char* last = nullptr;
    for (const char* c = text; *c != '\0'; c++) {
        if (OxPlatformIsSeparator(*c)) {
            last = c;
        }
    }
    if (last != nullptr) {
        std::string directory(text, static_cast<size_t>(last - text));
        OxStat status;
        if (OxPlatformStat(directory.c_str(), &status) != 0) {
            if (OxPlatformErrno() == kErrorNoEntry && OxPlatformMkdir(directory.c_str()) != 0) {
                std::string error = OxPlatformErrorText(OxPlatformErrno());
                OxMsg::Log(OxMsgDirectoryCreate, directory.c_str(), error.c_str());
                return;
            }
        } else if (!OxPlatformIsDirectoryMode(status)) {
            OxMsg::Log(OxMsgNotADirectory, directory.c_str());
            return;
        } else if (isReplaceable(text) && OxPlatformRemove(text) != 0) {
            OxMsg::Log(OxMsgFileRemoveExisting, text);
            return;
        }
    }
    stream = OxPlatformOpenOutput(text, mode == FILE_MODE_BINARY);
    if (!stream->good()) {
        OxMsg::Log(OxMsgFileOpen, text);
        readState();
        delete stream;
        stream = nullptr;
    }
}

OxOutput::~OxOutput() {
    if (stream == nullptr) {
        return;
    }
    bool wasGood = stream->good();
    stream->close();
    if (wasGood && !stream->good()) {
        OxMsg::Log(OxMsgFileClose, nameText(filename));
    }
    delete stream;
}

OxBool OxOutput::flush() {
    if (!hasStream()) {
        return OxFalse;
    }
    stream->flush();
    return checkState();
}

OxBool OxOutput::close() {
    if (!hasStream()) {
        return OxFalse;
    }
    // ofstream::close flushes first and sets the failure flag when either
    // the flush or the close of the file fails.
    stream->close();
    OxBool result = checkState();
    delete stream;
    stream = nullptr;
    return result;
}

OxBool OxOutput::hasStream() const {
    if (stream == nullptr) {
        OxMsg::Log(OxMsgFileWrite, nameText(filename));
        return OxFalse;
    }
    return OxTrue;
}

OxBool OxOutput::checkState() const {
    if (!stream->good()) {
        OxMsg::Log(OxMsgFileWrite, nameText(filename));
        readState();
        return OxFalse;
    }
    return OxTrue;
}

OxBool OxOutput::writeValueBytes(const unsigned char* bytes, unsigned int size) {
    if (!hasStream() || !checkState()) {
        return OxFalse;
    }
    // What ostream::write does, without its sentry: the state is known to be
    // clean and the stream has no tie, so only the buffer write remains.
    std::streamsize count = static_cast<std::streamsize>(size);
    if (stream->rdbuf()->sputn(reinterpret_cast<const char*>(bytes), count) != count) {
        stream->setstate(std::ios_base::badbit);
    }
    return checkState();
}

OxBool OxOutput::write(char value) {
    unsigned char bytes[1] = {static_cast<unsigned char>(value)};
    return writeValueBytes(bytes, 1);
}

OxBool OxOutput::write(unsigned char value) {
    return writeValueBytes(&value, 1);
}

template <class T> OxBool OxOutput::writeNumber(T value) {
    unsigned char bytes[sizeof(T)];
    OxByteOrder::toBigEndian(bytes, value);
    return writeValueBytes(bytes, sizeof(T));
}

OxBool OxOutput::write(short value) {
    return writeNumber(value);
}

OxBool OxOutput::write(unsigned short value) {
    return writeNumber(value);
}

OxBool OxOutput::write(int value) {
    return writeNumber(value);
}

OxBool OxOutput::write(unsigned int value) {
    return writeNumber(value);
}

OxBool OxOutput::write(float value) {
    return writeNumber(value);
}

OxBool OxOutput::write(double value) {
    return writeNumber(value);
}

OxBool OxOutput::writeBlock(const char* buffer, long long length) {
    // The stream takes the length as a signed 32-bit count.
    std::int32_t count = static_cast<std::int32_t>(static_cast<std::uint32_t>(length));
    if (!hasStream()) {
        return OxFalse;
    }
    if (count < 0 || (buffer == nullptr && count != 0)) {
        OxMsg::Log(OxMsgFileWrite, nameText(filename));
        return OxFalse;
    }
    stream->write(buffer, static_cast<std::streamsize>(count));
    return checkState();
}

OxBool OxOutput::write(char* buffer, long long length) {
    return writeBlock(buffer, length);
}

OxBool OxOutput::write(unsigned char* buffer, long long length) {
    return writeBlock(reinterpret_cast<const char*>(buffer), length);
}

OxBool OxOutput::write(const char* buffer, long long length) {
    return writeBlock(buffer, length);
}

OxBool OxOutput::write(const unsigned char* buffer, long long length) {
    return writeBlock(reinterpret_cast<const char*>(buffer), length);
}

OxBool OxOutput::putline(const char* text) {
    if (text == nullptr) {
        return OxTrue;
    }
    if (!hasStream()) {
        return OxFalse;
    }
    stream->write(text, static_cast<std::streamsize>(std::strlen(text)));
    stream->put('\n');
    stream->flush();
    return checkState();
}

OxBool OxOutput::putline(const unsigned char* text) {
    return putline(reinterpret_cast<const char*>(text));
}

OxBool OxOutput::isGood() const {
    return OxToBool(stream != nullptr && stream->good());
}

std::fpos<int> OxOutput::getFilePosition() const {
    if (stream == nullptr) {
        return std::fpos<int>(std::streamoff(-1));
    }
    return std::fpos<int>(std::streamoff(stream->tellp()));
}

OxBool OxOutput::seek(int offset, unsigned int direction) {
    if (stream == nullptr) {
        return OxFalse;
    }
    std::ios_base::seekdir way;
    switch (direction) {
    case 0:
        way = std::ios_base::beg;
        break;
    case 1:
        way = std::ios_base::cur;
        break;
    case 2:
        way = std::ios_base::end;
        break;
    default:
        OxMsg::Log(OxMsgFileWrite, nameText(filename));
        return OxFalse;
    }
    std::streampos position = stream->rdbuf()->pubseekoff(offset, way, std::ios_base::out);
    return OxToBool(position != std::streampos(std::streamoff(-1)));
}

std::ostrstream* OxOutput::dump(std::ostrstream* out) const {
    if (out != nullptr) {
        *out << "OxOutput (Binary File):" << '\n';
    }
    return out;
}

void OxOutput::readState() const {
    if (stream == nullptr) {
        return;
    }
    logStreamState(stream->rdstate());
}
