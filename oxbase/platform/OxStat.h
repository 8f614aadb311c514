// OxStat.h: the file status record of the platform, as the public interface
// names it (the tree-walk callback and the inode tables take it).
//
// It is `struct _stat64i32` on Windows and `struct stat` on POSIX; the
// library reads its mode, its device number and its inode number.
//
//   int visit(const char * path, const OxStat * status, OxFileTreeWalkType type, void *);
#ifndef OXBASE_PLATFORM_OXSTAT_H
#define OXBASE_PLATFORM_OXSTAT_H

#include <sys/stat.h>
#include <sys/types.h>

#ifdef _WIN32
typedef struct _stat64i32 OxStat;
#else
typedef struct stat OxStat;
#endif

#endif
