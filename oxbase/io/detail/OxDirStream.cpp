// OxDirStream.cpp: directory streams over the platform's find handles.
#include "oxbase/io/detail/OxDirStream.h"

#include "oxbase/core/detail/OxKeepErrno.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/platform/detail/OxPlatformDir.h"

#include <cerrno>
#include <climits>
#include <cstring>
#include <iostream>
#include <new>

namespace oxbase {
namespace detail {

namespace {

void setEntry(OxDirStream* stream, const char* name) {
    stream->d_name = const_cast<char*>(name);
    size_t length = std::strlen(name);
    stream->d_namlen = static_cast<short>(length > SHRT_MAX ? SHRT_MAX : length);
}

} // namespace

OxDirStream* OxDirStream::opendir(const char* name) {
    if (name == nullptr || name[0] == '\0') {
        errno = EINVAL;
        return nullptr;
    }
    size_t length = std::strlen(name);
    bool endsInSeparator = name[length - 1] == '/' || name[length - 1] == '\\';
    char* pattern = nullptr;
    OxDirStream* stream = nullptr;
    if (!withMemory([&] {
            pattern = new char[length + 3];
            stream = new OxDirStream;
        })) {
        delete[] pattern;
        errno = ENOMEM;
        return nullptr;
    }
    // NOLINTNEXTLINE(bugprone-not-null-terminated-result): strcpy below terminates it
    std::memcpy(pattern, name, length);
    std::strcpy(pattern + length, endsInSeparator ? "*" : "/*");
    stream->pattern = pattern;

    const char* first = nullptr;
    if (!withMemory([&] { stream->handle = OxPlatformFindFirst(pattern, &first); })) {
        delete[] stream->pattern;
        delete stream;
        errno = ENOMEM;
        return nullptr;
    }
    if (stream->handle == nullptr) {
        OxKeepErrno keep; // the listing's own errno goes to the caller
        if (OxPrt::getTraceThreshold() >= 99) {
            std::cerr << "opendir: _findfirst failed to locate \"" << pattern << "\"\n"
                      << std::flush;
        }
        delete[] stream->pattern;
        delete stream;
        return nullptr;
    }
    stream->pending = first; // the platform keeps it until the next call on the handle
    return stream;
}

OxDirStream* OxDirStream::readdir(OxDirStream* stream) {
    if (stream == nullptr) {
        return nullptr;
    }
    if (stream->handle == nullptr) {
        errno = EBADF;
        return nullptr;
    }
    const char* name = nullptr;
    if (stream->pending != nullptr) {
        name = stream->pending;
        stream->pending = nullptr;
    } else if (OxPlatformFindNext(stream->handle, &name) != 0) {
        return nullptr;
    }
    setEntry(stream, name);
    return stream;
}

int OxDirStream::closedir(OxDirStream* stream) {
    if (stream == nullptr) {
        errno = EBADF;
        return -1;
    }
    int result = stream->handle != nullptr ? OxPlatformFindClose(stream->handle) : 0;
    delete[] stream->pattern;
    delete stream;
    if (result == -1) {
        errno = EBADF;
    }
    return result;
}

} // namespace detail
} // namespace oxbase
