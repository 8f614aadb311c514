// OxToolFiles.h: files as the commands of oxtool need them, in portable C++.
//
// Where this program lives (for its installed data and for starting worker
// copies of itself), scratch directories, whole-file reads, standard input
// and output standing in for a file operand "-", and the spelling of a path
// that the library's own lookup takes as it is.
//
//   OxToolTempDir scratch;                       // removed with its content
//   std::string copy = scratch.file("in.xml");
//   if (!oxtoolCopyStdinTo(copy)) { ... }
#ifndef OXTOOL_OXTOOLFILES_H
#define OXTOOL_OXTOOLFILES_H

#include <string>

/// The absolute path of the running program from `argv0`: made absolute
/// when it names a directory part, else searched in PATH. Empty when it
/// cannot be found.
std::string oxtoolExecutablePath(const char* argv0);

/// A new directory of its own under the system's temporary directory,
/// removed with everything in it when the object goes. path() is empty when
/// none could be made.
class OxToolTempDir {
public:
    OxToolTempDir();
    ~OxToolTempDir();
    OxToolTempDir(const OxToolTempDir&) = delete;
    OxToolTempDir& operator=(const OxToolTempDir&) = delete;

    const std::string& path() const { return dir; }
    /// path() + separator + `name`.
    std::string file(const std::string& name) const;

private:
    std::string dir;
};

/// The whole content of `path` into `bytes`; false when it cannot be read.
bool oxtoolReadBytes(const std::string& path, std::string& bytes);
/// Writes `bytes` to `path`, replacing it; false on failure.
bool oxtoolWriteBytes(const std::string& path, const std::string& bytes);
/// Standard input, to its end, into the file `path`; false on failure.
bool oxtoolCopyStdinTo(const std::string& path);
/// The file `path` to standard output; false on failure.
bool oxtoolCopyToStdout(const std::string& path);

/// `path` spelled so that OxMsg takes it as it is, without trying the
/// working directory or another directory first: unchanged when it begins
/// with a separator, else relative to the working directory.
std::string oxtoolLibraryPath(const std::string& path);

/// Whether `path` names an existing regular file.
bool oxtoolIsFile(const std::string& path);

#endif
