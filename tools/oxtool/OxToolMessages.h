// OxToolMessages.h: the message subsystem as oxtool runs it.
//
// Finds the message file (an installed oxtool finds the one installed beside
// it, wherever the installation was moved), starts OxMsg with it and the log
// file, and tells each logged message apart: its severity (the error code it
// raises), the library's message number and, for the numbers that carry one,
// the line of the document. The number and the line are recovered from the
// formatted text by matching it against the texts of the message file, so
// they are found whatever words a message file uses.
//
//   OxToolMessageSession session;
//   if (!session.start(oxtoolFindMessageFile(exe), "", false)) return kOxToolFailed;
//   std::vector<OxToolMessage> seen;
//   OxToolMessageCapture capture(&seen, true, false);   // off stderr, into the log
#ifndef OXTOOL_OXTOOLMESSAGES_H
#define OXTOOL_OXTOOLMESSAGES_H

#include "oxbase/core/OxTypes.h"

#include <memory>
#include <sstream>
#include <streambuf>
#include <string>
#include <vector>

class OxMsg;

/// The places where an oxtool at `executable` looks for the default message
/// file, in order: the data directory of the installation it belongs to
/// (found from its own directory), the sample data of the source tree it was
/// built in, and the data directory the build was configured to install to.
std::vector<std::string> oxtoolMessageFileCandidates(const std::string& executable);
/// The first candidate that is a file, or empty.
std::string oxtoolFindMessageFile(const std::string& executable);

/// One logged message.
struct OxToolMessage {
    OxErrorCode severity = OxErrorNone; ///< OxErrorNone for info and unknown types
    unsigned int number = 0;            ///< 0 when the text matched no library number
    unsigned int line = 0;              ///< document line, 0 when the text has none
    std::string text;
};

/// The running message subsystem of the process: started once by main.
class OxToolMessageSession {
public:
    OxToolMessageSession();
    ~OxToolMessageSession();
    OxToolMessageSession(const OxToolMessageSession&) = delete;
    OxToolMessageSession& operator=(const OxToolMessageSession&) = delete;

    /// Starts OxMsg on `messageFile` with `logFile` (none when empty); false,
    /// with a report on standard error, when either cannot be opened.
    bool start(const std::string& messageFile, const std::string& logFile, bool verbose);
    /// Stops the subsystem (the error code stays).
    void stop();

private:
    std::unique_ptr<OxMsg> msg;
};

/// While it lives, every logged message is appended to `sink`, whose owner
/// decides what it counts for the exit status (null: each message counts). With `offStderr` the
/// library's standard error (its messages, walk and list texts) is kept in captured() instead; with
/// `offLog` nothing reaches the log file. Nested captures stack.
class OxToolMessageCapture {
public:
    OxToolMessageCapture(std::vector<OxToolMessage>* sink, bool offStderr, bool offLog);
    ~OxToolMessageCapture();
    OxToolMessageCapture(const OxToolMessageCapture&) = delete;
    OxToolMessageCapture& operator=(const OxToolMessageCapture&) = delete;

    /// What the library wrote to standard error meanwhile.
    std::string captured() const { return errors.str(); }

private:
    std::vector<OxToolMessage>* previousSink;
    std::ostringstream errors;
    std::streambuf* savedError = nullptr;
    std::streambuf* savedLog = nullptr;
    std::ostringstream discardedLog;
};

/// "warning", "error", "severe", "fatal" or "info".
const char* oxtoolSeverityName(OxErrorCode severity);

#endif
