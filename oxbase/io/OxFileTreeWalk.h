// OxFileTreeWalk.h: visit a directory tree with a bounded number of open streams.
//
// A walk calls a callback for every object below (and including) a start
// path, a directory before its contents, following symbolic links. However
// deep the tree, at most `maxStreams` directory streams are open at once:
// when the ring of stream slots is full, the oldest open directory is read to
// its end into memory and its stream closed. An inode table keeps the walk
// from entering a directory twice, so links to ancestors cause no loop where
// the file system has inode numbers (POSIX; see Windows below).
//
//   int count(const char *, const OxStat *, OxFileTreeWalkType, void * n) {
//       ++*static_cast<int *>(n);
//       return 0;
//   }
//   int n = 0;
//   OxFileTreeWalk walk("/data/parts", count, 10, &n);
//   int result = walk.run();    // 0, the callback's non-zero result, or -1
//
// The walk moves the working directory of the process while it runs and
// restores it at the end; it is for one thread at a time. Failures are
// reported on standard error (not through OxMsg). A relative start path is
// made absolute against the working directory first. Paths given to the
// callback use the platform's separator: '\\' on Windows, '/' on POSIX.
//
// Windows: its status record (_stat64i32) has no inode numbers; every
// status says inode 0, which the inode table never records. There the table
// stays empty and stops nothing: a second run of one object reports the tree
// again, and a directory reached twice (a junction or directory link to
// another place in the tree) is walked each time. A link back to an ancestor
// is followed round and round until the path outgrows the 260 characters
// that the runtime's calls take: then the status call of an entry fails
// with errno 2 (the entry is passed over in silence, as a vanished one) or
// the listing of a directory fails (its debug text, and the directory is
// reported without entries), and the walk comes back up and ends.
#ifndef OXBASE_IO_OXFILETREEWALK_H
#define OXBASE_IO_OXFILETREEWALK_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/io/OxInodeTable.h"
#include "oxbase/platform/OxStat.h"

#include <cstddef>
#include <cstdint>

namespace oxbase {
namespace detail {
struct OxDirStream;
} // namespace detail
} // namespace oxbase

/// What the callback is given.
enum OxFileTreeWalkType {
    OxFTWFile = 1,         ///< an object that is no directory
    OxFTWDirectory = 2,    ///< a directory
    OxFTWNoStat = 3,       ///< the start path, whose status was refused (errno 13)
    OxFTWUnreadableDir = 4 ///< a directory whose listing was refused (errno 13)
};

/// The walk's callback. `path` is the walk's own buffer, valid during the
/// call only; `status` is that path's status (without meaning for
/// OxFTWNoStat). A non-zero result stops the walk and becomes run's result.
typedef int (*OxFileTreeWalkCallback)(const char* path, const OxStat* status,
                                      OxFileTreeWalkType type, void* userData);

class OXBASE_API OxFileTreeWalk {
public:
    /// One directory being read: its stream, or the names read ahead when the
    /// stream was parked (each ended by a zero byte, the whole by one more).
    struct FileTreeWalkDir {
        oxbase::detail::OxDirStream* stream = nullptr;
        char* content = nullptr; ///< owned
    };

    /// A walk with no depth limit. `path` is not copied: it must stay valid
    /// until run returns. A `maxStreams` below 1 counts as 1.
    OxFileTreeWalk(const char* path, OxFileTreeWalkCallback callback, int maxStreams,
                   void* userData);
    /// A walk that enters directories down to `maxDepth` levels below the
    /// start (0: the start directory's entries are reported, its
    /// subdirectories reported but not entered). Negative: no limit.
    OxFileTreeWalk(const char* path, OxFileTreeWalkCallback callback, int maxStreams, int maxDepth,
                   void* userData);
    OxFileTreeWalk(const OxFileTreeWalk&) = delete;
    OxFileTreeWalk& operator=(const OxFileTreeWalk&) = delete;
    virtual ~OxFileTreeWalk();

    /// Walks the tree: 0 when the walk ended normally, the callback's non-zero
    /// result when it stopped the walk, -1 on failure. The working directory
    /// is the same afterwards as before. An object serves one run: its inode
    /// table is not cleared, so a second run finds its directories known.
    /// Memory: a buffer that cannot grow gives its debug text and -1; a
    /// directory that cannot be remembered in the inode table ends the walk
    /// with the fatal line on standard error and -1.
    int run();

    int getMaxDepth() const { return maxDepth; }
    std::size_t getMaxStreams() const { return maxStreams; }
    const OxInodeTable& getInodeTable() const { return inodes; }

private:
    int walkDir(OxStat* status);
    int process_entry(FileTreeWalkDir* dir, const char* name, std::size_t length);
    int open_dir_stream(FileTreeWalkDir* dir);

    /// Closes the stream of `dir` (errno unchanged) and steps the ring back.
    void closeStream(FileTreeWalkDir* dir);
    /// Makes `dirbuf` hold at least `needed` bytes by doubling.
    bool growDirbuf(std::uint64_t needed);

    int maxDepth = -1;
    FileTreeWalkDir** dirStreams = nullptr;
    std::size_t maxStreams = 1;
    std::size_t activeSlot = 0;
    char* dirbuf = nullptr;
    std::uint32_t dirbufSize = 0;
    std::int64_t base = 0;
    int level = 0;
    const char* startPath = nullptr;
    OxFileTreeWalkCallback callback = nullptr;
    void* userData = nullptr;
    OxInodeTable inodes;
};

#endif
