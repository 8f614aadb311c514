// oxtool: command-line front end to OxBase for translator developers.
//
//   oxtool demo [DATADIR [OUTDIR]]   run every demo step over the sample data
//   oxtool help                      list the commands
//   oxtool COMMAND ARGS...           run one command
#include "OxToolCommand.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <vector>

#ifndef OXTOOL_DEFAULT_DATA_DIR
#define OXTOOL_DEFAULT_DATA_DIR "data"
#endif

namespace {
std::vector<OxToolCommand>& registry() {
    static std::vector<OxToolCommand> commands;
    return commands;
}

void printHelp() {
    std::printf("usage: oxtool COMMAND [ARGS...]\n\ncommands:\n");
    std::printf("  %-10s %-40s %s\n", "demo", "[DATADIR [OUTDIR]]",
                "run every demo step over the sample data");
    std::vector<OxToolCommand> sorted = registry();
    std::sort(sorted.begin(), sorted.end(), [](const OxToolCommand& a, const OxToolCommand& b) {
        return std::strcmp(a.name, b.name) < 0;
    });
    for (const OxToolCommand& command : sorted) {
        std::printf("  %-10s %-40s %s\n", command.name, command.usage, command.summary);
    }
}

int runDemo(int argc, char** argv) {
    OxToolDemoContext context;
    context.dataDir = argc > 2 ? argv[2] : OXTOOL_DEFAULT_DATA_DIR;
    context.outDir = argc > 3 ? argv[3] : "oxtool-demo-out";
    std::error_code error;
    std::filesystem::create_directories(context.outDir, error);
    if (error) {
        std::fprintf(stderr, "oxtool: cannot create %s: %s\n", context.outDir.c_str(),
                     error.message().c_str());
        return 2;
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
    int worst = 0;
    for (const OxToolCommand& step : steps) {
        std::printf("==== %s\n", step.name);
        std::fflush(stdout);
        int result = step.demo(context);
        if (result != 0) {
            std::printf("==== %s failed (%d)\n", step.name, result);
            worst = std::max(worst, result);
        }
    }
    std::printf("==== demo finished: %zu steps, %s\n", steps.size(),
                worst == 0 ? "all succeeded" : "some failed");
    return worst;
}
} // namespace

OxToolRegistration::OxToolRegistration(const OxToolCommand& command) {
    registry().push_back(command);
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

int main(int argc, char** argv) {
    if (argc < 2 || std::strcmp(argv[1], "help") == 0 || std::strcmp(argv[1], "--help") == 0) {
        printHelp();
        return argc < 2 ? 2 : 0;
    }
    if (std::strcmp(argv[1], "demo") == 0) {
        return runDemo(argc, argv);
    }
    for (const OxToolCommand& command : registry()) {
        if (std::strcmp(command.name, argv[1]) == 0) {
            return command.run(argc - 1, argv + 1);
        }
    }
    std::fprintf(stderr, "oxtool: unknown command '%s' (try 'oxtool help')\n", argv[1]);
    return 2;
}
