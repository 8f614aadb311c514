// OxPlatformFs.h: the file-system calls of the library, in one place.
//
// Everything in OxBase that touches the file system (status, directories,
// removal, working directory, opening file streams) goes through these small
// functions. Every path argument may be in Windows form: on POSIX each
// backslash is handed to the operating system as '/'. Functions that answer
// an int follow the C convention (0 success, -1 failure with errno set).
//
// Windows: the runtime's _stat64i32, _mkdir, _unlink, remove, _chdir,
// _getdcwd and _getdrive. MinGW-w64's runtime (msvcrt.dll) has no
// _stat64i32 of its own: its <sys/stat.h> makes it an inline function over
// _stat64 that narrows the size, which is what is called here. Its C++
// library has no stream constructor with a share mode (MSVC's
// `ifstream(name, mode, _SH_DENYNO)`); its streams open through fopen, which
// shares the file for reading and writing just the same. The record has no
// inode numbers (st_ino is 0) and its device number is the drive (0 is A).
//
//   OxStat status;
//   if (OxPlatformStat("data\\parts", &status) == 0 && OxPlatformIsDirectoryMode(status)) { ... }
//   std::ifstream * in = OxPlatformOpenInput("data\\parts\\a.bin", true);
#ifndef OXBASE_PLATFORM_DETAIL_OXPLATFORMFS_H
#define OXBASE_PLATFORM_DETAIL_OXPLATFORMFS_H

#include <cstdint>
#include <fstream>
#include <string>

#include "oxbase/platform/OxStat.h"

namespace oxbase {
namespace detail {

/// Type bits of a status mode (mask 0xf000) and their directory and regular
/// file values, the same numbers on both platforms.
constexpr unsigned int OxStatTypeMask = 0xf000u;
constexpr unsigned int OxStatTypeDirectory = 0x4000u;
constexpr unsigned int OxStatTypeRegular = 0x8000u;

/// File status of `path`, following symbolic links. 0 on success, else -1
/// with errno set (a null path fails with ENOENT).
int OxPlatformStat(const char* path, OxStat* status);
/// File status of `path` itself: a symbolic link is described, not followed
/// (`lstat`). Windows has no such links in its runtime's status call, so
/// there it is the same as OxPlatformStat.
int OxPlatformLinkStat(const char* path, OxStat* status);
/// The mode field of a status record.
unsigned int OxPlatformStatMode(const OxStat& status);
/// Device and inode numbers, widened to 64 bits.
std::uint64_t OxPlatformStatDevice(const OxStat& status);
std::uint64_t OxPlatformStatInode(const OxStat& status);
/// Whether the type bits of the mode say directory / regular file.
bool OxPlatformIsDirectoryMode(const OxStat& status);
bool OxPlatformIsRegularMode(const OxStat& status);
/// Whether the status record is a character or block device, a FIFO or a
/// socket: none of them is a file that can be replaced by a new one.
bool OxPlatformIsSpecialMode(const OxStat& status);

/// Creates one directory level (mode 0777 less the umask on POSIX).
int OxPlatformMkdir(const char* path);
/// Removes a file name (`_unlink` / `unlink`).
int OxPlatformUnlink(const char* path);
/// Removes a file (`remove`).
int OxPlatformRemove(const char* path);
/// Changes the working directory of the process.
int OxPlatformChdir(const char* path);
/// The working directory of `drive` (0 the current drive, 1 is A) into
/// `buffer` of `size` characters; `buffer` on success, null with errno set on
/// failure. POSIX has no drives: the argument is ignored there.
char* OxPlatformGetDriveCwd(char* buffer, int size, unsigned int drive);
/// The current drive, 1 being A; 0 on POSIX, which has none.
unsigned int OxPlatformGetDrive();

/// The current errno, and a way to set it.
int OxPlatformErrno();
void OxPlatformSetErrno(int value);
/// The system's text for an error number.
std::string OxPlatformErrorText(int errorNumber);
/// Writes `prefix`, ": " and the text of errno to standard error.
void OxPlatformPerror(const char* prefix);

/// A new input / output file stream on `path` that other processes may read
/// and write meanwhile, in binary mode when `binary`, else text mode. The
/// output stream truncates. Never null; the caller tests the stream's state
/// and deletes it. Input is read from regular files only: a directory, a
/// FIFO, a device or a socket gives a failed stream at once, since a FIFO
/// without a writer would block the open forever and a device may never end.
std::ifstream* OxPlatformOpenInput(const char* path, bool binary);
std::ofstream* OxPlatformOpenOutput(const char* path, bool binary);

} // namespace detail
} // namespace oxbase

#endif
