// Helpers shared by the test suites: scratch directories, whole-file reads and
// writes, and the path of the bundled data directory.
#ifndef OXBASE_TESTS_OXTESTSUPPORT_H
#define OXBASE_TESTS_OXTESTSUPPORT_H

#include "oxbase/platform/OxStrstream.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

class OxMsg;

namespace oxtest {

/// The separator the library writes on this platform: '\\' on Windows, '/'
/// elsewhere.
#ifdef _WIN32
constexpr char kSep = '\\';
#else
constexpr char kSep = '/';
#endif
/// `path` with every '/' turned into the platform's separator, so that a
/// test spells its paths once for both platforms.
std::string native(std::string path);

/// A fresh directory under the system's temporary directory, removed with
/// everything in it when the object goes.
class TempDir {
public:
    TempDir();
    ~TempDir();
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    const std::string& path() const { return dir; }
    /// `path()`, the platform's separator and `name` (its '/' turned into
    /// that separator too).
    std::string file(const std::string& name) const;

private:
    std::string dir;
};

/// The whole content of a file as bytes; empty when it cannot be read.
std::string readFile(const std::string& path);
/// The content of a file that the library wrote in text mode, with the
/// platform's line end read as "\n": CR LF on Windows, where a bare LF
/// comes out as "<LF without CR>\n" so that a comparison shows it; the bytes
/// as they are elsewhere.
std::string readText(const std::string& path);
/// The bytes that text mode writes for `text` on this platform: each "\n"
/// as CR LF on Windows, unchanged elsewhere.
std::string textBytes(const std::string& text);
/// Writes `bytes` to `path`, replacing the file.
void writeFile(const std::string& path, const std::string& bytes);
/// A file of the bundled data directory.
std::string dataFile(const std::string& name);
/// The text of an ostrstream so far, without changing its freeze state.
std::string streamText(std::ostrstream& stream);
/// What `object.dump` writes to a fresh stream.
template <class T> std::string dumpText(const T& object) {
    std::ostrstream stream;
    object.dump(&stream);
    return streamText(stream);
}

/// A running message subsystem on a message file of `lines` (written into
/// `dir`) that records every logged text.
class MessageLog {
public:
    explicit MessageLog(const std::string& lines);
    ~MessageLog();
    MessageLog(const MessageLog&) = delete;
    MessageLog& operator=(const MessageLog&) = delete;

    /// The texts logged so far without their line ends, leaving out empty
    /// ones (a print object flushing nothing), then forgets them.
    std::vector<std::string> take();

    TempDir dir;

private:
    std::vector<std::string> texts;
    std::unique_ptr<OxMsg> msg;
};

/// What a child process may be given before it runs its part of a test.
struct ChildLimits {
    /// Give up root rights (to user and group 65534), so that permission
    /// bits bind; a child that cannot drop them reports so.
    bool dropRights = false;
    /// A file size limit in bytes (RLIMIT_FSIZE, SIGXFSZ ignored, so a write
    /// beyond it fails with EFBIG); 0 for none.
    unsigned long long fileSizeLimit = 0;
};

/// Runs `body` in a forked child under `limits` and returns the text it
/// returned; a child that crashes or exits otherwise gives a text that says
/// so. Only where processes can fork (not on Windows): `canFork()` tells.
std::string inChild(const std::function<std::string()>& body, ChildLimits limits = {});
bool canFork();

/// What a program run by `runCommand` did.
struct CommandResult {
    int status = -1; ///< its exit status; -1 when it did not exit by itself
    std::string out; ///< standard output
    std::string err; ///< standard error
};

/// Runs `command`, a command line for the system's command processor, with
/// standard input from the file `input` (none: an empty input) and both
/// outputs caught.
CommandResult runCommand(const std::string& command, const std::string& input = "");

} // namespace oxtest

#endif
