// oxtool walk and oxtool list: the file tree walk and XML file lists.
//
//   oxtool walk DIR [--ext .xml] [--depth N] [--streams N]
//   oxtool list LISTFILE...
//
// `walk` prints one line per object that the walk reports, a letter for its
// type (D directory, F file, N no status, U unreadable directory) and the
// path, then a count line; --ext shows only paths that end in the given
// text. `list` reads the list files into an XML file list (directories
// expand to their .xml files) and prints the names. A missing start, a failed
// walk, a walk that ended early or an unreadable list file gives exit status
// 8, a misused command 2. The demo step walks the data directory and lists
// data/sample.lst.
#include "OxToolCommand.h"
#include "OxToolLint.h"
#include "OxToolMessages.h"

#include "oxbase/doc/OxXmlFileList.h"
#include "oxbase/io/OxFileTreeWalk.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <string>
#include <vector>

namespace {

struct WalkReport {
    const char* extension = nullptr;
    unsigned long directories = 0;
    unsigned long files = 0;
    unsigned long others = 0;
    unsigned long shown = 0;
    std::vector<std::string>* collected = nullptr; ///< paths kept instead of printed
    std::vector<std::string> unreadable;           ///< directories reported with U
};

char typeLetter(OxFileTreeWalkType type) {
    switch (type) {
    case OxFTWDirectory:
        return 'D';
    case OxFTWFile:
        return 'F';
    case OxFTWNoStat:
        return 'N';
    case OxFTWUnreadableDir:
        return 'U';
    }
    return '?';
}

bool endsWith(const char* text, const char* tail) {
    size_t length = std::strlen(text);
    size_t tailLength = std::strlen(tail);
    return length >= tailLength && std::strcmp(text + length - tailLength, tail) == 0;
}

int report(const char* path, const OxStat*, OxFileTreeWalkType type, void* userData) {
    WalkReport* walkReport = static_cast<WalkReport*>(userData);
    if (type == OxFTWDirectory) {
        walkReport->directories++;
    } else if (type == OxFTWFile) {
        walkReport->files++;
    } else {
        walkReport->others++;
    }
    if (type == OxFTWUnreadableDir) {
        walkReport->unreadable.push_back(path);
    }
    if (walkReport->extension != nullptr && !endsWith(path, walkReport->extension)) {
        return 0;
    }
    walkReport->shown++;
    std::string line = std::string(1, typeLetter(type)) + " " + path;
    if (walkReport->collected != nullptr) {
        walkReport->collected->push_back(line);
    } else {
        std::printf("%s\n", line.c_str());
    }
    return 0;
}

bool parseCount(const OxToolContext& context, const char* name, long long minimum, int& value) {
    if (!context.has(name)) {
        return true;
    }
    long long number = 0;
    if (!oxtoolParseNumber(context.value(name), minimum, 1000000, number)) {
        std::fprintf(stderr, "oxtool walk: --%s needs a number from %lld to 1000000, not '%s'\n",
                     name, minimum, context.value(name).c_str());
        return false;
    }
    value = static_cast<int>(number);
    return true;
}

/// Reports what the library's walk wrote to standard error (shown as it
/// stands) as findings; true when the walk ended early.
bool reportWalk(const std::string& walkErrors, const std::vector<std::string>& unreadable) {
    std::fputs(walkErrors.c_str(), stderr);
    std::vector<OxToolFinding> findings = oxtoolWalkFindings(walkErrors, unreadable);
    for (const OxToolFinding& finding : findings) {
        oxtoolReport(finding.severity, finding.text + " [" + finding.tag + "]");
    }
    return oxtoolWalkEndedEarly(findings);
}

int runWalk(const OxToolContext& context) {
    const std::string& start = context.operands[0];
    WalkReport walkReport;
    int depth = -1;
    int streams = 10;
    if (!parseCount(context, "depth", -1, depth) || !parseCount(context, "streams", 1, streams)) {
        return kOxToolUsage;
    }
    std::string extension = context.value("ext");
    walkReport.extension = context.has("ext") ? extension.c_str() : nullptr;
    if (start == "-") {
        std::fprintf(stderr, "oxtool walk: walks a directory; '-' is not accepted\n");
        return kOxToolUsage;
    }
    std::error_code error;
    if (!std::filesystem::exists(start, error)) {
        oxtoolReport(OxErrorError, "no such file or directory: " + start);
        return kOxToolFailed;
    }
    std::fflush(stdout);
    int result = 0;
    std::string walkErrors;
    {
        OxToolMessageCapture capture(nullptr, true, false);
        OxFileTreeWalk walk(start.c_str(), report, streams, depth, &walkReport);
        result = walk.run();
        walkErrors = capture.captured();
    }
    std::printf("directories: %lu, files: %lu, other: %lu, shown: %lu, result: %d\n",
                walkReport.directories, walkReport.files, walkReport.others, walkReport.shown,
                result);
    std::fflush(stdout);
    bool early = reportWalk(walkErrors, walkReport.unreadable);
    if (result == -1 && !early) {
        oxtoolReport(OxErrorError, "the walk of " + start + " failed");
    }
    return result == -1 || early ? kOxToolFailed : 0;
}

void printNames(const OxFileList& list, const std::string& strip) {
    std::vector<std::string> names;
    const OxGList<char*>& files = list.getFileNameList();
    for (unsigned int i = 0; i < files.getLength(); i++) {
        std::string name = files[i] != nullptr ? files[i] : "";
        if (!strip.empty() && name.rfind(strip, 0) == 0) {
            name = "<data>/" + name.substr(strip.size());
        }
        names.push_back(name);
    }
    for (const std::string& name : names) {
        std::printf("%s\n", name.c_str());
    }
    std::printf("names: %u\n", files.getLength());
}

int runList(const OxToolContext& context) {
    OxXmlFileList list;
    for (const std::string& operand : context.operands) {
        if (operand == "-") {
            std::fprintf(stderr, "oxtool list: reads list files; '-' is not accepted\n");
            return kOxToolUsage;
        }
        list.addListFile(operand.c_str());
    }
    std::fflush(stdout);
    OxBool ok = OxFalse;
    std::string listErrors;
    {
        OxToolMessageCapture capture(nullptr, true, false);
        ok = list.readListFiles();
        listErrors = capture.captured();
    }
    printNames(list, "");
    std::fflush(stdout);
    bool early = reportWalk(listErrors, {});
    if (ok != OxTrue) {
        oxtoolReport(OxErrorError, "a list file cannot be read");
    }
    return ok == OxTrue && !early ? 0 : kOxToolFailed;
}

// Demo: the data directory walked (paths shown relative to it, sorted, since
// the platform decides the order), then data/sample.lst read from there.
int demoWalk(const OxToolDemoContext& context) {
    std::error_code error;
    std::string dataDir = std::filesystem::absolute(context.dataDir, error).string();
    std::vector<std::string> lines;
    WalkReport walkReport;
    walkReport.collected = &lines;
    OxFileTreeWalk walk(dataDir.c_str(), report, 10, &walkReport);
    int result = walk.run();
    std::sort(lines.begin(), lines.end());
    std::cout << "walk of the data directory (result " << result << "):\n";
    for (std::string& line : lines) {
        size_t at = line.find(dataDir);
        if (at != std::string::npos) {
            line.replace(at, dataDir.size(), "<data>");
        }
        std::cout << "  " << line << "\n";
    }
    std::cout << "directories: " << walkReport.directories << ", files: " << walkReport.files
              << "\n"
              << std::flush;

    // List-file names are relative to the working directory: read from data/.
    std::filesystem::path saved = std::filesystem::current_path(error);
    std::filesystem::current_path(dataDir, error);
    if (error) {
        std::cerr << "cannot change to " << dataDir << "\n";
        return 1;
    }
    OxXmlFileList list("sample.lst");
    OxBool ok = list.readListFiles();
    std::filesystem::current_path(saved, error);
    std::cout << "names of sample.lst (directories give their .xml files):\n" << std::flush;
    printNames(list, dataDir + "/");
    std::fflush(stdout);
    return result == 0 && ok == OxTrue ? 0 : 1;
}

OxToolRegistration walkRegistration{
    {"walk",
     "DIR",
     "walk a directory tree and print what it holds",
     "Walks DIR with the library's tree walk and prints one line per object: a letter\n"
     "for its type (D directory, F file, N no status, U unreadable directory) and the\n"
     "path, then a count line. The walk follows symbolic links. Two of its ways are\n"
     "told here: a symbolic link that loops ends the walk (an error: the entries\n"
     "behind it are missing), and a directory that cannot be listed for another\n"
     "reason than permission, such as a path too long, is walked as empty (a\n"
     "warning). A DIR that does not exist is an error.\n",
     {{"ext", "TEXT", "show only paths that end in TEXT (e.g. .xml)"},
      {"depth", "N", "enter directories down to N levels below DIR (-1: no limit)"},
      {"streams", "N", "directory streams open at once (default 10)"}},
     1,
     1,
     runWalk,
     demoWalk,
     70}};
OxToolRegistration listRegistration{
    {"list",
     "LISTFILE...",
     "read list files (directories give their .xml files)",
     "Reads each list file (one name a line, '#' comments) into an XML file list and\n"
     "prints the names: a directory named in a list gives the .xml files below it, by\n"
     "the library's tree walk. A list file that cannot be read, or a walk that ended\n"
     "early (a symbolic link that loops), is an error.\n",
     {},
     1,
     -1,
     runList}};
} // namespace
