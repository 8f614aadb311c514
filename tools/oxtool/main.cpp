// oxtool: command-line front end to OxBase for translator developers.
//
//   oxtool check PATH...             check documents, with lint warnings
//   oxtool demo [DATADIR [OUTDIR]]   run every demo step over the sample data
//   oxtool help [COMMAND]            list the commands, or one command's help
//   oxtool COMMAND [OPTIONS] ARGS... run one command (-h for its help)
//
// The framework here parses what every command shares, starts the message
// subsystem and turns the worst error code logged into the exit status.
#include "OxToolCommand.h"
#include "OxToolFiles.h"
#include "OxToolMessages.h"

#include "oxbase/OxVersion.h"
#include "oxbase/diag/OxMsg.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <vector>

#ifndef OXTOOL_DEFAULT_DATA_DIR
#define OXTOOL_DEFAULT_DATA_DIR "data"
#endif

namespace {

std::vector<OxToolCommand>& registry() {
    static std::vector<OxToolCommand> commands;
    return commands;
}

OxErrorCode& worstSeverity() {
    static OxErrorCode worst = OxErrorNone;
    return worst;
}

/// The command whose report lines carry its name.
const char*& currentCommand() {
    static const char* name = nullptr;
    return name;
}

const char* const kCommonOptions =
    "common options:\n"
    "  -h, --help         print this help on standard output and exit with status 0\n"
    "  --version          print the version of oxtool and OxBase and exit\n"
    "  --messages FILE    the message file (default: oxbase.msg of the installation\n"
    "                     this oxtool belongs to, else the source tree's\n"
    "                     data/oxbase.msg; --verbose names the one in use)\n"
    "  --log FILE         also write every message to FILE (the file is replaced)\n"
    "  --verbose          info messages also on standard error, and more detail\n"
    "  --                 every argument behind it is an operand\n"
    "  A file operand \"-\" is standard input or output where the command says so,\n"
    "  and is refused everywhere else.\n";

const char* const kExitStatus =
    "exit status (the worst error code logged, or 2):\n"
    "  0   nothing worse than information\n"
    "  4   a warning (a message of type W, or a lint warning of oxtool itself)\n"
    "  8   an error: a message of type E, or the command could not do its work\n"
    "      (a file or directory that cannot be read or written)\n"
    "  12  a severe error (type S)\n"
    "  16  a fatal error (type F)\n"
    "  2   a usage error: an unknown option, a missing or extra operand, an option\n"
    "      value or operand that must be a number and is not; nothing was done\n";

const OxToolCommand* findCommand(const std::string& name) {
    for (const OxToolCommand& command : registry()) {
        if (name == command.name) {
            return &command;
        }
    }
    return nullptr;
}

void printVersion() {
    std::printf("oxtool %s (OxBase %s)\n", OXBASE_VERSION_STRING, OXBASE_VERSION_STRING);
}

void printOverview(std::FILE* out) {
    std::fprintf(out, "usage: oxtool COMMAND [OPTIONS] [OPERANDS...]\n"
                      "       oxtool help [COMMAND] | --help | --version\n\ncommands:\n");
    std::vector<OxToolCommand> sorted = registry();
    std::sort(sorted.begin(), sorted.end(), [](const OxToolCommand& a, const OxToolCommand& b) {
        return std::strcmp(a.name, b.name) < 0;
    });
    for (const OxToolCommand& command : sorted) {
        std::fprintf(out, "  %-9s %s\n", command.name, command.summary);
    }
    std::fprintf(out,
                 "\n'oxtool COMMAND --help' tells the operands and options of a command.\n\n"
                 "%s\n%s",
                 kCommonOptions, kExitStatus);
}

void printCommandHelp(const OxToolCommand& command) {
    std::printf("usage: oxtool %s [OPTIONS] %s\n%s.\n\n", command.name, command.usage,
                command.summary);
    if (command.help != nullptr && *command.help != '\0') {
        std::printf("%s\n", command.help);
    }
    if (!command.options.empty()) {
        std::printf("options:\n");
        for (const OxToolOption& option : command.options) {
            std::string head = std::string("--") + option.name;
            if (option.argument != nullptr) {
                head += std::string(" ") + option.argument;
            }
            std::printf("  %-18s %s\n", head.c_str(), option.help);
        }
        std::printf("\n");
    }
    std::printf("%s\n%s", kCommonOptions, kExitStatus);
}

int usageError(const std::string& command, const std::string& text) {
    std::fprintf(stderr, "oxtool%s%s: %s\n", command.empty() ? "" : " ", command.c_str(),
                 text.c_str());
    std::fprintf(stderr, "try 'oxtool %s%s--help'\n", command.c_str(), command.empty() ? "" : " ");
    return kOxToolUsage;
}

/// What the command line says beyond the command's own context.
struct Parsed {
    bool help = false;
    bool version = false;
    bool messagesGiven = false;
};

/// Parses argv[first..] for `command` into `context`; 0 or kOxToolUsage
/// (after the message on standard error).
int parseArguments(const OxToolCommand& command, int argc, char** argv, int first,
                   OxToolContext& context, Parsed& parsed) {
    bool optionsEnded = false;
    for (int i = first; i < argc; i++) {
        std::string argument = argv[i];
        if (optionsEnded || argument == "-" || argument.empty() || argument[0] != '-') {
            context.operands.push_back(argument);
            continue;
        }
        if (argument == "--") {
            optionsEnded = true;
            continue;
        }
        if (argument == "-h" || argument == "--help") {
            parsed.help = true;
            continue;
        }
        if (argument.compare(0, 2, "--") != 0) {
            return usageError(command.name, "unknown option '" + argument + "'");
        }
        std::string name = argument.substr(2);
        std::string value;
        bool inlineValue = false;
        size_t equals = name.find('=');
        if (equals != std::string::npos) {
            value = name.substr(equals + 1);
            name = name.substr(0, equals);
            inlineValue = true;
        }
        const char* argumentName = nullptr;
        bool known = false;
        bool common = true;
        if (name == "version" || name == "verbose") {
            known = true;
        } else if (name == "messages" || name == "log") {
            known = true;
            argumentName = "FILE";
        } else {
            common = false;
            for (const OxToolOption& option : command.options) {
                if (name == option.name) {
                    known = true;
                    argumentName = option.argument;
                }
            }
        }
        if (!known) {
            return usageError(command.name, "unknown option '--" + name + "'");
        }
        if (argumentName != nullptr && !inlineValue) {
            // An argument named "FROM TO" takes two values, kept as "FROM TO".
            int words = 1 + static_cast<int>(std::count(
                                argumentName, argumentName + std::strlen(argumentName), ' '));
            if (i + words >= argc) {
                return usageError(command.name, "option '--" + name + "' needs " + argumentName);
            }
            for (int w = 0; w < words; w++) {
                value += (w > 0 ? " " : "") + std::string(argv[++i]);
            }
        } else if (argumentName == nullptr && inlineValue) {
            return usageError(command.name, "option '--" + name + "' takes no value");
        }
        if (!common) {
            context.options.emplace_back(name, value);
        } else if (name == "version") {
            parsed.version = true;
        } else if (name == "verbose") {
            context.verbose = true;
        } else if (name == "messages") {
            context.messageFile = value;
            parsed.messagesGiven = true;
        } else {
            context.logFile = value;
        }
    }
    return 0;
}

/// The message file the command line asks for; empty (after a report) when
/// there is none.
std::string chooseMessageFile(const OxToolContext& context, const Parsed& parsed) {
    if (parsed.messagesGiven) {
        if (!oxtoolIsFile(context.messageFile)) {
            oxtoolReport(OxErrorError, "message file '" + context.messageFile + "' not found");
            return "";
        }
        return context.messageFile;
    }
    std::string found = oxtoolFindMessageFile(context.executable);
    if (found.empty()) {
        std::string tried;
        for (const std::string& candidate : oxtoolMessageFileCandidates(context.executable)) {
            tried += "\n  " + candidate;
        }
        oxtoolReport(OxErrorError,
                     "no message file found (give one with --messages); tried:" + tried);
    }
    return found;
}

int runDemo(const OxToolContext& context) {
    OxToolDemoContext demo;
    demo.dataDir = context.operands.size() > 0
                       ? context.operands[0]
                       : std::filesystem::path(OXTOOL_DEFAULT_DATA_DIR).make_preferred().string();
    demo.outDir = context.operands.size() > 1 ? context.operands[1] : "oxtool-demo-out";
    demo.messageFile = context.messageFile;
    std::string sample = oxtoolJoin(demo.dataDir, "oxbase.msg");
    if (!context.messageFileGiven && oxtoolIsFile(sample)) {
        demo.messageFile = sample;
    }
    std::error_code error;
    std::filesystem::create_directories(demo.outDir, error);
    if (error) {
        oxtoolReport(OxErrorError,
                     "cannot create directory " + demo.outDir + ": " + error.message());
        return kOxToolFailed;
    }
    std::vector<OxToolCommand> steps;
    for (const OxToolCommand& command : registry()) {
        if (command.demo != nullptr) {
            steps.push_back(command);
        }
    }
    std::stable_sort(
        steps.begin(), steps.end(),
        [](const OxToolCommand& a, const OxToolCommand& b) { return a.demoOrder < b.demoOrder; });
    int failed = 0;
    for (const OxToolCommand& step : steps) {
        std::printf("==== %s\n", step.name);
        std::fflush(stdout);
        int result = step.demo(demo);
        std::fflush(stdout);
        if (result != 0) {
            std::printf("==== %s failed (%d)\n", step.name, result);
            failed++;
        }
    }
    std::printf("==== demo finished: %zu steps, %s\n", steps.size(),
                failed == 0 ? "all succeeded" : "some failed");
    return failed == 0 ? 0 : kOxToolFailed;
}

OxToolRegistration demoRegistration{
    {"demo",
     "[DATADIR [OUTDIR]]",
     "run every demo step over the sample data",
     "Runs each command's demonstration over the sample data in DATADIR (default: the\n"
     "source tree's data/) and writes what the steps produce, their logs included,\n"
     "into OUTDIR (default: oxtool-demo-out). The steps use DATADIR/oxbase.msg when\n"
     "it exists, else the message file of --messages or the default one; each step\n"
     "writes its own log into OUTDIR, and --log is not used. The steps log errors on\n"
     "purpose: the exit status is 0 when every step succeeded and 8 when one failed.\n",
     {},
     0,
     2,
     runDemo}};

} // namespace

OxToolRegistration::OxToolRegistration(const OxToolCommand& command) {
    registry().push_back(command);
}

const std::vector<OxToolCommand>& oxtoolCommands() {
    return registry();
}

bool OxToolContext::has(const char* name) const {
    for (const auto& option : options) {
        if (option.first == name) {
            return true;
        }
    }
    return false;
}

std::string OxToolContext::value(const char* name, const std::string& fallback) const {
    std::string found = fallback;
    for (const auto& option : options) {
        if (option.first == name) {
            found = option.second;
        }
    }
    return found;
}

std::vector<std::string> OxToolContext::values(const char* name) const {
    std::vector<std::string> found;
    for (const auto& option : options) {
        if (option.first == name) {
            found.push_back(option.second);
        }
    }
    return found;
}

std::string oxtoolStreamText(std::ostrstream& stream) {
    stream << std::ends;
    std::string text = stream.str();
    stream.freeze(false);
    return text;
}

std::string oxtoolJoin(const std::string& dir, const std::string& name) {
    if (dir.empty()) {
        return name;
    }
    return dir.back() == '/' ? dir + name : dir + "/" + name;
}

void oxtoolRaise(OxErrorCode severity) {
    if (severity > worstSeverity()) {
        worstSeverity() = severity;
    }
}

OxErrorCode oxtoolWorst() {
    return worstSeverity();
}

void oxtoolReport(OxErrorCode severity, const std::string& text) {
    oxtoolRaise(severity);
    std::string line = std::string("oxtool") + (currentCommand() != nullptr ? " " : "") +
                       (currentCommand() != nullptr ? currentCommand() : "") + ": " +
                       oxtoolSeverityName(severity) + ": " + text + "\n";
    std::fflush(stdout);
    std::fputs(line.c_str(), stderr);
    std::fflush(stderr);
    std::ofstream* log = OxMsg::getLogFile();
    if (log != nullptr) {
        *log << line << std::flush;
    }
}

bool oxtoolParseNumber(const std::string& text, long long minimum, long long maximum,
                       long long& value) {
    size_t start = !text.empty() && text[0] == '-' && minimum < 0 ? 1 : 0;
    if (text.size() == start || text.size() - start > 18 ||
        text.find_first_not_of("0123456789", start) != std::string::npos) {
        return false;
    }
    long long number = std::stoll(text);
    if (number < minimum || number > maximum) {
        return false;
    }
    value = number;
    return true;
}

int main(int argc, char** argv) {
    if (argc < 2) {
        printOverview(stderr);
        return kOxToolUsage;
    }
    std::string first = argv[1];
    if (first == "-h" || first == "--help" || first == "help") {
        if (first == "help" && argc > 2) {
            const OxToolCommand* command = findCommand(argv[2]);
            if (command == nullptr) {
                return usageError("", std::string("unknown command '") + argv[2] + "'");
            }
            printCommandHelp(*command);
            return 0;
        }
        printOverview(stdout);
        return 0;
    }
    if (first == "--version") {
        printVersion();
        return 0;
    }
    const OxToolCommand* command = findCommand(first);
    if (command == nullptr) {
        return usageError("", "unknown command '" + first + "'");
    }
    currentCommand() = command->name;

    OxToolContext context;
    context.command = command->name;
    context.executable = oxtoolExecutablePath(argv[0]);
    Parsed parsed;
    if (parseArguments(*command, argc, argv, 2, context, parsed) != 0) {
        return kOxToolUsage;
    }
    if (parsed.help) {
        printCommandHelp(*command);
        return 0;
    }
    if (parsed.version) {
        printVersion();
        return 0;
    }
    int count = static_cast<int>(context.operands.size());
    if (count < command->minOperands) {
        return usageError(command->name, "missing operand (usage: oxtool " +
                                             std::string(command->name) + " " + command->usage +
                                             ")");
    }
    if (command->maxOperands >= 0 && count > command->maxOperands) {
        return usageError(command->name, "too many operands (usage: oxtool " +
                                             std::string(command->name) + " " + command->usage +
                                             ")");
    }
    if (parsed.messagesGiven && context.messageFile == "-") {
        return usageError(command->name, "--messages needs a file; '-' is not accepted");
    }
    if (context.logFile == "-") {
        return usageError(command->name, "--log needs a file; '-' is not accepted");
    }
    context.messageFileGiven = parsed.messagesGiven;

    context.messageFile = chooseMessageFile(context, parsed);
    if (context.messageFile.empty()) {
        return kOxToolFailed;
    }
    if (context.verbose) {
        std::fprintf(stderr, "oxtool %s: message file %s\n", command->name,
                     context.messageFile.c_str());
    }
    int result = 0;
    {
        OxToolMessageSession session;
        if (command->run != runDemo &&
            !session.start(context.messageFile, context.logFile, context.verbose)) {
            oxtoolReport(OxErrorError,
                         "cannot start the message subsystem with " + context.messageFile +
                             (context.logFile.empty() ? "" : " and log " + context.logFile));
            return kOxToolFailed;
        }
        result = command->run(context);
        std::fflush(stdout);
    }
    if (result == kOxToolUsage || command->run == runDemo) {
        return result;
    }
    int worst = std::max(static_cast<int>(oxtoolWorst()), static_cast<int>(OxMsg::getErrorCode()));
    return std::max(result, worst);
}
