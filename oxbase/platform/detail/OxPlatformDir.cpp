#include "oxbase/platform/detail/OxPlatformDir.h"

#include "oxbase/core/detail/OxKeepErrno.h"
#include "oxbase/platform/detail/OxPlatformPath.h"

#include <cctype>
#include <cerrno>
#include <new>

#ifdef _WIN32
#include <io.h>
#else
#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#endif

namespace oxbase {
namespace detail {

struct OxPlatformFindHandle {
#ifdef _WIN32
    intptr_t handle = -1;
    struct _finddata64i32_t data;
#else
    DIR* dir = nullptr;
#endif
};

#ifdef _WIN32

OxPlatformFindHandle* OxPlatformFindFirst(const char* pattern, const char** first) {
    if (pattern == nullptr || first == nullptr) {
        errno = EINVAL;
        return nullptr;
    }
    OxPlatformFindHandle* handle = new OxPlatformFindHandle;
    handle->handle = _findfirst64i32(pattern, &handle->data);
    if (handle->handle == -1) {
        OxKeepErrno keep;
        delete handle;
        return nullptr;
    }
    *first = handle->data.name;
    return handle;
}

int OxPlatformFindNext(OxPlatformFindHandle* handle, const char** name) {
    if (handle == nullptr || name == nullptr || handle->handle == -1) {
        errno = EBADF;
        return -1;
    }
    if (_findnext64i32(handle->handle, &handle->data) != 0) {
        return -1;
    }
    *name = handle->data.name;
    return 0;
}

int OxPlatformFindClose(OxPlatformFindHandle* handle) {
    if (handle == nullptr) {
        errno = EBADF;
        return -1;
    }
    int result = handle->handle != -1 ? _findclose(handle->handle) : 0;
    delete handle;
    return result;
}

int OxPlatformFindStat(OxPlatformFindHandle* handle, const char* path, const char* name,
                       OxStat* status) {
    (void)handle;
    (void)name;
    return OxPlatformStat(path, status);
}

#else

OxPlatformFindHandle* OxPlatformFindFirst(const char* pattern, const char** first) {
    if (pattern == nullptr || first == nullptr) {
        errno = EINVAL;
        return nullptr;
    }
    std::string directory = OxPlatformNativePath(pattern);
    if (!directory.empty() && directory.back() == '*') {
        directory.pop_back();
    }
    if (directory.empty()) {
        directory = ".";
    }
    OxPlatformFindHandle* handle = new OxPlatformFindHandle;
    handle->dir = ::opendir(directory.c_str());
    if (handle->dir == nullptr) {
        OxKeepErrno keep;
        delete handle;
        return nullptr;
    }
    // readdir answers null both at the end and on failure; errno tells them
    // apart, so it is cleared first.
    errno = 0;
    struct dirent* entry = ::readdir(handle->dir);
    *first = entry != nullptr ? entry->d_name : nullptr;
    return handle;
}

int OxPlatformFindNext(OxPlatformFindHandle* handle, const char** name) {
    if (handle == nullptr || name == nullptr || handle->dir == nullptr) {
        errno = EBADF;
        return -1;
    }
    int saved = errno;
    errno = 0;
    struct dirent* entry = ::readdir(handle->dir);
    if (entry == nullptr) {
        if (errno == 0) {
            errno = saved; // the plain end of the listing leaves errno alone
        }
        return -1;
    }
    errno = saved;
    *name = entry->d_name;
    return 0;
}

int OxPlatformFindClose(OxPlatformFindHandle* handle) {
    if (handle == nullptr) {
        errno = EBADF;
        return -1;
    }
    int result = handle->dir != nullptr ? ::closedir(handle->dir) : 0;
    delete handle;
    return result;
}

int OxPlatformFindStat(OxPlatformFindHandle* handle, const char* path, const char* name,
                       OxStat* status) {
    if (handle == nullptr || handle->dir == nullptr || name == nullptr || status == nullptr) {
        return OxPlatformStat(path, status);
    }
    return ::fstatat(::dirfd(handle->dir), name, status, 0);
}

#endif

std::size_t OxPlatformRootLength(const char* path) {
#ifdef _WIN32
    if (path != nullptr && path[0] != '\0' && std::isalpha(static_cast<unsigned char>(path[0])) &&
        path[1] == ':') {
        return 3;
    }
#else
    (void)path; // no drives: a root is one separator
#endif
    return 1;
}

bool OxPlatformMakeAbsolute(const char* path, std::string& out) {
    if (path == nullptr) {
        out.clear();
        return false;
    }
    if (OxPlatformIsAbsolute(path)) {
        out = path;
        return true;
    }
    std::string cwd;
    if (!OxPlatformGetCwd(cwd)) {
        out.clear();
        return false;
    }
    // Leading "." components name the working directory itself: "." gives
    // the working directory, "./a" gives "<cwd>/a".
    const char* rest = path;
    while (rest[0] == '.' && (rest[1] == '\0' || OxPlatformIsSeparator(rest[1]))) {
        rest += rest[1] == '\0' ? 1 : 2;
        while (OxPlatformIsSeparator(rest[0])) {
            rest++;
        }
    }
    out = rest[0] != '\0' ? OxPlatformJoinPath(cwd, rest) : cwd;
    return true;
}

} // namespace detail
} // namespace oxbase
