// OxDirStream.h: directory streams in the manner of opendir, readdir, closedir.
//
// The tree walk reads directories through these three functions, which hide
// the platform's find calls. A stream lists every entry of one directory,
// "." and ".." included, in the order the platform gives them.
//
//   OxDirStream * stream = OxDirStream::opendir("/data/parts");
//   while (OxDirStream * entry = OxDirStream::readdir(stream)) use(entry->d_name, entry->d_namlen);
//   OxDirStream::closedir(stream);
#ifndef OXBASE_IO_DETAIL_OXDIRSTREAM_H
#define OXBASE_IO_DETAIL_OXDIRSTREAM_H

namespace oxbase {
namespace detail {

struct OxPlatformFindHandle;

/// One open directory stream. It begins with the current entry, which readdir
/// gives out: the record itself is the entry.
struct OxDirStream {
    short d_namlen = 0;                     ///< length of the current name
    char* d_name = nullptr;                 ///< the current name, null before the first read
    OxPlatformFindHandle* handle = nullptr; ///< the platform's listing
    const char* pending = nullptr;          ///< the first name, found by the open and not yet read
    char* pattern = nullptr;                ///< owned: the directory followed by "*"

    /// A stream on directory `name`, or null with errno set: 22 for a null
    /// or empty name, 12 without memory, the platform's number when the
    /// directory cannot be listed (13 refused, 2 missing). With a trace
    /// threshold of 99 or more a failed listing writes
    /// "opendir: _findfirst failed to locate \"<pattern>\"" on standard error.
    static OxDirStream* opendir(const char* name);
    /// The next entry (the stream itself, with d_name and d_namlen set), or
    /// null at the end. Null for a null stream; errno 9 for a stream that has
    /// no listing.
    static OxDirStream* readdir(OxDirStream* stream);
    /// Ends the listing and frees the stream: 0, or -1 with errno 9 for a
    /// null stream or a failed close.
    static int closedir(OxDirStream* stream);
};

} // namespace detail
} // namespace oxbase

#endif
