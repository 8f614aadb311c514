#include "oxbase/diag/OxMsg.h"

#include "oxbase/core/OxString.h"
#include "oxbase/core/detail/OxNoMemory.h"
#include "oxbase/diag/detail/OxMsgTable.h"
#include "oxbase/platform/detail/OxPlatformFs.h"
#include "oxbase/platform/detail/OxPlatformPath.h"

#include <climits>
#include <cstdio>
#include <cstring>
#include <iomanip>
#include <iostream>
#include <memory>
#include <new>
#include <string>

using namespace oxbase::detail;

// All state is process-wide. The message list itself is defined with the other
// ordered statics in oxbase/core/OxStatics.cpp.
OxMsgSubSystemState OxMsg::state = OxMsgInactive;
OxBool OxMsg::valid = OxFalse;
OxBool OxMsg::verbose = OxFalse;
OxErrorCode OxMsg::error_code = OxErrorNone;
int OxMsg::message_threshold = 99;
char* OxMsg::buf = nullptr;
int OxMsg::buflen = 0;
std::ifstream* OxMsg::msgFile = nullptr;
std::ofstream* OxMsg::logFile = nullptr;
oxbase::detail::OxMsgTable* OxMsg::msgTable = nullptr;
char* OxMsg::msgFileName = nullptr;
char* OxMsg::logFileName = nullptr;
OxMsg::Callback OxMsg::pMsgCallback = nullptr;
void* OxMsg::pUserData = nullptr;

namespace {
constexpr int kInitialBufferSize = 51200;
constexpr std::streamsize kTextLimit = 5120; // text of a line: at most 5,119 characters

/// Letter of a message type in the message file and the log; blank when unknown.
char typeLetter(std::uint32_t type) {
    switch (type) {
    case OxMsgTypeInfo:
        return 'I';
    case OxMsgTypeWarning:
        return 'W';
    case OxMsgTypeError:
        return 'E';
    case OxMsgTypeSevere:
        return 'S';
    case OxMsgTypeFatal:
        return 'F';
    default:
        return ' ';
    }
}

std::uint32_t typeFromLetter(char letter) {
    for (std::uint32_t type = OxMsgTypeInfo; type <= OxMsgTypeFatal; type++) {
        if (typeLetter(type) == letter) {
            return type;
        }
    }
    return OxMsgTypeUnknown;
}

OxErrorCode severityOf(std::uint32_t type) {
    switch (type) {
    case OxMsgTypeWarning:
        return OxErrorWarning;
    case OxMsgTypeError:
        return OxErrorError;
    case OxMsgTypeSevere:
        return OxErrorSevere;
    case OxMsgTypeFatal:
        return OxErrorFatal;
    default:
        return OxErrorNone;
    }
}

/// A trimmed copy of `name`, null when nothing is left.
std::unique_ptr<char[]> trimmedCopy(const char* name) {
    std::unique_ptr<char[]> copy(OxString::dup(name));
    OxString::stripWhite(copy.get());
    if (copy != nullptr && copy[0] == '\0') {
        copy.reset();
    }
    return copy;
}

/// Path of a file named `name` in `directory`, or in the working directory
/// when `directory` is null; an absolute name stands as it is. Empty when the
/// working directory is needed and cannot be read.
std::string pathIn(const char* directory, const char* name) {
    if (OxPlatformIsAbsolute(name)) {
        return name;
    }
    std::string base;
    if (directory != nullptr) {
        base = directory;
    } else if (!OxPlatformGetCwd(base)) {
        return std::string();
    }
    return OxPlatformJoinPath(base, name);
}

/// Reads the rest of a line into `text` (at most 5,119 characters); the
/// carriage return of a CR LF line end is not part of the text.
void readText(std::istream& in, char* text) {
    text[0] = '\0';
    in.getline(text, kTextLimit, '\n');
    size_t length = std::strlen(text);
    if (length > 0 && text[length - 1] == '\r') {
        text[length - 1] = '\0';
    }
}

template <class Stream> void closeAndDelete(Stream*& stream) {
    if (stream != nullptr) {
        stream->close();
        delete stream;
        stream = nullptr;
    }
}
} // namespace

OxMsg::OxMsg(const char* messageFileName, const char* msgDirectory, const char* logName,
             const char* logDirectory) {
    if (state == OxMsgActive) {
        shutdown();
    }
    if (buf == nullptr) {
        if (!withMemory([] { buf = new char[kInitialBufferSize]; })) {
            std::cerr << "Message file buffer is NULL."
                      << "\n";
            buflen = 0;
            return;
        }
        buflen = kInitialBufferSize;
    }
    message_threshold = 99;
    error_code = OxErrorNone;
    if (messageFileName == nullptr) {
        std::cerr << "Message file name is NULL."
                  << "\n";
        return;
    }
    // Without memory on the way the start fails like any other step: the
    // subsystem does not run, and what was read stays until the shutdown.
    if (!withMemory([&] { start(messageFileName, msgDirectory, logName, logDirectory); })) {
        closeAndDelete(msgFile);
        reportNoMemory();
    }
}

void OxMsg::start(const char* messageFileName, const char* msgDirectory, const char* logName,
                  const char* logDirectory) {
    // The file is looked for in the working directory first, then in
    // `msgDirectory`; an absolute name is opened as it stands. An empty name
    // has no file to find and fails like a missing one.
    std::unique_ptr<char[]> name = trimmedCopy(messageFileName);
    const char* shownName = name != nullptr ? name.get() : "";
    std::string directoryPath;
    std::string opened;
    auto tryOpen = [&opened](const std::string& path) {
        if (path.empty()) {
            return false;
        }
        // Only a regular file is read: a directory or a FIFO planted under
        // the name counts as no file, and the next place is tried.
        msgFile = OxPlatformOpenInput(path.c_str(), false);
        if (msgFile->good()) {
            opened = path;
            return true;
        }
        closeAndDelete(msgFile);
        return false;
    };
    bool found = false;
    if (name != nullptr) {
        if (OxPlatformIsAbsolute(name.get())) {
            found = tryOpen(name.get());
        } else {
            found = tryOpen(pathIn(nullptr, name.get()));
            if (!found && msgDirectory != nullptr) {
                directoryPath = pathIn(msgDirectory, name.get());
                found = tryOpen(directoryPath);
            }
        }
    }
    if (!found) {
        std::cerr << "Unable to open " << shownName << "\n" << std::flush;
        std::cerr << "Tried ";
        if (!directoryPath.empty()) {
            std::cerr << directoryPath << " and ";
        }
        std::cerr << shownName << ","
                  << "\n"
                  << std::flush;
        std::string cwd;
        if (OxPlatformGetCwd(cwd)) {
            std::cerr << "in current working directory, " << cwd << "\n" << std::flush;
        }
        return;
    }

    // A start that failed at its log file keeps its name until shutdown; a
    // new start before that replaces it.
    char* fullName = OxString::dup(opened.c_str());
    delete[] msgFileName;
    msgFileName = fullName;
    if (msgTable == nullptr) {
        msgTable = new OxMsgTable(msgList);
    }
    readMessageFile();
    closeAndDelete(msgFile);

    std::unique_ptr<char[]> trimmedLog = trimmedCopy(logName);
    if (trimmedLog != nullptr) {
        logFile = openLog(trimmedLog.get(), logDirectory);
        if (logFile == nullptr) {
            return;
        }
    }
    valid = OxTrue;
    state = OxMsgActive;
}

OxMsg::~OxMsg() {
    shutdown();
}

void OxMsg::readMessageFile() {
    std::ifstream& in = *msgFile;
    unsigned int lineCount = 0;
    unsigned int number = 0;
    char text[kTextLimit + 1];
    while (in.good()) {
        in >> std::dec >> number;
        lineCount++;
        if (in.fail()) {
            break;
        }
        if (number == 0) {
            in.ignore(kTextLimit, '\n'); // a comment line
            continue;
        }
        if (msgTable->knows(number)) {
            // A known number continues the text of its message on a new line.
            readText(in, text);
            msgTable->continueText(number, text);
            continue;
        }
        std::uint32_t type = OxMsgTypeUnknown;
        std::int32_t level = 0;
        char c = '\0';
        in >> c;
        if (c != ',') {
            std::cerr << " No message delimiter in message number " << number
                      << ".  Setting message type to unknown."
                      << "\n"
                      << std::flush;
        } else {
            c = '\0';
            in >> c;
            type = typeFromLetter(c);
        }
        c = '\0';
        in >> c;
        if (c != ',') {
            std::cerr << " No message delimiter in message number " << number
                      << ".  Setting message level to default value."
                      << "\n"
                      << std::flush;
        } else {
            in >> std::dec >> level;
        }
        readText(in, text);
        msgTable->add(number, type, level, text);
    }
    // Joined texts are stored and every new text is checked, also when the
    // reading ended early: what was read stays in force.
    msgTable->finish();
    if (!in.eof() && in.fail()) {
        std::cerr << "Error reading message file " << msgFileName << " at line " << lineCount
                  << "\n"
                  << std::flush;
    }
}

std::ofstream* OxMsg::openLog(const char* name, const char* directory) {
    std::string path = pathIn(directory, name);
    std::unique_ptr<char[]> fullName(OxString::dup(path.c_str()));
    std::unique_ptr<std::ofstream> stream(
        new std::ofstream(OxPlatformNativePath(path.c_str()), std::ios::out | std::ios::trunc));
    if (path.empty() || !stream->good()) {
        std::cerr << " Unable to open " << path << "\n" << std::flush;
        return nullptr;
    }
    stream->setf(std::ios::left, std::ios::adjustfield);
    delete[] logFileName;
    logFileName = fullName.release();
    return stream.release();
}

void OxMsg::openLogFile(const char* name, const char* directory) {
    if (valid != OxTrue) {
        return;
    }
    if (logFile != nullptr) {
        closeAndDelete(logFile);
        delete[] logFileName;
        logFileName = nullptr;
    }
    // Without memory for the name or the stream, logging goes on without a
    // log file, as after any other failure to open one.
    bool opened = withMemory([&] {
        std::unique_ptr<char[]> trimmed = trimmedCopy(name);
        if (trimmed == nullptr) {
            std::cerr << "Log file name is null.  No logging will be done."
                      << "\n"
                      << std::flush;
            return;
        }
        logFile = openLog(trimmed.get(), directory);
    });
    if (!opened) {
        reportNoMemory();
    }
}

void OxMsg::closeLogFile() {
    if (valid != OxTrue || logFile == nullptr) {
        return;
    }
    closeAndDelete(logFile);
    delete[] logFileName;
    logFileName = nullptr;
}

void OxMsg::setMessageThreshold(int threshold) {
    message_threshold = threshold < 1 ? 1 : (threshold > 99 ? 99 : threshold);
}

OxMsgRecord_s* OxMsg::format(unsigned int number, va_list arguments) {
    if (valid != OxTrue) {
        return nullptr;
    }
    OxMsgRecord_s* record = msgTable != nullptr ? msgTable->find(number) : nullptr;
    if (record == nullptr) {
        std::cerr << " There is no message at index " << number << "\n" << std::flush;
        return nullptr;
    }
    if (record->level != 0 && message_threshold > record->level) {
        return nullptr;
    }
    const char* text = record->text != nullptr ? record->text : "";
    // The buffer only grows, by doubling, until the formatted text fits.
    bool retriedError = false;
    for (;;) {
        if (buf == nullptr) {
            return nullptr;
        }
        va_list attempt;
        va_copy(attempt, arguments);
        int written = std::vsnprintf(buf, static_cast<size_t>(buflen), text, attempt);
        va_end(attempt);
        if (written >= 0 && written < buflen) {
            break;
        }
        if (written < 0 && retriedError) {
            buf[0] = '\0';
            break; // the text cannot be formatted: log what is there
        }
        retriedError = retriedError || written < 0;
        // The size is an int: a buffer that cannot double within that range
        // keeps the text cut to it, as vsnprintf left it, terminated.
        if (buflen > INT_MAX / 2) {
            if (written < 0) {
                buf[0] = '\0';
            }
            break;
        }
        int grown = buflen;
        do {
            grown *= 2;
        } while (grown <= written && grown <= INT_MAX / 2);
        delete[] buf;
        buf = nullptr;
        buflen = withMemory([grown] { buf = new char[static_cast<size_t>(grown)]; }) ? grown : 0;
    }
    buf[buflen - 1] = '\0';
    return record;
}

void OxMsg::LogCommon(OxBool force, unsigned int number, va_list arguments) {
    OxMsgRecord_s* record = format(number, arguments);
    if (record == nullptr) {
        return;
    }
    char letter = typeLetter(record->type);
    OxErrorCode severity = severityOf(record->type);
    if (error_code < severity) {
        error_code = severity;
    }
    if (logFile != nullptr) {
        // The number right-adjusted in a field of at least 3, the letter, ": ".
        char head[24];
        int headLength = std::snprintf(head, sizeof head, "%3u%c: ", number, letter);
        logFile->write(head, headLength);
        logFile->write(buf, static_cast<std::streamsize>(std::strlen(buf)));
        logFile->put('\n');
        logFile->flush();
    }
    if (pMsgCallback != nullptr) {
        pMsgCallback(buf, pUserData);
    }
    bool quiet = force != OxTrue && letter == 'I' && verbose != OxTrue && logFile != nullptr;
    if (!quiet) {
        std::cerr << buf << "\n" << std::flush;
    }
}

void OxMsg::Log(unsigned int number, ...) {
    va_list arguments;
    va_start(arguments, number);
    LogCommon(OxFalse, number, arguments);
    va_end(arguments);
}

void OxMsg::LogError(unsigned int number, ...) {
    va_list arguments;
    va_start(arguments, number);
    LogCommon(OxFalse, number, arguments);
    va_end(arguments);
}

void OxMsg::LogForce(unsigned int number, ...) {
    va_list arguments;
    va_start(arguments, number);
    LogCommon(OxTrue, number, arguments);
    va_end(arguments);
}

const char* OxMsg::LogToString(unsigned int number, ...) {
    va_list arguments;
    va_start(arguments, number);
    OxMsgRecord_s* record = format(number, arguments);
    va_end(arguments);
    return record != nullptr ? buf : nullptr;
}

namespace {
void logText(const char* text, bool force, std::ofstream* log, OxMsg::Callback callback,
             void* userData, bool verbose) {
    if (log != nullptr) {
        *log << text << std::flush;
    }
    if (callback != nullptr) {
        callback(text, userData);
    }
    if (force || verbose || log == nullptr) {
        std::cerr << text << std::flush;
    }
}
} // namespace

void OxMsg::Log(const char* text) {
    if (text == nullptr || valid != OxTrue) {
        return;
    }
    logText(text, false, logFile, pMsgCallback, pUserData, verbose == OxTrue);
}

void OxMsg::LogForce(const char* text) {
    if (text == nullptr || valid != OxTrue) {
        return;
    }
    logText(text, true, logFile, pMsgCallback, pUserData, verbose == OxTrue);
}

void OxMsg::shutdown() {
    delete[] buf;
    buf = nullptr;
    buflen = 0;
    closeAndDelete(logFile);
    closeAndDelete(msgFile);
    delete[] msgFileName;
    msgFileName = nullptr;
    delete[] logFileName;
    logFileName = nullptr;
    // The table releases the records, their texts and the list's array.
    delete msgTable;
    msgTable = nullptr;
    msgList.makeEmpty();
    message_threshold = 99;
    pMsgCallback = nullptr;
    pUserData = nullptr;
    valid = OxFalse;
    verbose = OxFalse;
    state = OxMsgInactive;
}
