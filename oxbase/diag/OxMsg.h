// OxMsg.h: logging by message number.
//
// Messages live in a message file (number, type letter, level, printf text);
// code logs them by number with printf arguments. A logged message goes to the
// log file ("  7E: text"), to the callback and to standard error, by its type
// and the settings, and the worst severity logged is kept as the error code.
// All state is static: constructing an OxMsg starts the one subsystem of the
// process, destroying it stops it. Before a start, logging does nothing.
//
//   OxMsg msg("oxbase.msg", "/opt/app/data", "run.log", nullptr);
//   OxMsg::Log(OxMsgFileOpen, "part.xml");   // numbers: OxMsgNumbers.h
//   if (OxMsg::getErrorCode() >= OxErrorError) return 1;
#ifndef OXBASE_DIAG_OXMSG_H
#define OXBASE_DIAG_OXMSG_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"

#include <cstdarg>
#include <fstream>

namespace oxbase {
namespace detail {
class OxMsgTable;
} // namespace detail
} // namespace oxbase

enum OxMsgType : std::uint32_t {
    OxMsgTypeUnknown = 0,
    OxMsgTypeInfo = 1,
    OxMsgTypeWarning = 2,
    OxMsgTypeError = 3,
    OxMsgTypeSevere = 4,
    OxMsgTypeFatal = 5
};

enum OxMsgSubSystemState : std::int32_t { OxMsgInactive = 0, OxMsgActive = 1 };

/// One message of the message file.
struct OxMsgRecord_s {
    std::uint32_t type = OxMsgTypeUnknown; ///< an OxMsgType value
    std::int32_t level = 0;                ///< 0: always logged
    char* text = nullptr;                  ///< the printf format, a new array
};

class OXBASE_API OxMsg {
public:
    using Callback = void (*)(const char* text, void* userData);

    /// Starts the subsystem: reads the message file (working directory first,
    /// then `msgDirectory`) and opens the log file (in `logDirectory`, else the
    /// working directory). A running subsystem is shut down first. Failures
    /// are reported on standard error and leave isValid() OxFalse.
    OxMsg(const char* msgFileName, const char* msgDirectory, const char* logFileName,
          const char* logDirectory);
    OxMsg(const OxMsg&) = delete;
    OxMsg& operator=(const OxMsg&) = delete;
    /// Shuts the subsystem down.
    ~OxMsg();

    /// Logs message `number` with printf arguments, unless its level is below
    /// the threshold. The format buffer doubles from 51,200 bytes as a text
    /// needs; one longer than the last size within an int (51,200 * 2^15)
    /// is cut to it.
    static void Log(unsigned int number, ...);
    /// The same operation as Log by number.
    static void LogError(unsigned int number, ...);
    /// As Log, but the text also reaches standard error for info messages.
    static void LogForce(unsigned int number, ...);
    /// Logs a finished text as it stands (no number, letter or line end added).
    static void Log(const char* text);
    /// As Log(text), always also to standard error.
    static void LogForce(const char* text);
    /// Formats message `number` and logs nothing. The result is the shared
    /// format buffer, valid until the next formatting, or null.
    static const char* LogToString(unsigned int number, ...);

    void openLogFile(const char* logFileName, const char* logDirectory);
    void closeLogFile();
    OxBool isLogFileOpen() { return OxToBool(logFile != nullptr); }
    static std::ofstream* getLogFile() { return logFile; }

    static OxBool isValid() { return valid; }
    static OxBool isVerbose() { return verbose; }
    static void setVerboseState(OxBool state) { verbose = state; }
    static int getMessageThreshold() { return message_threshold; }
    /// Clamped to 1..99.
    static void setMessageThreshold(int threshold);
    static OxErrorCode getErrorCode() { return error_code; }
    static void setErrorCode(OxErrorCode code) { error_code = code; }
    static void resetErrorCode() { error_code = OxErrorNone; }
    static void setMsgCallback(Callback callback) { pMsgCallback = callback; }
    static void setMsgCallbackUserData(void* userData) { pUserData = userData; }

private:
    friend struct OxStatics;

    static void LogCommon(OxBool force, unsigned int number, va_list arguments);
    /// Formats record `number` into `buf`; null when not logged.
    static OxMsgRecord_s* format(unsigned int number, va_list arguments);
    static void shutdown();
    /// The start after the buffer: find and read the message file, open the
    /// log. std::bad_alloc reaches the constructor, which fails the start.
    static void start(const char* messageFileName, const char* msgDirectory, const char* logName,
                      const char* logDirectory);
    static void readMessageFile();
    static std::ofstream* openLog(const char* name, const char* directory);

    static OxMsgSubSystemState state;
    static OxBool valid;
    static OxBool verbose;
    static OxErrorCode error_code;
    static int message_threshold;
    static char* buf;
    static int buflen;
    static std::ifstream* msgFile;
    static std::ofstream* logFile;
    /// The records by number: texts at their size and an index searched by
    /// halving (see OxMsgTable). It owns the records of msgList.
    static oxbase::detail::OxMsgTable* msgTable;
    static OxGList<OxMsgRecord_s*> msgList; // defined in oxbase/core/OxStatics.cpp
    static char* msgFileName;
    static char* logFileName;
    static Callback pMsgCallback;
    static void* pUserData;
};

#endif
