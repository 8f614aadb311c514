// OxToolCommand.h: how the subcommands of oxtool register themselves.
//
// Each subcommand lives in its own source file and registers itself at load
// with a static OxToolRegistration, so that adding a command touches no other
// file:
//
//   static int runPaths(int argc, char** argv) { ... }
//   static OxToolRegistration reg{{"paths", "PATH...", "show the path operations", runPaths}};
//
// A command may also add a step to `oxtool demo`, which runs every step over
// the bundled sample data, in the order of their `demoOrder`.
#ifndef OXTOOL_OXTOOLCOMMAND_H
#define OXTOOL_OXTOOLCOMMAND_H

#include "oxbase/platform/OxStrstream.h"

#include <string>

/// What a demo step gets: the sample data directory and a scratch directory
/// for what it writes.
struct OxToolDemoContext {
    std::string dataDir;
    std::string outDir;
};

struct OxToolCommand {
    const char* name;
    const char* usage;                 ///< arguments, as shown by `oxtool help`
    const char* summary;               ///< one line of help
    int (*run)(int argc, char** argv); ///< argv[0] is the command name
    int (*demo)(const OxToolDemoContext& context) = nullptr;
    int demoOrder = 100;
};

struct OxToolRegistration {
    explicit OxToolRegistration(const OxToolCommand& command);
};

/// The text written to `stream` so far (the stream stays usable).
std::string oxtoolStreamText(std::ostrstream& stream);

/// Joins a directory and a file name with '/'.
std::string oxtoolJoin(const std::string& dir, const std::string& name);

#endif
