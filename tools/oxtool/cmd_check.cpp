// oxtool check: reads documents with the library and reports every message
// and every lint warning, by file and line.
//
//   oxtool check data/ @more.lst single.xml --jobs 4
//
// Operands are files, directories (walked by the library's tree walk for the
// files whose names end in an --ext, ".xml" and ".csv" by default, case not
// counting) and list files (@LIST: one name a line, '#' comments, directories
// expanded alike). A file ending in ".csv" is read as a CSV table, any other
// as an XML document. For each file, stdout gets one line per finding:
//
//   PATH:LINE: SEVERITY: TEXT [msg N]        a message the library logged
//   PATH:LINE: warning: TEXT [lint:CAUSE]    what the library will not give back
//
// and the check ends with a summary line. With --jobs N the files are split
// into N shares of about equal size, in order, each checked by a worker
// process (this program, started with --worker on a plain list of names);
// their reports are printed in the order of the files. The library itself is
// single-threaded by design, so processes are how a check scales out, and
// std::system with std::thread keeps this portable C++. On a terminal,
// standard error shows a progress line while more than a few files or
// megabytes are checked.
#include "OxToolCommand.h"
#include "OxToolFiles.h"
#include "OxToolLint.h"
#include "OxToolMessages.h"

#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/io/OxFileList.h"
#include "oxbase/io/OxFileTreeWalk.h"
#include "oxbase/core/OxSystem.h"

#include <algorithm>
#include <atomic>
#include <cctype>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

namespace fs = std::filesystem;

namespace {

constexpr char kMarker = '\x1f'; ///< starts the worker's lines for its parent
constexpr unsigned int kProgressFiles = 4;
constexpr unsigned long long kProgressBytes = 4000000;

struct CheckOptions {
    std::vector<std::string> extensions{".xml", ".csv"};
    char separator = ',';
    int jobs = 1;
    bool verbose = false;
};

struct Totals {
    unsigned long long files = 0;
    unsigned long long bytes = 0;
    unsigned long long warnings = 0;
    unsigned long long errors = 0;
};

bool endsWithNoCase(const std::string& text, const std::string& tail) {
    if (tail.empty() || text.size() < tail.size()) {
        return false;
    }
    for (size_t i = 0; i < tail.size(); i++) {
        unsigned char a = static_cast<unsigned char>(text[text.size() - tail.size() + i]);
        unsigned char b = static_cast<unsigned char>(tail[i]);
        if (std::tolower(a) != std::tolower(b)) {
            return false;
        }
    }
    return true;
}

// ---------------------------------------------------------------------------
// Collecting the files

/// The walk callbacks keep the files with one of these endings.
const std::vector<std::string>* gExtensions = nullptr;

bool wanted(const char* path) {
    for (const std::string& extension : *gExtensions) {
        if (endsWithNoCase(path, extension)) {
            return true;
        }
    }
    return false;
}

struct Collected {
    std::vector<std::string> paths;
    std::vector<std::string> unreadable;
};

int collectFromWalk(const char* path, const OxStat*, OxFileTreeWalkType type, void* userData) {
    auto* collected = static_cast<Collected*>(userData);
    if (type == OxFTWFile && wanted(path)) {
        collected->paths.emplace_back(path);
    } else if (type == OxFTWUnreadableDir) {
        collected->unreadable.emplace_back(path);
    }
    return 0;
}

/// The callback of a list file's directories: the list owns copies.
int collectFromList(const char* path, const OxStat*, OxFileTreeWalkType type, void* userData) {
    if (type == OxFTWFile && wanted(path)) {
        static_cast<OxGList<char*>*>(userData)->append(OxString::dup(path));
    }
    return 0;
}

/// `path` as the operand spelled it: the walk reports absolute paths.
std::string shownPath(const std::string& path, const std::string& absoluteStart,
                      const std::string& operand) {
    if (path.compare(0, absoluteStart.size(), absoluteStart) != 0) {
        return path;
    }
    std::string rest = path.substr(absoluteStart.size());
    std::string start = operand;
    while (start.size() > 1 && (start.back() == '/' || start.back() == '\\')) {
        start.pop_back();
    }
    return start + rest;
}

void printWalkFindings(const std::string& where, const std::string& walkErrors,
                       const std::vector<std::string>& unreadable, Totals& totals) {
    for (const OxToolFinding& finding : oxtoolWalkFindings(walkErrors, unreadable)) {
        std::printf("%s: %s: %s [%s]\n", where.c_str(), oxtoolSeverityName(finding.severity),
                    finding.text.c_str(), finding.tag.c_str());
        oxtoolRaise(finding.severity);
        (finding.severity >= OxErrorError ? totals.errors : totals.warnings)++;
    }
}

/// The files of every operand, in order; walk and list problems are printed
/// as they are met. False for an operand that cannot be used at all.
bool collectFiles(const std::vector<std::string>& operands, const CheckOptions& options,
                  std::vector<std::string>& files, Totals& totals) {
    gExtensions = &options.extensions;
    for (const std::string& operand : operands) {
        std::error_code error;
        if (operand.size() > 1 && operand[0] == '@') {
            std::string listName = operand.substr(1);
            OxFileList list;
            list.setFTWCallback(collectFromList);
            list.addListFile(listName.c_str());
            OxBool read = OxFalse;
            std::string listErrors;
            {
                OxToolMessageCapture capture(nullptr, true, false);
                read = list.readListFiles();
                listErrors = capture.captured();
            }
            if (read != OxTrue) {
                std::printf("%s: error: the list file cannot be read\n", listName.c_str());
                oxtoolRaise(OxErrorError);
                totals.errors++;
            }
            printWalkFindings(listName, listErrors, {}, totals);
            const OxGList<char*>& names = list.getFileNameList();
            for (unsigned int i = 0; i < names.getLength(); i++) {
                if (names[i] != nullptr) {
                    files.emplace_back(names[i]);
                }
            }
        } else if (fs::is_directory(operand, error)) {
            Collected collected;
            std::string walkErrors;
            int result = 0;
            {
                OxToolMessageCapture capture(nullptr, true, false);
                OxFileTreeWalk walk(operand.c_str(), collectFromWalk, 10, &collected);
                result = walk.run();
                walkErrors = capture.captured();
            }
            std::string absoluteStart = fs::absolute(operand, error).lexically_normal().string();
            while (absoluteStart.size() > 1 &&
                   (absoluteStart.back() == '/' || absoluteStart.back() == '\\')) {
                absoluteStart.pop_back();
            }
            std::vector<std::string> shown;
            for (const std::string& path : collected.paths) {
                shown.push_back(shownPath(path, absoluteStart, operand));
            }
            std::sort(shown.begin(), shown.end());
            files.insert(files.end(), shown.begin(), shown.end());
            printWalkFindings(operand, walkErrors, collected.unreadable, totals);
            if (result == -1 && walkErrors.find("returning -1") == std::string::npos) {
                std::printf("%s: error: the walk failed\n", operand.c_str());
                oxtoolRaise(OxErrorError);
                totals.errors++;
            }
        } else {
            // A file, or a name that does not exist: its read reports it.
            files.push_back(operand);
        }
    }
    return true;
}

// ---------------------------------------------------------------------------
// Checking one file

/// One line of the report on standard output. The tool's own findings (the
/// library's messages are there already) also go to the log file.
void printFinding(const std::string& path, const OxToolFinding& finding) {
    std::string line = path;
    if (finding.line != 0) {
        line += ":" + std::to_string(finding.line);
    }
    line += std::string(": ") + oxtoolSeverityName(finding.severity) + ": " + finding.text;
    if (!finding.tag.empty()) {
        line += " [" + finding.tag + "]";
    }
    std::printf("%s\n", line.c_str());
    std::ofstream* log = OxMsg::getLogFile();
    if (log != nullptr && finding.tag.compare(0, 4, "msg ") != 0) {
        *log << line << "\n" << std::flush;
    }
}

/// Reads `path` with the library, lints it, prints what was found and adds
/// it to `totals`.
void checkFile(const std::string& path, const CheckOptions& options, Totals& totals) {
    std::string source;
    oxtoolReadBytes(path, source);
    bool csv = endsWithNoCase(path, ".csv");
    std::vector<OxToolMessage> messages;
    std::vector<OxToolFinding> findings;
    OxToolTempDir scratch;
    {
        OxToolMessageCapture capture(&messages, true, false);
        if (csv) {
            OxCsvFile table(path.c_str(), OxFile::OxIOInput, options.separator);
            bool opened = table.isGood(OxFile::OxIOInput) == OxTrue;
            if (table.readFile() == OxTrue) {
                oxtoolLintCsv(source, table, options.separator, scratch, findings);
            } else if (opened) {
                findings.push_back({OxErrorError, 0, "the table could not be read", ""});
            }
        } else {
            OxXmlFile document(path.c_str(), OxFile::OxIOInput);
            bool opened = document.isGood(OxFile::OxIOInput) == OxTrue;
            if (document.readFile() == OxTrue) {
                oxtoolLintXml(source, document, scratch, findings);
            } else if (opened && messages.empty()) {
                findings.push_back(
                    {OxErrorError, 0, "the reader stopped before the end of the document", ""});
            }
        }
    }
    std::vector<OxToolFinding> report;
    for (const OxToolMessage& message : messages) {
        if (message.severity == OxErrorNone && !options.verbose) {
            continue;
        }
        OxToolFinding finding;
        finding.severity = message.severity;
        finding.line = message.line;
        finding.text = message.text;
        finding.tag = message.number != 0 ? "msg " + std::to_string(message.number) : "";
        report.push_back(std::move(finding));
    }
    report.insert(report.end(), findings.begin(), findings.end());
    for (const OxToolFinding& finding : report) {
        printFinding(path, finding);
        oxtoolRaise(finding.severity);
        if (finding.severity == OxErrorWarning) {
            totals.warnings++;
        } else if (finding.severity >= OxErrorError) {
            totals.errors++;
        }
    }
    if (report.empty() && options.verbose) {
        std::printf("%s: ok\n", path.c_str());
    }
    totals.files++;
    totals.bytes += source.size();
    std::fflush(stdout);
}

// ---------------------------------------------------------------------------
// Progress, summary, workers

class Progress {
public:
    Progress(size_t files, unsigned long long bytes)
        : total(files), totalBytes(bytes),
          shown(OxSystem::isTerminal(2) == OxTrue && (files >= kProgressFiles || bytes >= kProgressBytes)) {}
    ~Progress() { clear(); }
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void update(unsigned long long files, unsigned long long bytes) {
        auto now = std::chrono::steady_clock::now();
        if (!shown || now - last < std::chrono::milliseconds(100)) {
            return;
        }
        last = now;
        std::fprintf(stderr, "\rchecked %llu/%zu files, %.1f/%.1f MB", files, total,
                     static_cast<double>(bytes) / 1e6, static_cast<double>(totalBytes) / 1e6);
        std::fflush(stderr);
        drawn = true;
    }
    void clear() {
        if (drawn) {
            std::fprintf(stderr, "\r%60s\r", "");
            std::fflush(stderr);
            drawn = false;
        }
    }

private:
    size_t total;
    unsigned long long totalBytes;
    bool shown;
    bool drawn = false;
    std::chrono::steady_clock::time_point last{};
};

unsigned long long fileSize(const std::string& path) {
    std::error_code error;
    auto size = fs::file_size(path, error);
    return error ? 0 : static_cast<unsigned long long>(size);
}

void printSummary(const Totals& totals, double seconds) {
    std::printf("checked %llu file%s (%.2f MB) in %.2f s: %llu warning%s, %llu error%s\n",
                totals.files, totals.files == 1 ? "" : "s", static_cast<double>(totals.bytes) / 1e6,
                seconds, totals.warnings, totals.warnings == 1 ? "" : "s", totals.errors,
                totals.errors == 1 ? "" : "s");
}

/// One argument for the command processor: single quotes where paths use
/// '/', double quotes on Windows.
std::string shellQuote(const std::string& text) {
    if (fs::path::preferred_separator == '\\') {
        return "\"" + text + "\"";
    }
    std::string quoted = "'";
    for (char c : text) {
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    }
    return quoted + "'";
}

struct Worker {
    std::vector<std::string> files;
    std::string listPath;
    std::string outPath;
    std::string errPath;
    std::string logPath;
    std::atomic<bool> done{false};
};

/// Splits `files` into at most `jobs` runs of about equal size, in order.
std::vector<std::vector<std::string>> shares(const std::vector<std::string>& files, int jobs) {
    unsigned long long total = 0;
    std::vector<unsigned long long> sizes;
    for (const std::string& file : files) {
        sizes.push_back(fileSize(file) + 1);
        total += sizes.back();
    }
    std::vector<std::vector<std::string>> result(1);
    unsigned long long sum = 0;
    for (size_t i = 0; i < files.size(); i++) {
        unsigned long long boundary = total * result.size() / static_cast<unsigned long long>(jobs);
        if (!result.back().empty() && sum >= boundary && result.size() < size_t(jobs)) {
            result.emplace_back();
        }
        result.back().push_back(files[i]);
        sum += sizes[i];
    }
    return result;
}

/// Counts the file markers in what a worker wrote so far.
unsigned long long markersIn(const std::string& path, unsigned long long& bytes) {
    std::string text;
    oxtoolReadBytes(path, text);
    unsigned long long count = 0;
    bytes = 0;
    for (size_t at = text.find(std::string(1, kMarker) + "F "); at != std::string::npos;
         at = text.find(std::string(1, kMarker) + "F ", at + 2)) {
        count++;
        bytes += std::strtoull(text.c_str() + at + 3, nullptr, 10);
    }
    return count;
}

int runWorkers(const OxToolContext& context, const CheckOptions& options,
               const std::vector<std::string>& files, Totals& totals,
               unsigned long long totalBytes) {
    if (context.executable.empty()) {
        oxtoolReport(OxErrorError, "cannot find this program to start workers; check without "
                                   "--jobs");
        return kOxToolFailed;
    }
    OxToolTempDir scratch;
    if (scratch.path().empty()) {
        oxtoolReport(OxErrorError, "no scratch directory for the workers");
        return kOxToolFailed;
    }
    std::vector<std::vector<std::string>> parts = shares(files, options.jobs);
    std::vector<std::unique_ptr<Worker>> workers;
    for (size_t i = 0; i < parts.size(); i++) {
        auto worker = std::make_unique<Worker>();
        worker->files = parts[i];
        std::string stem = "worker" + std::to_string(i);
        worker->listPath = scratch.file(stem + ".list");
        worker->outPath = scratch.file(stem + ".out");
        worker->errPath = scratch.file(stem + ".err");
        worker->logPath = context.logFile.empty() ? "" : scratch.file(stem + ".log");
        std::string list;
        for (const std::string& file : worker->files) {
            list += file + "\n";
        }
        if (!oxtoolWriteBytes(worker->listPath, list)) {
            oxtoolReport(OxErrorError, "cannot write the list of a worker");
            return kOxToolFailed;
        }
        workers.push_back(std::move(worker));
    }
    std::vector<std::thread> threads;
    for (const auto& worker : workers) {
        std::string command = shellQuote(context.executable) + " check --worker " +
                              shellQuote(worker->listPath) + " --messages " +
                              shellQuote(context.messageFile) + " --sep " +
                              shellQuote(std::string(1, options.separator));
        if (!worker->logPath.empty()) {
            command += " --log " + shellQuote(worker->logPath);
        }
        if (options.verbose) {
            command += " --verbose";
        }
        command += " > ";
        command += shellQuote(worker->outPath);
        command += " 2> ";
        command += shellQuote(worker->errPath);
        if (fs::path::preferred_separator == '\\') {
            command.insert(0, 1, '"'); // cmd.exe drops the outer quotes
            command += '"';
        }
        Worker* raw = worker.get();
        threads.emplace_back([raw, command]() {
            std::system(command.c_str());
            raw->done = true;
        });
    }
    Progress progress(files.size(), totalBytes);
    for (;;) {
        bool all = true;
        unsigned long long checked = 0;
        unsigned long long bytes = 0;
        for (const auto& worker : workers) {
            all = all && worker->done;
            unsigned long long workerBytes = 0;
            checked += markersIn(worker->outPath, workerBytes);
            bytes += workerBytes;
        }
        progress.update(checked, bytes);
        if (all) {
            break;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    progress.clear();

    int status = 0;
    for (const auto& worker : workers) {
        std::string out;
        std::string err;
        oxtoolReadBytes(worker->outPath, out);
        oxtoolReadBytes(worker->errPath, err);
        std::istringstream lines(out);
        std::string line;
        bool summarised = false;
        while (std::getline(lines, line)) {
            if (line.empty() || line[0] != kMarker) {
                std::printf("%s\n", line.c_str());
                continue;
            }
            if (line.size() > 2 && line[1] == 'S') {
                unsigned long long values[5] = {0, 0, 0, 0, 0};
                std::istringstream fields(line.substr(3));
                for (unsigned long long& value : values) {
                    fields >> value;
                }
                totals.files += values[0];
                totals.bytes += values[1];
                totals.warnings += values[2];
                totals.errors += values[3];
                oxtoolRaise(static_cast<OxErrorCode>(std::min(values[4], 16ull)));
                summarised = true;
            }
        }
        std::fputs(err.c_str(), stderr);
        if (!worker->logPath.empty() && OxMsg::getLogFile() != nullptr) {
            std::string log;
            oxtoolReadBytes(worker->logPath, log);
            *OxMsg::getLogFile() << log << std::flush;
        }
        if (!summarised) {
            oxtoolReport(OxErrorError, "a worker ended without its summary; " +
                                           std::to_string(worker->files.size()) + " file(s) from " +
                                           worker->files.front() + " on are unchecked");
            status = kOxToolFailed;
        }
    }
    std::fflush(stdout);
    return status;
}

/// The worker: checks the files named in `listPath`, one a line, and tells
/// its parent each file's end and the totals on marker lines.
int runWorker(const std::string& listPath, const CheckOptions& options) {
    std::string list;
    if (!oxtoolReadBytes(listPath, list)) {
        oxtoolReport(OxErrorError, "cannot read the worker list " + listPath);
        return kOxToolFailed;
    }
    Totals totals;
    std::istringstream lines(list);
    std::string path;
    while (std::getline(lines, path)) {
        if (path.empty()) {
            continue;
        }
        unsigned long long before = totals.bytes;
        checkFile(path, options, totals);
        std::printf("%cF %llu\n", kMarker, totals.bytes - before);
        std::fflush(stdout);
    }
    std::printf("%cS %llu %llu %llu %llu %d\n", kMarker, totals.files, totals.bytes,
                totals.warnings, totals.errors, static_cast<int>(oxtoolWorst()));
    std::fflush(stdout);
    return 0;
}

int runCheck(const OxToolContext& context) {
    CheckOptions options;
    options.verbose = context.verbose;
    if (context.has("ext")) {
        options.extensions = context.values("ext");
    }
    std::string separator = context.value("sep", ",");
    if (separator.size() != 1) {
        std::fprintf(stderr, "oxtool check: --sep takes one character, not '%s'\n",
                     separator.c_str());
        return kOxToolUsage;
    }
    options.separator = separator[0];
    if (context.has("jobs")) {
        long long jobs = 0;
        if (!oxtoolParseNumber(context.value("jobs"), 1, 256, jobs)) {
            std::fprintf(stderr, "oxtool check: --jobs needs a number from 1 to 256, not '%s'\n",
                         context.value("jobs").c_str());
            return kOxToolUsage;
        }
        options.jobs = static_cast<int>(jobs);
    }
    if (context.has("worker")) {
        return runWorker(context.value("worker"), options);
    }
    if (context.operands.empty()) {
        std::fprintf(stderr, "oxtool check: missing operand (usage: oxtool check PATH...)\n"
                             "try 'oxtool check --help'\n");
        return kOxToolUsage;
    }
    for (const std::string& operand : context.operands) {
        if (operand == "-" || operand == "@-" || operand == "@") {
            std::fprintf(stderr,
                         "oxtool check: checks files, directories and list files; '%s' "
                         "is not accepted\n",
                         operand.c_str());
            return kOxToolUsage;
        }
    }
    auto started = std::chrono::steady_clock::now();
    Totals totals;
    std::vector<std::string> files;
    collectFiles(context.operands, options, files, totals);
    unsigned long long totalBytes = 0;
    for (const std::string& file : files) {
        totalBytes += fileSize(file);
    }
    int status = 0;
    if (options.jobs > 1 && files.size() > 1) {
        status = runWorkers(context, options, files, totals, totalBytes);
    } else {
        Progress progress(files.size(), totalBytes);
        for (const std::string& file : files) {
            checkFile(file, options, totals);
            progress.update(totals.files, totals.bytes);
        }
    }
    double seconds =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count();
    printSummary(totals, seconds);
    return status;
}

OxToolRegistration registration{
    {"check",
     "PATH...",
     "check documents: every message and lint warning, by file and line",
     "Reads every document with the library and reports each message it logs, by file\n"
     "and line, and adds lint warnings for what the library will not give back as it\n"
     "read it (tag [lint:CAUSE]; 'man oxtool' and docs/ list the causes): an element\n"
     "with a value loses its attributes on write; a comment or CDATA section inside an\n"
     "element comes back on lines of its own; an attribute value holding a double\n"
     "quote is cut short when read back; markup behind the declaration or a DOCTYPE on\n"
     "its line doubles on every round trip; a CSV record with an empty field has its\n"
     "later fields moved left on write; a range number above 4294967295 wraps. Each\n"
     "document is also written, read and written again: when the two writes differ,\n"
     "a warning names the cause, or else the first line that changed.\n"
     "\n"
     "PATH is a file (.csv: a CSV table, anything else: XML), a directory (walked for\n"
     "the files ending in an --ext; the walk follows symbolic links, ends at one that\n"
     "loops, and walks a directory it cannot list as empty, each of which is\n"
     "reported), or @LIST, a list file of names. A summary line ends the report.\n",
     {{"ext", "EXT", "file ending to collect from directories, repeatable (default .xml .csv)"},
      {"jobs", "N", "check in N worker processes (default 1)"},
      {"sep", "C", "the separator of CSV tables (default ',')"},
      {"worker", "LIST", "(internal) check the files named in LIST for a parent"}},
     0,
     -1,
     runCheck}};

} // namespace
