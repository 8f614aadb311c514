// OxPlatformPath.h: how paths that the library builds meet the file system.
//
// The text utilities of OxFile follow the Windows rules on every platform.
// Components that build paths for the file system (message and log files,
// output directories, tree walks, list files) ask this header instead:
// which characters separate, which one to write, what is absolute, and how a
// path is spelled for the operating system (on POSIX every backslash is
// handed over as '/', so Windows-form paths work unchanged).
//
//   std::string path = OxPlatformJoinPath(directory, "oxbase.msg");
//   std::ifstream in(OxPlatformNativePath(path.c_str()));
#ifndef OXBASE_PLATFORM_DETAIL_OXPLATFORMPATH_H
#define OXBASE_PLATFORM_DETAIL_OXPLATFORMPATH_H

#include <string>

namespace oxbase {
namespace detail {

/// The separator this platform writes: '/' on POSIX, '\\' on Windows.
char OxPlatformSeparator();
/// Whether `c` separates path components: '/' and '\\' on POSIX, '\\' on Windows.
bool OxPlatformIsSeparator(char c);
/// Whether `path` is absolute: it begins with a separator, or on Windows with
/// a drive and a separator ("c:\\x"; "c:x" is relative to the drive's own
/// working directory and so not absolute).
bool OxPlatformIsAbsolute(const char* path);
/// `path` as the operating system wants it spelled; empty for a null path.
std::string OxPlatformNativePath(const char* path);
/// `directory`, a separator unless it already ends in one, and `name`.
std::string OxPlatformJoinPath(const std::string& directory, const char* name);
/// The working directory; false (and `out` empty) when it cannot be read.
bool OxPlatformGetCwd(std::string& out);

} // namespace detail
} // namespace oxbase

#endif
