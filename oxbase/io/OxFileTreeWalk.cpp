// OxFileTreeWalk.cpp: the walk, its ring of directory streams and parking.
#include "oxbase/io/OxFileTreeWalk.h"

#include "oxbase/core/detail/OxKeepErrno.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/io/detail/OxDirStream.h"
#include "oxbase/platform/detail/OxPlatformDir.h"
#include "oxbase/platform/detail/OxPlatformPath.h"

#include <cerrno>
#include <cstring>
#include <iostream>
#include <new>
#include <string>

using namespace oxbase::detail;

namespace {

const std::uint32_t startBufferSize = 260;

/// The places where a walk gives up or passes a directory over, each with
/// the line number its debug text names.
enum class Site {
    RunNoPath,
    RunEmptyPath,
    RunNoMemory,
    RunNoCwd,
    LoopNoChdir,
    Loop,
    EntryNoMemory,
    EntryStatus,
    EntryChdirRoot,
    EntryChdirBack,
    ParkNoMemory,
    ParkGrow,
    ParkBlock,
    OpenStream
};

struct DebugSite {
    const char* function;
    int line;
    const char* buffer; ///< the name of the buffer of the extra line, or null
};

/// Indexed by Site.
constexpr DebugSite kDebugSites[] = {
    {"OxFileTreeWalk::run", 224, nullptr},
    {"OxFileTreeWalk::run", 229, nullptr},
    {"OxFileTreeWalk::run", 238, nullptr},
    {"OxFileTreeWalk::run", 279, "cwd"},
    {"OxFileTreeWalk::walkDir", 411, "dirbuf"},
    {"OxFileTreeWalk::walkDir", 415, "dirbuf"},
    {"OxFileTreeWalk::process_entry", 545, nullptr},
    {"OxFileTreeWalk::process_entry", 564, "dirbuf"},
    {"OxFileTreeWalk::process_entry", 601, nullptr},
    {"OxFileTreeWalk::process_entry", 610, "dirbuf"},
    {"OxFileTreeWalk::open_dir_stream", 653, nullptr},
    {"OxFileTreeWalk::open_dir_stream", 677, "buf"},
    {"OxFileTreeWalk::open_dir_stream", 709, "buf"},
    {"OxFileTreeWalk::open_dir_stream", 736, "dirbuf"},
};
static_assert(sizeof kDebugSites / sizeof kDebugSites[0] == static_cast<int>(Site::OpenStream) + 1,
              "one debug text for every site");

/// The debug text of `site` on standard error, each line flushed: the main
/// line ("<function>: returning -1 at line <n>") and, for a site with a
/// buffer, the extra line with `text` between double quotes, which comes
/// before the main line for "buf" and after it for the others. errno comes
/// through unchanged.
void debugText(Site site, const char* text = nullptr) {
    OxKeepErrno keep;
    const DebugSite& debug = kDebugSites[static_cast<int>(site)];
    auto extra = [&] {
        std::cerr << debug.buffer << ": \"" << (text != nullptr ? text : "") << "\"\n"
                  << std::flush;
    };
    bool extraFirst = debug.buffer != nullptr && std::strcmp(debug.buffer, "buf") == 0;
    if (extraFirst) {
        extra();
    }
    std::cerr << debug.function << ": returning -1 at line " << debug.line << "\n" << std::flush;
    if (debug.buffer != nullptr && !extraFirst) {
        extra();
    }
}

int callUser(OxFileTreeWalkCallback callback, const char* path, const OxStat* status,
             OxFileTreeWalkType type, void* userData) {
    return callback != nullptr ? callback(path, status, type, userData) : 0;
}

} // namespace

OxFileTreeWalk::OxFileTreeWalk(const char* path, OxFileTreeWalkCallback function, int streams,
                               void* data)
    : OxFileTreeWalk(path, function, streams, -1, data) {}

OxFileTreeWalk::OxFileTreeWalk(const char* path, OxFileTreeWalkCallback function, int streams,
                               int depth, void* data)
    : maxDepth(depth < 0 ? -1 : depth), maxStreams(streams < 1 ? 1u : std::size_t(streams)),
      startPath(path), callback(function), userData(data) {
    dirStreams = new FileTreeWalkDir*[maxStreams]();
}

OxFileTreeWalk::~OxFileTreeWalk() {
    delete[] dirStreams;
    dirStreams = nullptr;
    delete[] dirbuf;
    dirbuf = nullptr;
}

bool OxFileTreeWalk::growDirbuf(std::uint64_t needed) {
    if (needed <= dirbufSize) {
        return true;
    }
    std::uint64_t size = dirbufSize != 0 ? dirbufSize : startBufferSize;
    while (size < needed) {
        size *= 2;
    }
    if (size > 0xFFFFFFFFull) {
        errno = ENOMEM;
        return false;
    }
    char* grown = nullptr;
    if (!withMemory([&] { grown = new char[size]; })) {
        errno = ENOMEM;
        return false;
    }
    std::memcpy(grown, dirbuf, dirbufSize);
    delete[] dirbuf;
    dirbuf = grown;
    dirbufSize = static_cast<std::uint32_t>(size);
    return true;
}

int OxFileTreeWalk::run() {
    if (startPath == nullptr) {
        debugText(Site::RunNoPath);
        return -1;
    }
    if (startPath[0] == '\0') {
        debugText(Site::RunEmptyPath);
        return -1;
    }
    // The walk moves the working directory, so every path it forms must be
    // absolute: a relative start path is resolved against the directory of
    // the moment first.
    std::string absolute;
    bool madeAbsolute = false;
    if (!withMemory([&] { madeAbsolute = OxPlatformMakeAbsolute(startPath, absolute); })) {
        reportNoMemory();
        return -1;
    }
    if (!madeAbsolute) {
        debugText(Site::RunNoCwd, "");
        return -1;
    }
    // The start path is kept whole: the buffer holds at least 260 characters
    // and room for a separator and the terminator.
    std::uint64_t needed = absolute.size() + 2;
    std::uint64_t size = needed < startBufferSize ? startBufferSize : needed;
    delete[] dirbuf;
    dirbuf = nullptr;
    if (size > 0xFFFFFFFFull || !withMemory([&] { dirbuf = new char[size]; })) {
        debugText(Site::RunNoMemory);
        return -1;
    }
    dirbufSize = static_cast<std::uint32_t>(size);
    std::memcpy(dirbuf, absolute.c_str(), absolute.size() + 1);

    std::size_t rootLength = OxPlatformRootLength(dirbuf);
    std::size_t length = absolute.size();
    while (length > rootLength && OxPlatformIsSeparator(dirbuf[length - 1])) {
        length--;
    }
    dirbuf[length] = '\0';

    level = 0;
    base = 0;
    for (std::size_t i = length; i > 0; i--) {
        if (OxPlatformIsSeparator(dirbuf[i - 1])) {
            base = static_cast<std::int64_t>(i);
            break;
        }
    }
    // A stale ELOOP from before the walk must not be taken for one of its own.
    errno = 0;

    std::string savedCwd;
    bool cwdSaved = false;
    int result = -1;
    do {
        if (base > 0) {
            bool cwdRead = false;
            if (!withMemory([&] { cwdRead = OxPlatformGetCwd(savedCwd); })) {
                reportNoMemory();
                break;
            }
            if (!cwdRead) {
                debugText(Site::RunNoCwd, savedCwd.c_str());
                break;
            }
            cwdSaved = true;
            int changed;
            if (static_cast<std::size_t>(base) == rootLength) {
                changed = OxPlatformChdir(dirbuf);
            } else {
                char kept = dirbuf[base - 1];
                dirbuf[base - 1] = '\0';
                changed = OxPlatformChdir(dirbuf);
                dirbuf[base - 1] = kept;
            }
            if (changed != 0) {
                break;
            }
        }
        OxStat status;
        std::memset(&status, 0, sizeof status);
        if (OxPlatformStat(dirbuf, &status) == 0) {
            if (OxPlatformIsDirectoryMode(status)) {
                result = walkDir(&status);
            } else {
                result = callUser(callback, dirbuf, &status, OxFTWFile, userData);
            }
        } else {
            OxFileTreeWalkType type = errno == EACCES ? OxFTWNoStat : OxFTWFile;
            std::memset(&status, 0, sizeof status);
            result = callUser(callback, dirbuf, &status, type, userData);
        }
    } while (false);

    OxKeepErrno keep; // the walk's own errno, not that of the tidying up
    if (cwdSaved) {
        OxPlatformChdir(savedCwd.c_str());
    }
    delete[] dirbuf;
    dirbuf = nullptr;
    dirbufSize = 0;
    return result;
}

void OxFileTreeWalk::closeStream(FileTreeWalkDir* dir) {
    if (dir->stream == nullptr) {
        return;
    }
    {
        OxKeepErrno keep;
        OxDirStream::closedir(dir->stream);
    }
    dir->stream = nullptr;
    activeSlot = activeSlot == 0 ? maxStreams - 1 : activeSlot - 1;
    dirStreams[activeSlot] = nullptr;
}

int OxFileTreeWalk::walkDir(OxStat* status) {
    std::int64_t savedBase = base;
    FileTreeWalkDir dir;

    if (inodes.exists(status) == OxTrue) {
        return 0;
    }
    // A directory that cannot be remembered could be entered again through
    // a link: the walk ends rather than risk a loop.
    if (!withMemory([&] { inodes.add(status); })) {
        reportNoMemory();
        return -1;
    }

    if (open_dir_stream(&dir) != 0) {
        if (errno == EACCES) {
            return callUser(callback, dirbuf, status, OxFTWUnreadableDir, userData);
        }
        // Any other failure: the directory is reported and has no entries.
    }

    int result = callUser(callback, dirbuf, status, OxFTWDirectory, userData);
    if (result != 0) {
        closeStream(&dir);
        return result;
    }
    if (errno == ELOOP) {
        debugText(OxPlatformChdir(dirbuf) != 0 ? Site::LoopNoChdir : Site::Loop, dirbuf);
        closeStream(&dir);
        return -1;
    }

    level++;
    std::size_t length = std::strlen(dirbuf);
    std::size_t cut = length;
    if (length == 0 || !OxPlatformIsSeparator(dirbuf[length - 1])) {
        // process_entry and run keep room for the separator and terminator.
        dirbuf[length++] = OxPlatformSeparator();
        dirbuf[length] = '\0';
    }
    base = static_cast<std::int64_t>(length);

    while (dir.stream != nullptr) {
        OxDirStream* entry = OxDirStream::readdir(dir.stream);
        if (entry == nullptr) {
            break;
        }
        result = process_entry(&dir, entry->d_name, std::strlen(entry->d_name));
        if (result != 0) {
            break;
        }
    }
    if (dir.stream != nullptr) {
        closeStream(&dir);
    } else if (result == 0 && dir.content != nullptr) {
        for (const char* name = dir.content; *name != '\0'; name += std::strlen(name) + 1) {
            result = process_entry(&dir, name, std::strlen(name));
            if (result != 0) {
                break;
            }
        }
    }
    if (dir.content != nullptr) {
        OxKeepErrno keep;
        delete[] dir.content;
        dir.content = nullptr;
    }

    dirbuf[cut] = '\0';
    level--;
    base = savedBase;
    return result;
}

int OxFileTreeWalk::process_entry(FileTreeWalkDir* dir, const char* name, std::size_t length) {
    if (std::strcmp(name, ".") == 0 || std::strcmp(name, "..") == 0) {
        return 0;
    }
    std::uint64_t needed = static_cast<std::uint64_t>(base) + length + 2;
    if (dirbufSize < needed && !growDirbuf(needed)) {
        debugText(Site::EntryNoMemory);
        return -1;
    }
    std::memcpy(dirbuf + base, name, length);
    dirbuf[base + static_cast<std::int64_t>(length)] = '\0';

    // An entry read from an open listing is looked up in its directory; one
    // of a parked listing (stream closed, names kept) by its whole path.
    OxStat status;
    std::memset(&status, 0, sizeof status);
    int found = dir->stream != nullptr
                    ? OxPlatformFindStat(dir->stream->handle, dirbuf, name, &status)
                    : OxPlatformStat(dirbuf, &status);
    if (found != 0) {
        if (errno == EACCES || errno == ENOENT) {
            return 0; // gone or hidden since the listing: passed over
        }
        debugText(Site::EntryStatus, dirbuf);
        return -1;
    }
    if (!OxPlatformIsDirectoryMode(status)) {
        return callUser(callback, dirbuf, &status, OxFTWFile, userData);
    }
    if (maxDepth >= 0 && maxDepth < level) {
        return callUser(callback, dirbuf, &status, OxFTWDirectory, userData);
    }
    int result = walkDir(&status);
    if (result != 0) {
        return result;
    }
    // Back to the directory whose entries are being read.
    if (base == 1) {
        if (OxPlatformChdir("/") != 0) {
            debugText(Site::EntryChdirRoot);
            return -1;
        }
    } else {
        char kept = dirbuf[base - 1];
        dirbuf[base - 1] = '\0';
        int changed = OxPlatformChdir(dirbuf);
        if (changed != 0) {
            debugText(Site::EntryChdirBack, dirbuf);
        }
        dirbuf[base - 1] = kept;
        if (changed != 0) {
            return -1;
        }
    }
    return 0;
}

int OxFileTreeWalk::open_dir_stream(FileTreeWalkDir* dir) {
    FileTreeWalkDir* occupant = dirStreams[activeSlot];
    if (occupant != nullptr) {
        // The ring is full and this is its oldest stream: read the rest of
        // its directory into memory and give its slot up.
        std::size_t bufferSize = 1024;
        char* buf = nullptr;
        if (!withMemory([&] { buf = new char[bufferSize]; })) {
            debugText(Site::ParkNoMemory);
            errno = ENOMEM;
            return -1;
        }
        std::size_t used = 0;
        buf[0] = '\0';
        while (OxDirStream* entry = OxDirStream::readdir(occupant->stream)) {
            std::size_t length = std::strlen(entry->d_name);
            while (used + length + 2 >= bufferSize) {
                std::size_t grownSize = bufferSize + (2 * length < 1024 ? 1024 : length);
                char* grown = nullptr;
                if (!withMemory([&] { grown = new char[grownSize]; })) {
                    debugText(Site::ParkGrow, buf);
                    delete[] buf;
                    errno = ENOMEM;
                    return -1;
                }
                std::memcpy(grown, buf, used + 1);
                delete[] buf;
                buf = grown;
                bufferSize = grownSize;
            }
            std::memcpy(buf + used, entry->d_name, length + 1);
            used += length + 1;
            buf[used] = '\0';
        }
        buf[used++] = '\0';
        char* block = nullptr;
        if (!withMemory([&] { block = new char[used]; })) {
            debugText(Site::ParkBlock, buf);
            delete[] buf;
            errno = ENOMEM;
            return -1;
        }
        std::memcpy(block, buf, used);
        delete[] buf;
        occupant->content = block;
        {
            OxKeepErrno keep;
            OxDirStream::closedir(occupant->stream);
        }
        occupant->stream = nullptr;
        dirStreams[activeSlot] = nullptr;
    }

    OxDirStream* stream = OxDirStream::opendir(dirbuf);
    if (stream == nullptr) {
        debugText(Site::OpenStream, dirbuf);
        return -1;
    }
    dir->stream = stream;
    dir->content = nullptr;
    dirStreams[activeSlot] = dir;
    activeSlot = activeSlot + 1 == maxStreams ? 0 : activeSlot + 1;
    return 0;
}
