#include "oxbase/platform/detail/OxPlatformPath.h"

#include <cctype>
#include <cerrno>
#include <vector>

#ifdef _WIN32
#include <direct.h>
#else
#include <unistd.h>
#endif

namespace oxbase {
namespace detail {

char OxPlatformSeparator() {
#ifdef _WIN32
    return '\\';
#else
    return '/';
#endif
}

bool OxPlatformIsSeparator(char c) {
#ifdef _WIN32
    return c == '\\';
#else
    return c == '/' || c == '\\';
#endif
}

bool OxPlatformIsAbsolute(const char* path) {
    if (path == nullptr) {
        return false;
    }
#ifdef _WIN32
    // Rooted as the path rules say: "c:\..." with a drive, "\..." without.
    if (std::isalpha(static_cast<unsigned char>(path[0])) && path[1] == ':') {
        return OxPlatformIsSeparator(path[2]);
    }
#endif
    return OxPlatformIsSeparator(path[0]);
}

std::string OxPlatformNativePath(const char* path) {
    std::string native = path != nullptr ? path : "";
#ifndef _WIN32
    for (char& c : native) {
        if (c == '\\') {
            c = '/';
        }
    }
#endif
    return native;
}

std::string OxPlatformJoinPath(const std::string& directory, const char* name) {
    std::string path = directory;
    if (!path.empty() && !OxPlatformIsSeparator(path.back())) {
        path += OxPlatformSeparator();
    }
    if (name != nullptr) {
        path += name;
    }
    return path;
}

bool OxPlatformGetCwd(std::string& out) {
    std::vector<char> buffer(512);
    for (;;) {
#ifdef _WIN32
        char* result = _getcwd(buffer.data(), static_cast<int>(buffer.size()));
#else
        char* result = ::getcwd(buffer.data(), buffer.size());
#endif
        if (result != nullptr) {
            out = buffer.data();
            return true;
        }
        if (errno != ERANGE || buffer.size() > (1u << 20)) {
            out.clear();
            return false;
        }
        buffer.resize(buffer.size() * 2);
    }
}

} // namespace detail
} // namespace oxbase
