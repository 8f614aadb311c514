#include "oxbase/platform/detail/OxPlatformFs.h"

#include "oxbase/platform/detail/OxPlatformPath.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#ifdef _WIN32
#include <direct.h>
#include <io.h>
#ifdef _MSC_VER
#include <share.h>
#endif
#else
#include <unistd.h>
#endif

namespace oxbase {
namespace detail {

int OxPlatformStat(const char* path, OxStat* status) {
    if (path == nullptr || status == nullptr) {
        errno = ENOENT;
        return -1;
    }
#ifdef _WIN32
    return _stat64i32(path, status);
#else
    return ::stat(OxPlatformNativePath(path).c_str(), status);
#endif
}

int OxPlatformLinkStat(const char* path, OxStat* status) {
    if (path == nullptr || status == nullptr) {
        errno = ENOENT;
        return -1;
    }
#ifdef _WIN32
    return _stat64i32(path, status);
#else
    return ::lstat(OxPlatformNativePath(path).c_str(), status);
#endif
}

unsigned int OxPlatformStatMode(const OxStat& status) {
    return static_cast<unsigned int>(status.st_mode);
}

std::uint64_t OxPlatformStatDevice(const OxStat& status) {
    return static_cast<std::uint64_t>(status.st_dev);
}

std::uint64_t OxPlatformStatInode(const OxStat& status) {
    return static_cast<std::uint64_t>(status.st_ino);
}

bool OxPlatformIsDirectoryMode(const OxStat& status) {
    return (OxPlatformStatMode(status) & OxStatTypeMask) == OxStatTypeDirectory;
}

bool OxPlatformIsRegularMode(const OxStat& status) {
    return (OxPlatformStatMode(status) & OxStatTypeMask) == OxStatTypeRegular;
}

bool OxPlatformIsSpecialMode(const OxStat& status) {
#ifdef _WIN32
    return (status.st_mode & _S_IFMT) == _S_IFCHR;
#else
    return S_ISCHR(status.st_mode) || S_ISBLK(status.st_mode) || S_ISFIFO(status.st_mode) ||
           S_ISSOCK(status.st_mode);
#endif
}

int OxPlatformMkdir(const char* path) {
    if (path == nullptr) {
        errno = ENOENT;
        return -1;
    }
#ifdef _WIN32
    return _mkdir(path);
#else
    return ::mkdir(OxPlatformNativePath(path).c_str(), 0777);
#endif
}

int OxPlatformUnlink(const char* path) {
    if (path == nullptr) {
        errno = ENOENT;
        return -1;
    }
#ifdef _WIN32
    return _unlink(path);
#else
    return ::unlink(OxPlatformNativePath(path).c_str());
#endif
}

int OxPlatformRemove(const char* path) {
    if (path == nullptr) {
        errno = ENOENT;
        return -1;
    }
#ifdef _WIN32
    return std::remove(path);
#else
    // The runtime's remove on Windows removes files only; POSIX remove would
    // also take an empty directory, so unlink keeps the home platform's rule.
    return ::unlink(OxPlatformNativePath(path).c_str());
#endif
}

int OxPlatformChdir(const char* path) {
    if (path == nullptr) {
        errno = ENOENT;
        return -1;
    }
#ifdef _WIN32
    return _chdir(path);
#else
    return ::chdir(OxPlatformNativePath(path).c_str());
#endif
}

char* OxPlatformGetDriveCwd(char* buffer, int size, unsigned int drive) {
    if (buffer == nullptr || size <= 0) {
        errno = EINVAL;
        return nullptr;
    }
#ifdef _WIN32
    return _getdcwd(static_cast<int>(drive), buffer, size);
#else
    (void)drive;
    return ::getcwd(buffer, static_cast<size_t>(size));
#endif
}

unsigned int OxPlatformGetDrive() {
#ifdef _WIN32
    return static_cast<unsigned int>(_getdrive());
#else
    return 0;
#endif
}

int OxPlatformErrno() {
    return errno;
}

void OxPlatformSetErrno(int value) {
    errno = value;
}

std::string OxPlatformErrorText(int errorNumber) {
#ifdef _WIN32
    char text[256] = {0};
    strerror_s(text, sizeof text, errorNumber);
    return text;
#else
    // strerror is not reentrant, but the library runs on one thread at a time.
    const char* text = std::strerror(errorNumber);
    return text != nullptr ? text : "";
#endif
}

void OxPlatformPerror(const char* prefix) {
    std::perror(prefix);
}

std::ifstream* OxPlatformOpenInput(const char* path, bool binary) {
    std::ios_base::openmode mode = std::ios_base::in;
    if (binary) {
        mode |= std::ios_base::binary;
    }
    // What exists and is not a regular file is refused before the open: a
    // FIFO would block it until a writer comes, and a directory opens on
    // POSIX but never reads. A missing file is left to the open to fail.
    OxStat status;
    if (OxPlatformStat(path, &status) == 0 && !OxPlatformIsRegularMode(status)) {
        std::ifstream* refused = new std::ifstream();
        refused->setstate(std::ios_base::failbit);
        return refused;
    }
#if defined(_MSC_VER)
    return new std::ifstream(path != nullptr ? path : "", mode, _SH_DENYNO);
#elif defined(_WIN32)
    // libstdc++ (MinGW) opens through the runtime's fopen, which shares the
    // file for reading and writing (_SH_DENYNO) on its own.
    return new std::ifstream(path != nullptr ? path : "", mode);
#else
    // POSIX opens never lock other processes out.
    return new std::ifstream(OxPlatformNativePath(path), mode);
#endif
}

std::ofstream* OxPlatformOpenOutput(const char* path, bool binary) {
    std::ios_base::openmode mode = std::ios_base::out | std::ios_base::trunc;
    if (binary) {
        mode |= std::ios_base::binary;
    }
#if defined(_MSC_VER)
    return new std::ofstream(path != nullptr ? path : "", mode, _SH_DENYNO);
#elif defined(_WIN32)
    return new std::ofstream(path != nullptr ? path : "", mode);
#else
    return new std::ofstream(OxPlatformNativePath(path), mode);
#endif
}

} // namespace detail
} // namespace oxbase
