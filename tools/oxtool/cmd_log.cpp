// oxtool log: starts the message subsystem and logs a message by number.
//
//   oxtool log [--messages FILE] [--log FILE] NUMBER [ARG...]
//   oxtool log MSGFILE LOGFILE NUMBER [ARG...]
//
// The second form names the message and log files as operands; it is taken
// when the first operand is not a decimal number. Every ARG is passed as a
// text argument, so the message's text must take only %s conversions. Prints
// the worst error code afterwards, which is also the exit status.
#include "OxToolCommand.h"
#include "OxToolFiles.h"
#include "OxToolMessages.h"

#include "oxbase/diag/OxMsg.h"

#include <cstdio>
#include <fstream>
#include <iostream>
#include <string>

namespace {

bool isDecimal(const std::string& text) {
    return !text.empty() && text.find_first_not_of("0123456789") == std::string::npos;
}

int runLog(const OxToolContext& context) {
    std::vector<std::string> operands = context.operands;
    OxToolMessageSession ownFiles;
    if (!isDecimal(operands[0])) {
        // MSGFILE LOGFILE NUMBER [ARG...]
        if (operands.size() < 3) {
            std::fprintf(stderr, "oxtool log: missing operand (usage: oxtool log MSGFILE LOGFILE "
                                 "NUMBER [ARG...])\n");
            return kOxToolUsage;
        }
        if (operands[0] == "-" || operands[1] == "-") {
            std::fprintf(stderr, "oxtool log: the message and log files must be files; '-' is "
                                 "not accepted\n");
            return kOxToolUsage;
        }
        if (!isDecimal(operands[2])) {
            std::fprintf(stderr, "oxtool log: '%s' is not a message number\n", operands[2].c_str());
            return kOxToolUsage;
        }
        if (!oxtoolIsFile(operands[0])) {
            oxtoolReport(OxErrorError, "message file '" + operands[0] + "' not found");
            return kOxToolFailed;
        }
        if (!ownFiles.start(operands[0], operands[1], context.verbose)) {
            oxtoolReport(OxErrorError, "cannot start the message subsystem with " + operands[0] +
                                           " and log " + operands[1]);
            return kOxToolFailed;
        }
        operands.erase(operands.begin(), operands.begin() + 2);
    }
    long long number = 0;
    if (!oxtoolParseNumber(operands[0], 0, 0xFFFFFFFFll, number)) {
        std::fprintf(stderr, "oxtool log: '%s' is not a message number\n", operands[0].c_str());
        return kOxToolUsage;
    }
    if (operands.size() > 5) {
        std::fprintf(stderr, "oxtool log: at most four arguments follow the number\n");
        return kOxToolUsage;
    }
    const char* a[4] = {"", "", "", ""};
    for (size_t i = 1; i < operands.size(); i++) {
        a[i - 1] = operands[i].c_str();
    }
    OxMsg::Log(static_cast<unsigned int>(number), a[0], a[1], a[2], a[3]);
    OxErrorCode code = oxtoolWorst();
    std::printf("worst error code: %d (%s)\n", static_cast<int>(code),
                code == OxErrorNone ? "none" : oxtoolSeverityName(code));
    return 0;
}

// Demo: the default message file, a log in the scratch directory, a few
// messages of each kind, and the log as it was written.
int demoLog(const OxToolDemoContext& context) {
    std::string logPath = oxtoolJoin(context.outDir, "demo.log");
    {
        OxMsg msg(oxtoolLibraryPath(context.messageFile).c_str(), nullptr,
                  oxtoolLibraryPath(logPath).c_str(), nullptr);
        if (OxMsg::isValid() != OxTrue) {
            return 1;
        }
        OxMsg::Log(579, "assembly.xml");                         // info: log file only
        OxMsg::Log(152);                                         // warning
        OxMsg::Log(1, "missing-part.xml");                       // error
        OxMsg::Log(566, "assembly.xml", 12u, 4u, "<part id=3>"); // place of a syntax error
        OxErrorCode code = OxMsg::getErrorCode();
        std::printf("worst error code: %d (%s)\n", static_cast<int>(code),
                    code == OxErrorNone ? "none" : oxtoolSeverityName(code));
    }
    std::ifstream log(logPath);
    std::cout << "---- " << logPath << "\n" << log.rdbuf() << std::flush;
    return 0;
}

OxToolRegistration registration{
    {"log",
     "NUMBER [ARG...] | MSGFILE LOGFILE NUMBER [ARG...]",
     "log a message by number, print the worst error code",
     "Logs message NUMBER of the message file with up to four text arguments (the\n"
     "message's text must take only %s conversions) and prints the worst error code.\n"
     "The message goes to the log file (--log), and to standard error unless it is an\n"
     "information message and a log file is open. When the first operand is not a\n"
     "number, the first two operands are the message file and the log file.\n",
     {},
     1,
     -1,
     runLog,
     demoLog,
     10}};
} // namespace
