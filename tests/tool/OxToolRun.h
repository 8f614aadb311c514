// Helpers of the oxtool tests: run the built oxtool on a command line, in a
// directory, and look into what it printed.
#ifndef OXBASE_TESTS_TOOL_OXTOOLRUN_H
#define OXBASE_TESTS_TOOL_OXTOOLRUN_H

#include "support/OxTestSupport.h"

#include <string>

namespace oxtest {

/// Runs "oxtool ARGUMENTS" with the working directory `dir` (none: the
/// test's own) and standard input from the file `input`.
inline CommandResult oxtool(const std::string& arguments, const std::string& dir = "",
                            const std::string& input = "") {
#ifdef _WIN32
    // cmd.exe changes the drive only when asked to (/d).
    std::string command = dir.empty() ? "" : "cd /d \"" + dir + "\" && ";
#else
    std::string command = dir.empty() ? "" : "cd \"" + dir + "\" && ";
#endif
    return runCommand(command + "\"" + OXTOOL_PATH + "\" " + arguments, input);
}

/// How many times `part` occurs in `text`.
inline size_t count(const std::string& text, const std::string& part) {
    size_t found = 0;
    for (size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + 1)) {
        found++;
    }
    return found;
}

inline bool contains(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

} // namespace oxtest

#endif
