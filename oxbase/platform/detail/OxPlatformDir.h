// OxPlatformDir.h: reading directories, and the path facts a tree walk needs.
//
// A find handle lists the entries of one directory, "." and ".." included,
// in the order the platform gives them. The pattern is the directory followed
// by "*" (as the Windows find calls want it); on POSIX the "*" is dropped and
// the directory is read with opendir/readdir. On Windows the runtime's
// _findfirst64i32, _findnext64i32 and _findclose list it; MinGW-w64's
// runtime has no _findfirst64i32/_findnext64i32 of its own, its <io.h> makes
// them inline functions over _findfirst64/_findnext64, which are used so.
//
//   const char * name = nullptr;
//   OxPlatformFindHandle * handle = OxPlatformFindFirst("/data/*", &name);
//   while (handle != nullptr && name != nullptr) {
//       use(name);
//       if (OxPlatformFindNext(handle, &name) != 0) break;
//   }
//   OxPlatformFindClose(handle);
#ifndef OXBASE_PLATFORM_DETAIL_OXPLATFORMDIR_H
#define OXBASE_PLATFORM_DETAIL_OXPLATFORMDIR_H

#include "oxbase/platform/detail/OxPlatformFs.h"

#include <cstddef>
#include <string>

namespace oxbase {
namespace detail {

/// An open directory listing; opaque.
struct OxPlatformFindHandle;

/// Opens a listing for `pattern` (a directory followed by "*"). On success the
/// handle is returned and `*first` is the first entry's name, or null when the
/// directory has no entry at all. On failure null with errno set (13 for a
/// refused directory, 2 for a missing one). The name stays valid until the
/// next call on the handle. Without memory for the handle std::bad_alloc
/// reaches the caller.
OxPlatformFindHandle* OxPlatformFindFirst(const char* pattern, const char** first);
/// The next entry's name in `*name`: 0, or -1 at the end of the listing (or
/// with errno set on failure).
int OxPlatformFindNext(OxPlatformFindHandle* handle, const char** name);
/// Releases the listing: 0, or -1 with errno set. A null handle gives -1.
int OxPlatformFindClose(OxPlatformFindHandle* handle);
/// The status of entry `name` of the listing's directory, whose full path is
/// `path`, following links as OxPlatformStat does: 0, or -1 with errno set.
/// On POSIX the entry is looked up in the open directory itself, so that
/// the system does not resolve the whole path again for every entry (and a
/// path beyond the system's length limit still works); elsewhere `path` is
/// used.
int OxPlatformFindStat(OxPlatformFindHandle* handle, const char* path, const char* name,
                       OxStat* status);

/// The length of the root of a path: 3 for "c:" on a platform with drives,
/// else 1.
std::size_t OxPlatformRootLength(const char* path);
/// `path` made absolute against the working directory; an absolute path is
/// copied as it is. False when the working directory cannot be read.
bool OxPlatformMakeAbsolute(const char* path, std::string& out);

} // namespace detail
} // namespace oxbase

#endif
