#include "oxbase/io/OxFile.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxKeepErrno.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/platform/detail/OxPlatformFs.h"

#include <cctype>
#include <climits>
#include <cstring>
#include <string>

using namespace oxbase::detail;

namespace {

constexpr char kSeparator = '\\';
constexpr int kErrorNoEntry = 2; // ENOENT on every platform the library serves
constexpr unsigned int kCwdBufferSize = 261;
constexpr unsigned int kCwdLimit = 260;

// 3 for a path that starts with a drive ("c:"), else 1.
size_t rootLength(const char* path, size_t length) {
    if (length >= 2 && std::isalpha(static_cast<unsigned char>(path[0])) && path[1] == ':') {
        return 3;
    }
    return 1;
}

// The position of the separator before `cursor`, or 0 when there is none
// (index 0 is never tested: a leading separator belongs to the root).
size_t previousSeparator(const char* path, size_t cursor) {
    while (cursor > 0) {
        cursor--;
        if (cursor > 0 && path[cursor] == kSeparator) {
            break;
        }
    }
    return cursor;
}

bool isRooted(const char* path, size_t length) {
    size_t root = rootLength(path, length);
    return length >= root && path[root - 1] == kSeparator;
}

bool hasDrivePrefix(const char* path, size_t length) {
    return rootLength(path, length) == 3;
}

// A new array holding `length` characters of `text`, terminated; never null.
char* newText(const char* text, size_t length) {
    char* copy = new char[length + 1];
    if (length > 0) {
        std::memcpy(copy, text, length);
    }
    copy[length] = '\0';
    return copy;
}

// Position of the last period at index 1 or later, or 0 when there is none.
size_t lastPeriod(const char* path) {
    size_t length = std::strlen(path);
    for (size_t i = length; i-- > 1;) {
        if (path[i] == '.') {
            return i;
        }
    }
    return 0;
}

std::string systemErrorText(int error) {
    return OxPlatformErrorText(error);
}

} // namespace

OxFile::OxFile(const char* name) : filename(OxString::dup(name)) {}

OxFile::~OxFile() {
    delete[] filename;
}

std::ostrstream* OxFile::dump(std::ostrstream* stream) const {
    if (stream != nullptr) {
        *stream << "OxFile (Binary File):" << '\n';
    }
    return stream;
}

char* OxFile::cleanupFileName(char* name) {
    if (name == nullptr) {
        return name;
    }
    for (char* c = name; *c != '\0'; c++) {
        switch (*c) {
        case '(':
        case ')':
        case '*':
        case '-':
        case '/':
        case '[':
        case ']':
            *c = '_';
            break;
        default:
            break;
        }
    }
    return name;
}

OxBool OxFile::compareFileSpecs(const char* first, const char* second) {
    if (first == nullptr || second == nullptr) {
        return OxToBool(first == second);
    }
    if (std::strcmp(first, second) == 0) {
        return OxTrue;
    }
    char* a = getAbsolutePath(first);
    char* b = getAbsolutePath(second);
    OxBool same = OxFalse;
    if (a != nullptr && b != nullptr) {
        for (char* p : {a, b}) {
            if (hasDrivePrefix(p, std::strlen(p))) {
                p[0] = static_cast<char>(std::toupper(static_cast<unsigned char>(p[0])));
            }
        }
        same = OxToBool(std::strcmp(a, b) == 0);
    }
    delete[] a;
    delete[] b;
    return same;
}

char* OxFile::getAbsolutePath(const char* path) {
    if (path == nullptr) {
        return nullptr;
    }
    size_t length = std::strlen(path);
    if (isRooted(path, length)) {
        if (length == 1) {
            // The root of the current drive; without drives it stays "\".
            unsigned int drive = OxPlatformGetDrive();
            if (drive >= 1 && drive <= 26) {
                char withDrive[4] = {static_cast<char>('A' + drive - 1), ':', kSeparator, '\0'};
                return newText(withDrive, 3);
            }
        }
        return newText(path, length);
    }
    unsigned int drive = 0;
    const char* rest = path;
    if (hasDrivePrefix(path, length)) {
        drive =
            static_cast<unsigned int>(std::toupper(static_cast<unsigned char>(path[0])) - 'A' + 1);
        rest = path + 2;
    }
    char* buffer = new char[kCwdBufferSize];
    if (getCWD(buffer, kCwdLimit, drive) == nullptr) {
        int error = OxPlatformErrno();
        delete[] buffer;
        OxMsg::Log(OxMsgCwdUnreadable, systemErrorText(error).c_str());
        return nullptr;
    }
    std::string absolute = buffer;
    delete[] buffer;
    if (absolute.empty() || absolute.back() != kSeparator) {
        absolute += kSeparator;
    }
    absolute += rest;
    return newText(absolute.c_str(), absolute.size());
}

char* OxFile::getBaseName(const char* path) {
    return getBaseName(path, 1);
}

char* OxFile::getBaseName(const char* path, unsigned int levels) {
    if (path == nullptr) {
        return nullptr;
    }
    if (levels == 0) {
        return OxString::dup(path);
    }
    size_t length = std::strlen(path);
    size_t root = rootLength(path, length);
    size_t cursor = length;
    for (unsigned int pass = 0; pass < levels; pass++) {
        cursor = previousSeparator(path, cursor);
        if (cursor == 0) {
            return nullptr;
        }
        // Over the run of separators, but never into the root.
        while (cursor > root && path[cursor] == kSeparator) {
            cursor--;
        }
    }
    return newText(path, cursor + 1);
}

char* OxFile::getFileName(const char* path) {
    return getFileName(path, 1);
}

char* OxFile::getFileName(const char* path, unsigned int levels) {
    if (path == nullptr) {
        return nullptr;
    }
    if (levels == 0) {
        return OxString::dup(path);
    }
    size_t length = std::strlen(path);
    if (length == 0) {
        return nullptr;
    }
    size_t root = rootLength(path, length);
    size_t cursor = length;
    for (unsigned int pass = 0; pass < levels; pass++) {
        cursor = previousSeparator(path, cursor);
        // Onto the first separator of the run.
        while (cursor > root && path[cursor - 1] == kSeparator) {
            cursor--;
        }
        if (pass + 1 < levels && cursor > 0) {
            cursor--;
        }
    }
    while (path[cursor] == kSeparator) {
        cursor++;
    }
    return OxString::dup(path + cursor);
}

char* OxFile::getRelativePath(const char* path) {
    char* result = OxString::dup(path);
    if (result == nullptr) {
        return nullptr;
    }
    size_t length = std::strlen(result);
    size_t root = rootLength(result, length);
    if (length < root) {
        return result;
    }
    size_t from = root - 1;
    while (result[from] == kSeparator) {
        from++;
    }
    size_t to = root == 3 ? 2 : 0; // a drive prefix stays in front
    std::memmove(result + to, result + from, length - from + 1);
    return result;
}

OxBool OxFile::isAbsolutePath(const char* path) {
    if (path == nullptr) {
        return OxFalse;
    }
    return OxToBool(isRooted(path, std::strlen(path)));
}

char* OxFile::makeFileSpec(const char* directory, const char* file) {
    if (directory == nullptr) {
        return OxString::dup(file);
    }
    if (file == nullptr) {
        return OxString::dup(directory);
    }
    std::string fileSpec = directory;
    if (fileSpec.empty() || fileSpec.back() != kSeparator) {
        fileSpec += kSeparator;
    }
    fileSpec += file;
    return newText(fileSpec.c_str(), fileSpec.size());
}

char* OxFile::pathToFileName(const char* path) {
    char* relative = getRelativePath(path);
    if (relative == nullptr) {
        return nullptr;
    }
    const char* start = relative;
    if (start[0] != '\0' && start[1] == ':') {
        start += 2;
    }
    char* name = newText(start, std::strlen(start));
    delete[] relative;
    for (char* c = name; *c != '\0'; c++) {
        if (*c == kSeparator) {
            *c = '_';
        }
    }
    return name;
}

char* OxFile::getFileExtension(const char* path) {
    if (path == nullptr) {
        return nullptr;
    }
    size_t period = lastPeriod(path);
    return period == 0 ? nullptr : OxString::dup(path + period + 1);
}

char* OxFile::stripFileExtension(const char* path) {
    if (path == nullptr) {
        return nullptr;
    }
    size_t period = lastPeriod(path);
    return period == 0 ? nullptr : newText(path, period);
}

OxBool OxFile::exists(const char* path) {
    OxStat status;
    return OxToBool(path != nullptr && OxPlatformStat(path, &status) == 0);
}

OxBool OxFile::isDirectory(const char* path) {
    OxStat status;
    return OxToBool(path != nullptr && OxPlatformStat(path, &status) == 0 &&
                    OxPlatformIsDirectoryMode(status));
}

OxBool OxFile::isRegularFile(const char* path) {
    OxStat status;
    return OxToBool(path != nullptr && OxPlatformStat(path, &status) == 0 &&
                    OxPlatformIsRegularMode(status));
}

OxBool OxFile::mkdir(const char* path) {
    if (path == nullptr) {
        return OxTrue;
    }
    OxStat status;
    if (OxPlatformStat(path, &status) == 0) {
        if (OxPlatformIsDirectoryMode(status)) {
            return OxTrue;
        }
        OxMsg::Log(OxMsgNotADirectory, path);
        return OxFalse;
    }
    if (OxPlatformErrno() != kErrorNoEntry) {
        return OxTrue;
    }
    if (OxPlatformMkdir(path) == 0) {
        return OxTrue;
    }
    {
        OxKeepErrno keep; // logging may touch errno; perror reports the mkdir's
        OxMsg::Log(OxMsgDirectoryCreate, path);
    }
    OxPlatformPerror("System Error");
    return OxFalse;
}

OxBool OxFile::removeFile(const char* path) {
    if (path == nullptr) {
        return OxFalse;
    }
    if (OxPlatformUnlink(path) == 0) {
        return OxTrue;
    }
    int error = OxPlatformErrno();
    OxMsg::Log(OxMsgFileRemove, path, systemErrorText(error).c_str());
    return OxFalse;
}

char* OxFile::getCWD(char* buffer, unsigned int size, unsigned int drive) {
    bool allocated = false;
    if (buffer == nullptr) {
        buffer = new char[kCwdBufferSize];
        size = kCwdLimit;
        allocated = true;
    }
    int limit = size > static_cast<unsigned int>(INT_MAX) ? INT_MAX : static_cast<int>(size);
    if (OxPlatformGetDriveCwd(buffer, limit, drive) != nullptr) {
        return buffer;
    }
    OxKeepErrno keep;
    OxMsg::Log(OxMsgCwdUnreadable, systemErrorText(keep.value()).c_str());
    if (allocated) {
        delete[] buffer;
    }
    return nullptr;
}

char* OxFile::findFile(const char* name, const OxGList<char*>& directories) {
    if (name == nullptr) {
        return nullptr;
    }
    for (unsigned int i = 0; i < directories.getLength(); i++) {
        const char* directory = directories[i];
        if (directory == nullptr) {
            continue;
        }
        char* fileSpec = makeFileSpec(directory, name);
        if (fileSpec != nullptr && isRegularFile(fileSpec) == OxTrue) {
            return fileSpec;
        }
        delete[] fileSpec;
    }
    return nullptr;
}

void OxFile::logStreamState(std::ios_base::iostate state) {
    if ((state & std::ios_base::eofbit) != 0) {
        OxMsg::Log(OxMsgStreamEnd);
    }
    if ((state & std::ios_base::failbit) != 0) {
        OxMsg::Log(OxMsgStreamFailed);
    }
    if ((state & std::ios_base::badbit) != 0) {
        OxMsg::Log(OxMsgStreamBad);
    }
}
