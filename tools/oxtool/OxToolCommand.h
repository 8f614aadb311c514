// OxToolCommand.h: how the subcommands of oxtool register themselves, and
// what every command shares: its parsed command line, the exit status rule
// and the tool's own reports.
//
// Each subcommand lives in its own source file and registers itself at load
// with a static OxToolRegistration, so that adding a command touches no other
// file. The framework (main.cpp) parses the options every command has
// (-h/--help, --version, --messages, --log, --verbose) and the command's own,
// refuses unknown options and wrong operand counts with status 2, starts the
// message subsystem, runs the command and turns the worst error code into the
// exit status:
//
//   int runPaths(const OxToolContext& context) { ... context.operands ... }
//   OxToolRegistration reg{{"paths", "PATH...", "show the path operations",
//                           "Details for `oxtool paths --help`.", {}, 1, -1, runPaths}};
//
// A command may also add a step to `oxtool demo`, which runs every step over
// the bundled sample data, in the order of their `demoOrder`.
#ifndef OXTOOL_OXTOOLCOMMAND_H
#define OXTOOL_OXTOOLCOMMAND_H

#include "oxbase/core/OxTypes.h"
#include "oxbase/platform/OxStrstream.h"

#include <string>
#include <utility>
#include <vector>

/// Exit statuses besides the error codes 0, 4, 8, 12 and 16: a command line
/// that cannot be obeyed. A command that cannot do its work returns
/// kOxToolFailed, the error code of an error.
constexpr int kOxToolUsage = 2;
constexpr int kOxToolFailed = 8;

/// One option of a command: "--name" alone, or "--name VALUE" when
/// `argument` names the value.
struct OxToolOption {
    const char* name;
    const char* argument; ///< null for a flag
    const char* help;
};

/// What a command is given: its operands and options in command-line order,
/// and the settings every command shares.
struct OxToolContext {
    const char* command = "";
    std::vector<std::string> operands;
    /// The command's own options in the order given: name (without "--")
    /// and value ("" for a flag).
    std::vector<std::pair<std::string, std::string>> options;
    std::string messageFile;       ///< the message file in use
    bool messageFileGiven = false; ///< by --messages
    std::string logFile;           ///< --log, or empty
    bool verbose = false;
    std::string executable; ///< this program's path (absolute), or empty

    /// Whether option `name` was given.
    bool has(const char* name) const;
    /// The value of the last option `name`, or `fallback`.
    std::string value(const char* name, const std::string& fallback = "") const;
    /// Every value of option `name`, in order.
    std::vector<std::string> values(const char* name) const;
};

/// What a demo step gets: the sample data directory, a scratch directory
/// for what it writes, and the message file to start its messages with.
struct OxToolDemoContext {
    std::string dataDir;
    std::string outDir;
    std::string messageFile;
};

struct OxToolCommand {
    const char* name;
    const char* usage;   ///< options and operands, as shown by `oxtool help`
    const char* summary; ///< one line of help
    const char* help;    ///< the rest of `oxtool NAME --help`
    std::vector<OxToolOption> options;
    int minOperands = 0;
    int maxOperands = -1; ///< -1: no limit
    int (*run)(const OxToolContext& context) = nullptr;
    int (*demo)(const OxToolDemoContext& context) = nullptr;
    int demoOrder = 100;
};

struct OxToolRegistration {
    explicit OxToolRegistration(const OxToolCommand& command);
};

/// Every registered command (the demo included), in registration order.
const std::vector<OxToolCommand>& oxtoolCommands();

/// The text written to `stream` so far (the stream stays usable).
std::string oxtoolStreamText(std::ostrstream& stream);

/// Joins a directory and a file name with '/'.
std::string oxtoolJoin(const std::string& dir, const std::string& name);

/// The tool's own report, for what no library message covers: "oxtool CMD:
/// warning: TEXT" (or error, severe, fatal) on standard error and in the log
/// file when one is open. Raises the exit status to `severity`.
void oxtoolReport(OxErrorCode severity, const std::string& text);

/// Raises the exit status to at least `severity` without a report.
void oxtoolRaise(OxErrorCode severity);

/// The worst severity reported or logged so far in this process.
OxErrorCode oxtoolWorst();

/// Parses a decimal number within [minimum, maximum]: digits only, an
/// optional leading '-' when `minimum` is negative. False for anything else.
bool oxtoolParseNumber(const std::string& text, long long minimum, long long maximum,
                       long long& value);

#endif
