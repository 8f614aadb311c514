// OxFile.h: the base of the file streams, and path text utilities.
//
// OxFile is the abstract base of OxInput and OxOutput: it keeps the file name
// and owns the enums that say how a file is opened (FILE_MODE) and which side
// of a structured file is meant (OxIOType). Its static side is a toolbox of
// path operations. They follow the Windows rules on every platform: the
// separator is the backslash, a path may begin with a drive ("c:"), and the
// forward slash separates nothing. File-system queries (exists, mkdir, ...)
// accept the same Windows-form paths on POSIX.
//
//   char * dir = OxFile::getBaseName("parts\\wheel.xml");   // "parts"
//   char * path = OxFile::makeFileSpec(dir, "hub.xml");      // "parts\\hub.xml"
//   delete[] dir; delete[] path;
//
// Every operation that returns `char *` returns a new array (array delete is
// the caller's); an empty result is null, never an empty text, unless stated.
#ifndef OXBASE_IO_OXFILE_H
#define OXBASE_IO_OXFILE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"

#include <ios>

class OXBASE_API OxFile {
public:
    /// How a stream opens its file. The streams treat every value other than
    /// FILE_MODE_BINARY as text mode.
    enum FILE_MODE { FILE_MODE_BINARY = 1, FILE_MODE_TEXT = 2 };
    /// The side of a structured file (OxCsvFile, OxXmlFile).
    enum OxIOType { OxIOInput = 0, OxIOOutput = 1 };

    /// Stores a copy of `name` (null for a null or empty name).
    explicit OxFile(const char* name);
    OxFile(const OxFile&) = delete;
    OxFile& operator=(const OxFile&) = delete;
    virtual ~OxFile();

    /// Moves the stream position: `direction` 0 beginning, 1 current, 2 end.
    virtual OxBool seek(int offset, unsigned int direction) = 0;

    /// The stored name, not a copy; may be null.
    const char* getFilename() const { return filename; }
    /// Writes "OxFile (Binary File):" and a newline; returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

    // ---- Path text (Windows rules, every platform) ----

    /// Replaces each of ( ) * - / [ ] by '_' in place; returns `name` (not null).
    static char* cleanupFileName(char* name);
    /// Whether two paths name the same file: equal texts, or equal absolute
    /// paths up to the case of the drive letter. Arguments must not be null.
    static OxBool compareFileSpecs(const char* first, const char* second);
    /// The path made absolute against the working directory (484 on failure);
    /// a rooted path is returned as it is, "\" alone gets the current drive.
    static char* getAbsolutePath(const char* path);
    /// The path less its last component, or its last `levels` components.
    static char* getBaseName(const char* path);
    static char* getBaseName(const char* path, unsigned int levels);
    /// The text after the last period (index 1 or later); null without one.
    static char* getFileExtension(const char* path);
    /// The last component, or the last `levels` components.
    static char* getFileName(const char* path);
    static char* getFileName(const char* path, unsigned int levels);
    /// The path without its leading separators; a drive prefix stays.
    static char* getRelativePath(const char* path);
    /// Whether the path is rooted: "\x" or "c:\x"; never for '/'.
    static OxBool isAbsolutePath(const char* path);
    /// `directory`, a backslash unless it ends in one, and `file`; a copy of
    /// the other when one is null, null when both are.
    static char* makeFileSpec(const char* directory, const char* file);
    /// The relative path with no drive and each backslash as '_'; an empty
    /// (not null) text when nothing is left, null for a null or empty path.
    static char* pathToFileName(const char* path);
    /// The text before the last period (index 1 or later); null without one.
    static char* stripFileExtension(const char* path);

    // ---- File system ----

    /// Whether the path's status can be read (symbolic links followed).
    static OxBool exists(const char* path);
    /// Whether the path is an existing directory / regular file.
    static OxBool isDirectory(const char* path);
    static OxBool isRegularFile(const char* path);
    /// Creates one directory level. OxTrue when it exists as a directory or
    /// was made (or for a null path); 181 when the path is no directory, 180
    /// and perror when it cannot be made.
    static OxBool mkdir(const char* path);
    /// Removes a file; 344 with the path and the system text on failure.
    static OxBool removeFile(const char* path);
    /// The working directory of `drive` (0 current; ignored without drives)
    /// in `buffer` of `size`, or in a new array of 261 when `buffer` is null.
    /// Null and 484 on failure.
    static char* getCWD(char* buffer, unsigned int size, unsigned int drive);
    /// The first `makeFileSpec(entry, name)` over `directories` (null entries
    /// skipped) that names a regular file, as a new array; else null.
    static char* findFile(const char* name, const OxGList<char*>& directories);
    /// Collects the files below `directory` that end in `extension` into
    /// `files`. Rests on the file tree walk and is defined with it
    /// (oxbase/io/OxFileFind.cpp).
    static OxBool findFilesByExtension(const char* directory, OxGList<char*>& files,
                                       const char* extension, OxBool recursive);

protected:
    /// Logs the flags of a stream state by number: 18 end of file, 19
    /// failure, 20 bad, each that is set, in that order.
    static void logStreamState(std::ios_base::iostate state);

    char* filename; ///< owned copy of the name, may be null
};

#endif
