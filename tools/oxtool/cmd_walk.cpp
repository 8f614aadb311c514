// oxtool walk and oxtool list: the file tree walk and XML file lists.
//
//   oxtool walk DIR [--ext .xml] [--depth N] [--streams N]
//   oxtool list LISTFILE...
//
// `walk` prints one line per object that the walk reports, a letter for its
// type (D directory, F file, N no status, U unreadable directory) and the
// path, then a count line; --ext shows only paths that end in the given
// text. `list` reads the list files into an XML file list (directories
// expand to their .xml files) and prints the names. A failed walk or an
// unreadable list file gives exit status 1, a misused command 2. The demo
// step walks the data directory and lists data/sample.lst.
#include "OxToolCommand.h"

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

bool parseCount(const char* text, int& value) {
    if (text == nullptr || *text == '\0' || std::strspn(text, "-0123456789") != std::strlen(text)) {
        return false;
    }
    long long number = std::atoll(text);
    if (number < -1 || number > 1000000) {
        return false;
    }
    value = static_cast<int>(number);
    return true;
}

int walkUsage() {
    std::fprintf(stderr, "usage: oxtool walk DIR [--ext .xml] [--depth N] [--streams N]\n");
    return 2;
}

int runWalk(int argc, char** argv) {
    if (argc < 2) {
        return walkUsage();
    }
    WalkReport walkReport;
    int depth = -1;
    int streams = 10;
    for (int i = 2; i < argc; i++) {
        if (std::strcmp(argv[i], "--ext") == 0 && i + 1 < argc) {
            walkReport.extension = argv[++i];
        } else if (std::strcmp(argv[i], "--depth") == 0 && i + 1 < argc) {
            if (!parseCount(argv[++i], depth)) {
                return walkUsage();
            }
        } else if (std::strcmp(argv[i], "--streams") == 0 && i + 1 < argc) {
            if (!parseCount(argv[++i], streams) || streams < 1) {
                return walkUsage();
            }
        } else {
            return walkUsage();
        }
    }
    std::fflush(stdout);
    OxFileTreeWalk walk(argv[1], report, streams, depth, &walkReport);
    int result = walk.run();
    std::printf("directories: %lu, files: %lu, other: %lu, shown: %lu, result: %d\n",
                walkReport.directories, walkReport.files, walkReport.others, walkReport.shown,
                result);
    return result == -1 ? 1 : 0;
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

int runList(int argc, char** argv) {
    if (argc < 2) {
        std::fprintf(stderr, "usage: oxtool list LISTFILE...\n");
        return 2;
    }
    OxXmlFileList list;
    for (int i = 1; i < argc; i++) {
        list.addListFile(argv[i]);
    }
    std::fflush(stdout);
    OxBool ok = list.readListFiles();
    printNames(list, "");
    return ok == OxTrue ? 0 : 1;
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

OxToolRegistration walkRegistration{{"walk", "DIR [--ext .xml] [--depth N] [--streams N]",
                                     "walk a directory tree and print what it holds", runWalk,
                                     demoWalk, 70}};
OxToolRegistration listRegistration{
    {"list", "LISTFILE...", "read list files (directories give their .xml files)", runList}};
} // namespace
