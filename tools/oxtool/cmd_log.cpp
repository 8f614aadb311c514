// oxtool log: starts the message subsystem and logs messages by number.
//
//   oxtool log MSGFILE LOGFILE NUMBER [ARG...]
//
// Every ARG is passed as a text argument, so the message's text must take
// only %s conversions. Prints the worst error code afterwards.
#include "OxToolCommand.h"

#include "oxbase/diag/OxMsg.h"

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <string>

namespace {
const char* errorCodeName(OxErrorCode code) {
    switch (code) {
    case OxErrorNone:
        return "none";
    case OxErrorWarning:
        return "warning";
    case OxErrorError:
        return "error";
    case OxErrorSevere:
        return "severe";
    case OxErrorFatal:
        return "fatal";
    }
    return "unknown";
}

void reportErrorCode() {
    OxErrorCode code = OxMsg::getErrorCode();
    std::printf("worst error code: %d (%s)\n", static_cast<int>(code), errorCodeName(code));
}

int runLog(int argc, char** argv) {
    if (argc < 4) {
        std::fprintf(stderr, "usage: oxtool log MSGFILE LOGFILE NUMBER [ARG...]\n");
        return 2;
    }
    OxMsg msg(argv[1], nullptr, argv[2], nullptr);
    if (OxMsg::isValid() != OxTrue) {
        return 1;
    }
    unsigned int number = static_cast<unsigned int>(std::strtoul(argv[3], nullptr, 10));
    const char* a[4] = {"", "", "", ""};
    for (int i = 4; i < argc && i < 8; i++) {
        a[i - 4] = argv[i];
    }
    OxMsg::Log(number, a[0], a[1], a[2], a[3]);
    reportErrorCode();
    return 0;
}

// Demo: the default message file, a log in the scratch directory, a few
// messages of each kind, and the log as it was written.
int demoLog(const OxToolDemoContext& context) {
    std::string logPath = oxtoolJoin(context.outDir, "demo.log");
    {
        OxMsg msg("oxbase.msg", context.dataDir.c_str(), logPath.c_str(), nullptr);
        if (OxMsg::isValid() != OxTrue) {
            return 1;
        }
        OxMsg::Log(579, "assembly.xml");                         // info: log file only
        OxMsg::Log(152);                                         // warning
        OxMsg::Log(1, "missing-part.xml");                       // error
        OxMsg::Log(566, "assembly.xml", 12u, 4u, "<part id=3>"); // place of a syntax error
        reportErrorCode();
    }
    std::ifstream log(logPath);
    std::cout << "---- " << logPath << "\n" << log.rdbuf() << std::flush;
    return 0;
}

OxToolRegistration registration{{"log", "MSGFILE LOGFILE NUMBER [ARG...]",
                                 "log a message by number, print the error code", runLog, demoLog,
                                 10}};
} // namespace
