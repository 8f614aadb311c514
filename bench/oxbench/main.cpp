// oxbench main: options, corpus generation, the child-process runner and the
// Markdown table.
//
//   oxbench                  full corpora, 5 timed runs per row
//   oxbench --quick          corpora of a tenth of the size
//   oxbench --case xml-read  one case only (repeatable)
//   oxbench --runs 7 --timeout 300 --keep
#include "OxBench.h"
#include "OxBenchCorpus.h"

#include "oxbase/diag/OxMsg.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include <malloc.h>
#include <poll.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace oxbench {

std::vector<Entry>& registry() {
    static std::vector<Entry> entries;
    return entries;
}

std::uint64_t fileSize(const std::string& path) {
    std::error_code ec;
    auto size = std::filesystem::file_size(path, ec);
    return ec ? 0 : static_cast<std::uint64_t>(size);
}

std::string readWholeFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

} // namespace oxbench

namespace {

using namespace oxbench;

// One row of the table: which case, which implementation, and whether it is
// the reference the other rows of the case are compared with.
struct RowSpec {
    const char* caseName;
    const char* impl;
    bool reference;
    const char* target; // the target for this row, or ""
};

// The table in the order it is printed. Rows whose runner is not registered
// (class or peer library missing) are printed as "not built".
const RowSpec kRows[] = {
    {"xml-read", "OxBase OxXmlFile::readFile", false, ">= 1.0x tinyxml2"},
    {"xml-read", "tinyxml2 LoadFile", true, ""},
    {"xml-read", "pugixml load_file", false, ""},
    {"xml-read", "libxml2 xmlReadFile", false, ""},
    {"xml-read-memory", "OxBase OxXmlFile::readFile", false, "<= 3x file size"},
    {"xml-read-memory", "tinyxml2 LoadFile", true, ""},
    {"xml-read-memory", "pugixml load_file", false, ""},
    {"xml-read-memory", "libxml2 xmlReadFile", false, ""},
    {"xml-read-comment", "OxBase OxXmlFile::readFile", false, "<= 2x OxBase model read time"},
    {"xml-read-comment", "tinyxml2 LoadFile", true, ""},
    {"xml-read-comment", "pugixml load_file", false, ""},
    {"xml-read-comment", "libxml2 xmlReadFile", false, ""},
    {"xml-write", "OxBase OxXmlFile::writeFile", false, ">= 0.9x ofstream"},
    {"xml-write", "ofstream, flush per line", true, ""},
    {"xml-write", "tinyxml2 SaveFile", false, ""},
    {"xml-write", "pugixml save_file", false, ""},
    {"csv-read", "OxBase OxCsvFile::readFile", false, ">= 1.0x getline+split"},
    {"csv-read", "getline + split, all rows kept", true, ""},
    {"binary-file", "OxBase OxInput::read(double&)", false, ">= 0.8x ifstream"},
    {"binary-file", "ifstream::read 8 bytes + swap", true, ""},
    {"binary-memory", "OxBase OxMemory::read(double&)", false, ">= 0.5x fread"},
    {"binary-memory", "fread 1 MiB blocks + swap", true, ""},
    {"walk", "OxBase OxFileTreeWalk, 10 slots", false, ">= 0.8x nftw"},
    {"walk", "nftw FTW_PHYS", true, ""},
    {"messages", "OxBase OxMsg::Log by number", false, ">= 0.8x ofstream"},
    {"messages", "ofstream, flush per line", true, ""},
    {"range-walk", "OxBase OxRangeList walk", false, "< 1 s"},
    {"range-walk", "vector of ranges, nested loop", true, ""},
};

struct Options {
    bool quick = false;
    bool keep = false;
    bool coldHeap = false;
    int runs = 5;
    int timeoutSeconds = 180;
    std::vector<std::string> cases;
};

// What a child sends back through its pipe: plain data, one write.
struct ChildReport {
    int state = 0; // 0 ok, 1 prepare failed, 2 a run failed
    int nbRuns = 0;
    double times[64] = {};
    double amount = 0.0;
    double check = 0.0;
    int countsItems = 0;
    long long peakBytes = -1;
    char note[512] = {};
};

struct RowResult {
    const RowSpec* plan = nullptr;
    std::string status; // "" when measured, else "not built", "timeout", ...
    double median = 0.0;
    double amount = 0.0;
    double check = 0.0;
    bool countsItems = false;
    long long peakBytes = -1;
    std::string note;
};

const Entry* findEntry(const std::string& caseName, const std::string& impl) {
    for (const Entry& e : registry()) {
        if (e.caseName == caseName && e.impl == impl) {
            return &e;
        }
    }
    return nullptr;
}

long long currentRssBytes() {
    std::ifstream statm("/proc/self/statm");
    long long pages = 0, resident = 0;
    statm >> pages >> resident;
    return resident * sysconf(_SC_PAGESIZE);
}

void copyText(char* target, std::size_t size, const std::string& text) {
    std::snprintf(target, size, "%s", text.c_str());
}

void copyNote(ChildReport& report, const std::string& note) {
    copyText(report.note, sizeof(report.note), note);
}

// What afterRun freed is consolidated now, untimed, and not by the first
// large allocation of the next run (a large request makes the allocator merge
// its freed small chunks first). With --cold-heap the freed memory goes back
// to the system instead, so that each run touches fresh pages as a new
// process would.
void releaseHeap(bool coldHeap) {
    if (coldHeap) {
        malloc_trim(0);
    } else {
        // volatile: a malloc and free of an unused block is otherwise elided.
        void* volatile large = std::malloc(std::size_t(1) << 20);
        std::free(large);
    }
}

// Runs in the child: prepare, then either one measured run for the peak
// memory, or a warm-up and `runs` timed runs.
ChildReport childWork(const Entry& entry, const Corpus& corpus, int runs, bool memory,
                      bool coldHeap) {
    ChildReport report;
    std::unique_ptr<Runner> runner = entry.factory();
    std::string note;
    if (!runner->prepare(corpus, note)) {
        report.state = 1;
        copyNote(report, note);
        return report;
    }
    report.countsItems = runner->countsItems() ? 1 : 0;
    if (memory) {
        long long before = currentRssBytes();
        Outcome outcome = runner->run();
        struct rusage usage {};
        getrusage(RUSAGE_SELF, &usage);
        runner->afterRun(outcome);
        report.peakBytes = std::max(0LL, static_cast<long long>(usage.ru_maxrss) * 1024 - before);
        report.amount = outcome.amount;
        report.check = outcome.check;
        report.state = outcome.ok ? 0 : 2;
        copyNote(report, outcome.note);
        return report;
    }
    for (int i = -1; i < runs; i++) {
        auto start = std::chrono::steady_clock::now();
        Outcome outcome = runner->run();
        auto stop = std::chrono::steady_clock::now();
        runner->afterRun(outcome);
        releaseHeap(coldHeap);
        if (!outcome.ok) {
            report.state = 2;
            copyNote(report, outcome.note);
            return report;
        }
        report.amount = outcome.amount;
        report.check = outcome.check;
        if (!outcome.note.empty()) {
            copyNote(report, outcome.note);
        }
        if (i >= 0) {
            report.times[report.nbRuns++] = std::chrono::duration<double>(stop - start).count();
        }
    }
    return report;
}

bool writeAll(int fd, const void* data, std::size_t size) {
    const char* p = static_cast<const char*>(data);
    while (size > 0) {
        ssize_t n = write(fd, p, size);
        if (n <= 0) {
            return false;
        }
        p += n;
        size -= static_cast<std::size_t>(n);
    }
    return true;
}

// Reads `size` bytes (a child's report); false on end of file, error or when
// the deadline passes (then `timedOut` is set).
bool readAll(int fd, void* buffer, std::size_t size, int timeoutSeconds, bool& timedOut) {
    timedOut = false;
    char* data = static_cast<char*>(buffer);
    std::size_t got = 0;
    auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(timeoutSeconds);
    while (got < size) {
        auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
                        deadline - std::chrono::steady_clock::now())
                        .count();
        if (left <= 0) {
            timedOut = true;
            return false;
        }
        struct pollfd p {
            fd, POLLIN, 0
        };
        int ready = poll(&p, 1, static_cast<int>(std::min<long long>(left, 1000)));
        if (ready < 0 && errno != EINTR) {
            return false;
        }
        if (ready <= 0) {
            continue;
        }
        ssize_t n = read(fd, data + got, size - got);
        if (n <= 0) {
            return false;
        }
        got += static_cast<std::size_t>(n);
    }
    return true;
}

RowResult runRow(const RowSpec& plan, const Corpus& corpus, const Options& options) {
    RowResult result;
    result.plan = &plan;
    bool memory = std::strcmp(plan.caseName, "xml-read-memory") == 0;
    const Entry* entry = findEntry(memory ? "xml-read" : plan.caseName, plan.impl);
    if (entry == nullptr) {
        result.status = "not built";
        return result;
    }
    std::fflush(stdout);
    std::fflush(stderr);
    std::cout.flush();
    std::cerr.flush();
    int fds[2];
    if (pipe(fds) != 0) {
        result.status = "pipe failed";
        return result;
    }
    pid_t pid = fork();
    if (pid < 0) {
        close(fds[0]);
        close(fds[1]);
        result.status = "fork failed";
        return result;
    }
    if (pid == 0) {
        close(fds[0]);
        ChildReport report = childWork(*entry, corpus, options.runs, memory, options.coldHeap);
        const char* data = reinterpret_cast<const char*>(&report);
        std::size_t left = sizeof(report);
        while (left > 0) {
            ssize_t n = write(fds[1], data, left);
            if (n <= 0) {
                break;
            }
            data += n;
            left -= static_cast<std::size_t>(n);
        }
        close(fds[1]);
        _exit(0);
    }
    close(fds[1]);
    ChildReport report;
    bool timedOut = false;
    bool complete = readAll(fds[0], &report, sizeof report, options.timeoutSeconds, timedOut);
    close(fds[0]);
    if (timedOut) {
        kill(pid, SIGKILL);
    }
    int status = 0;
    waitpid(pid, &status, 0);
    if (timedOut) {
        result.status = "timeout (> " + std::to_string(options.timeoutSeconds) + " s)";
        return result;
    }
    if (!complete) {
        result.status = WIFSIGNALED(status)
                            ? "crashed (signal " + std::to_string(WTERMSIG(status)) + ")"
                            : "no report";
        return result;
    }
    result.note = report.note;
    if (report.state == 1) {
        result.status = "skipped";
        return result;
    }
    if (report.state == 2) {
        result.status = "failed";
        return result;
    }
    result.amount = report.amount;
    result.check = report.check;
    result.countsItems = report.countsItems != 0;
    result.peakBytes = report.peakBytes;
    if (!memory) {
        std::vector<double> times(report.times, report.times + report.nbRuns);
        std::sort(times.begin(), times.end());
        std::size_t n = times.size();
        result.median = n % 2 == 1 ? times[n / 2] : (times[n / 2 - 1] + times[n / 2]) / 2.0;
    }
    return result;
}

// ---- Interleaved timing -------------------------------------------------
//
// The implementations of one case are timed in turns: each lives in its own
// child process (prepared once), and the parent asks them for one run after
// the other, round by round, the first of a round rotating. On a shared,
// noisy machine every implementation of a case then sees the same load, and
// the ratios stay meaningful.

struct RunReport {
    int state = 0; // 0 ok, 1 prepare failed, 2 the run failed
    double seconds = 0.0;
    double amount = 0.0;
    double check = 0.0;
    int countsItems = 0;
    char note[512] = {};
};

// The child's side: prepare, report, then one run per 'r' until 'q'.
[[noreturn]] void serveRuns(const Entry& entry, const Corpus& corpus, bool coldHeap, int cmdFd,
                            int reportFd) {
    std::unique_ptr<Runner> runner = entry.factory();
    RunReport ready;
    std::string note;
    ready.state = runner->prepare(corpus, note) ? 0 : 1;
    ready.countsItems = runner->countsItems() ? 1 : 0;
    copyText(ready.note, sizeof(ready.note), note);
    writeAll(reportFd, &ready, sizeof(ready));
    char command = 0;
    while (ready.state == 0 && read(cmdFd, &command, 1) == 1 && command == 'r') {
        RunReport report;
        auto start = std::chrono::steady_clock::now();
        Outcome outcome = runner->run();
        auto stop = std::chrono::steady_clock::now();
        runner->afterRun(outcome);
        releaseHeap(coldHeap);
        report.state = outcome.ok ? 0 : 2;
        report.seconds = std::chrono::duration<double>(stop - start).count();
        report.amount = outcome.amount;
        report.check = outcome.check;
        report.countsItems = ready.countsItems;
        copyText(report.note, sizeof(report.note), outcome.note);
        if (!writeAll(reportFd, &report, sizeof(report))) {
            break;
        }
    }
    _exit(0);
}

struct Worker {
    RowResult* result = nullptr;
    pid_t pid = -1;
    int cmdFd = -1;
    int reportFd = -1;
    std::vector<double> times;
    bool alive = false;
};

void stopWorker(Worker& w, const std::string& status, bool timedOut) {
    if (w.pid > 0) {
        if (timedOut) {
            kill(w.pid, SIGKILL);
        }
        if (w.cmdFd >= 0) {
            writeAll(w.cmdFd, "q", 1);
            close(w.cmdFd);
        }
        if (w.reportFd >= 0) {
            close(w.reportFd);
        }
        int wstatus = 0;
        waitpid(w.pid, &wstatus, 0);
        if (status == "no report" && WIFSIGNALED(wstatus)) {
            w.result->status = "crashed (signal " + std::to_string(WTERMSIG(wstatus)) + ")";
        } else if (!status.empty() && w.result->status.empty()) {
            w.result->status = status;
        }
    }
    w.pid = -1;
    w.cmdFd = w.reportFd = -1;
    w.alive = false;
}

std::string failureStatus(bool timedOut, int timeoutSeconds) {
    return timedOut ? "timeout (> " + std::to_string(timeoutSeconds) + " s)" : "no report";
}

// Times every implementation of one case in turns; fills `results`, which
// holds one entry per row of the case, with `plan` set.
void runCaseInterleaved(std::vector<RowResult*>& results, const Corpus& corpus,
                        const Options& options) {
    std::vector<Worker> workers;
    for (RowResult* r : results) {
        Worker w;
        w.result = r;
        const Entry* entry = findEntry(r->plan->caseName, r->plan->impl);
        if (entry == nullptr) {
            r->status = "not built";
            workers.push_back(w);
            continue;
        }
        std::fflush(stdout);
        std::fflush(stderr);
        std::cout.flush();
        std::cerr.flush();
        int cmd[2], rep[2];
        if (pipe(cmd) != 0) {
            r->status = "pipe failed";
            workers.push_back(w);
            continue;
        }
        if (pipe(rep) != 0) {
            close(cmd[0]);
            close(cmd[1]);
            r->status = "pipe failed";
            workers.push_back(w);
            continue;
        }
        pid_t pid = fork();
        if (pid == 0) {
            close(cmd[1]);
            close(rep[0]);
            for (const Worker& other : workers) {
                if (other.cmdFd >= 0) {
                    close(other.cmdFd);
                    close(other.reportFd);
                }
            }
            serveRuns(*entry, corpus, options.coldHeap, cmd[0], rep[1]);
        }
        close(cmd[0]);
        close(rep[1]);
        if (pid < 0) {
            close(cmd[1]);
            close(rep[0]);
            r->status = "fork failed";
            workers.push_back(w);
            continue;
        }
        w.pid = pid;
        w.cmdFd = cmd[1];
        w.reportFd = rep[0];
        RunReport ready;
        bool timedOut = false;
        if (!readAll(w.reportFd, &ready, sizeof ready, options.timeoutSeconds, timedOut)) {
            stopWorker(w, failureStatus(timedOut, options.timeoutSeconds), timedOut);
        } else if (ready.state != 0) {
            r->note = ready.note;
            stopWorker(w, "skipped", false);
        } else {
            w.alive = true;
        }
        workers.push_back(w);
    }
    for (int round = -1; round < options.runs; round++) {
        std::size_t n = workers.size();
        for (std::size_t k = 0; k < n; k++) {
            Worker& w = workers[(k + static_cast<std::size_t>(round + 1)) % n];
            if (!w.alive) {
                continue;
            }
            RunReport report;
            bool timedOut = false;
            if (!writeAll(w.cmdFd, "r", 1) ||
                !readAll(w.reportFd, &report, sizeof report, options.timeoutSeconds, timedOut)) {
                stopWorker(w, failureStatus(timedOut, options.timeoutSeconds), timedOut);
                continue;
            }
            if (report.state != 0) {
                w.result->note = report.note;
                stopWorker(w, "failed", false);
                continue;
            }
            if (report.note[0] != '\0') {
                w.result->note = report.note;
            }
            w.result->amount = report.amount;
            w.result->check = report.check;
            w.result->countsItems = report.countsItems != 0;
            if (round >= 0) {
                w.times.push_back(report.seconds);
            }
        }
    }
    for (Worker& w : workers) {
        if (w.alive) {
            std::vector<double> times = w.times;
            std::sort(times.begin(), times.end());
            std::size_t n = times.size();
            w.result->median =
                n == 0 ? 0.0
                       : (n % 2 == 1 ? times[n / 2] : (times[n / 2 - 1] + times[n / 2]) / 2.0);
            stopWorker(w, "", false);
        }
    }
}

std::string fmt(const char* format, double value) {
    char text[64];
    std::snprintf(text, sizeof(text), format, value);
    return text;
}

std::string timeText(double seconds) {
    if (seconds >= 1.0) {
        return fmt("%.3f s", seconds);
    }
    return fmt("%.1f ms", seconds * 1000.0);
}

std::string throughputText(const RowResult& r) {
    if (r.median <= 0.0 || r.amount <= 0.0) {
        return "";
    }
    double rate = r.amount / r.median;
    if (r.countsItems) {
        return rate >= 1e6 ? fmt("%.2f M items/s", rate / 1e6) : fmt("%.0f items/s", rate);
    }
    return fmt("%.1f MB/s", rate / 1e6);
}

std::string cpuModel() {
    std::ifstream info("/proc/cpuinfo");
    std::string line;
    while (std::getline(info, line)) {
        if (line.rfind("model name", 0) == 0) {
            auto colon = line.find(':');
            return colon == std::string::npos ? line : line.substr(colon + 2);
        }
    }
    return "unknown";
}

void usage() {
    std::cerr << "usage: oxbench [--quick] [--case NAME]... [--runs N] [--timeout SECONDS] "
                 "[--keep] [--cold-heap] [--list]\n";
}

bool wanted(const Options& options, const std::string& caseName) {
    if (options.cases.empty()) {
        return true;
    }
    for (const std::string& c : options.cases) {
        if (c == caseName) {
            return true;
        }
        // The memory and comment rows belong to the XML read.
        if (c == "xml-read" && caseName.rfind("xml-read", 0) == 0) {
            return true;
        }
    }
    return false;
}

// Compares one row with the reference of its case and with its target.
void verdict(const RowResult& r, const std::vector<RowResult>& all, std::string& ratio,
             std::string& target) {
    const RowResult* ref = nullptr;
    for (const RowResult& o : all) {
        if (std::strcmp(o.plan->caseName, r.plan->caseName) == 0 && o.plan->reference) {
            ref = &o;
        }
    }
    bool memory = std::strcmp(r.plan->caseName, "xml-read-memory") == 0;
    double value = 0.0;
    bool haveRatio = false;
    if (r.status.empty() && ref != nullptr && ref->status.empty()) {
        if (memory && r.peakBytes > 0 && ref->peakBytes > 0) {
            value = static_cast<double>(r.peakBytes) / static_cast<double>(ref->peakBytes);
            ratio = fmt("%.2fx the memory", value);
            haveRatio = true;
        } else if (!memory && r.median > 0.0) {
            value = ref->median / r.median;
            ratio = r.plan->reference ? "1.00x (reference)" : fmt("%.2fx", value);
            haveRatio = true;
        }
    }
    target = r.plan->target;
    if (target.empty() || !r.status.empty()) {
        return;
    }
    std::string caseName = r.plan->caseName;
    bool met = false;
    bool known = false;
    if (caseName == "xml-read-memory") {
        if (r.peakBytes >= 0 && r.amount > 0) {
            met = static_cast<double>(r.peakBytes) <= 3.0 * r.amount;
            known = true;
        }
    } else if (caseName == "xml-read-comment") {
        for (const RowResult& o : all) {
            if (std::strcmp(o.plan->caseName, "xml-read") == 0 &&
                std::strcmp(o.plan->impl, r.plan->impl) == 0 && o.status.empty()) {
                met = r.median <= 2.0 * o.median;
                known = true;
                target += fmt(" (%.2fx)", r.median / o.median);
            }
        }
    } else if (caseName == "range-walk") {
        met = r.median < 1.0;
        known = true;
    } else if (haveRatio) {
        double need = caseName == "xml-read" || caseName == "csv-read" ? 1.0
                      : caseName == "xml-write"                        ? 0.9
                      : caseName == "binary-memory"                    ? 0.5
                                                                       : 0.8;
        met = value >= need;
        known = true;
    }
    if (known) {
        target += met ? ": met" : ": MISSED";
    }
}

} // namespace

int main(int argc, char** argv) {
    Options options;
    for (int i = 1; i < argc; i++) {
        std::string arg = argv[i];
        if (arg == "--quick") {
            options.quick = true;
        } else if (arg == "--cold-heap") {
            options.coldHeap = true;
        } else if (arg == "--keep") {
            options.keep = true;
        } else if (arg == "--case" && i + 1 < argc) {
            options.cases.push_back(argv[++i]);
        } else if (arg == "--runs" && i + 1 < argc) {
            options.runs = std::clamp(std::atoi(argv[++i]), 1, 64);
        } else if (arg == "--timeout" && i + 1 < argc) {
            options.timeoutSeconds = std::max(1, std::atoi(argv[++i]));
        } else if (arg == "--list") {
            for (const RowSpec& row : kRows) {
                bool memory = std::strcmp(row.caseName, "xml-read-memory") == 0;
                std::cout << row.caseName << "\t" << row.impl << "\t"
                          << (findEntry(memory ? "xml-read" : row.caseName, row.impl) ? "built"
                                                                                      : "not built")
                          << "\n";
            }
            return 0;
        } else {
            usage();
            return 2;
        }
    }

    Corpus corpus;
    std::string error;
    std::cerr << "oxbench: generating corpora" << (options.quick ? " (quick)" : "") << "...\n";
    auto genStart = std::chrono::steady_clock::now();
    if (!generateCorpus(corpus, options.quick, error)) {
        std::cerr << "oxbench: " << error << "\n";
        return 1;
    }
    std::cerr
        << "oxbench: corpora in " << corpus.dir << " ("
        << fmt("%.1f",
               std::chrono::duration<double>(std::chrono::steady_clock::now() - genStart).count())
        << " s)\n";

    // One message subsystem for the whole run: the library's own messages and
    // the bench message, logged to a file below the corpus directory.
    OxMsg messages(corpus.messageFile.c_str(), nullptr, "oxbench.log", corpus.logDir.c_str());

    // Rows of one case stand together in kRows. The memory rows run one by
    // one (one read in a fresh child each); the others are timed in turns.
    std::vector<RowResult> results;
    results.reserve(sizeof(kRows) / sizeof(kRows[0]));
    std::size_t count = sizeof(kRows) / sizeof(kRows[0]);
    for (std::size_t i = 0; i < count;) {
        std::size_t j = i;
        while (j < count && std::strcmp(kRows[j].caseName, kRows[i].caseName) == 0) {
            j++;
        }
        if (wanted(options, kRows[i].caseName)) {
            std::cerr << "oxbench: " << kRows[i].caseName << "..." << std::flush;
            std::vector<RowResult*> group;
            for (std::size_t k = i; k < j; k++) {
                if (std::strcmp(kRows[k].caseName, "xml-read-memory") == 0) {
                    results.push_back(runRow(kRows[k], corpus, options));
                } else {
                    RowResult r;
                    r.plan = &kRows[k];
                    results.push_back(r);
                    group.push_back(&results.back());
                }
            }
            if (!group.empty()) {
                runCaseInterleaved(group, corpus, options);
            }
            for (std::size_t k = results.size() - (j - i); k < results.size(); k++) {
                const RowResult& r = results[k];
                std::cerr << " "
                          << (!r.status.empty()  ? r.status
                              : r.peakBytes >= 0 ? fmt("peak %.1f MB", r.peakBytes / 1e6)
                                                 : timeText(r.median));
            }
            std::cerr << "\n";
        }
        i = j;
    }

    char date[64];
    std::time_t now = std::time(nullptr);
    std::strftime(date, sizeof(date), "%Y-%m-%d %H:%M UTC", std::gmtime(&now));
    std::cout << "oxbench " << (options.quick ? "--quick " : "") << "on " << cpuModel() << ", "
              << sysconf(_SC_NPROCESSORS_ONLN) << " CPUs, " << date << "; median of "
              << options.runs << " runs after one warm-up"
              << (options.coldHeap ? ", heap returned to the system before each run" : "")
              << ".\n\n";
    std::cout << "Corpora: XML model " << fmt("%.1f", fileSize(corpus.xmlModel) / 1e6)
              << " MB, comment document " << fmt("%.1f", fileSize(corpus.xmlComment) / 1e6)
              << " MB, CSV " << fmt("%.1f", fileSize(corpus.csvTable) / 1e6) << " MB, "
              << corpus.nbDoubles << " doubles, tree of " << corpus.treeEntries << " entries, "
              << corpus.nbMessages << " messages, range list of " << corpus.rangeRecords
              << " records / " << corpus.rangeMembers << " members.\n\n";
    std::cout << "| Case | Implementation | Median | Throughput | vs reference | Target |\n";
    std::cout << "|---|---|---|---|---|---|\n";
    for (const RowResult& r : results) {
        std::string ratio, target;
        verdict(r, results, ratio, target);
        std::string median, throughput;
        if (!r.status.empty()) {
            median = r.status;
        } else if (r.peakBytes >= 0) {
            median = fmt("peak %.1f MB", r.peakBytes / 1e6);
            if (r.amount > 0) {
                throughput = fmt("%.2fx file size", r.peakBytes / r.amount);
            }
        } else {
            median = timeText(r.median);
            throughput = throughputText(r);
        }
        std::string note = r.note;
        // Implementations of one case must agree on what they read.
        for (const RowResult& o : results) {
            if (&o != &r && o.plan->reference && r.status.empty() && o.status.empty() &&
                std::strcmp(o.plan->caseName, r.plan->caseName) == 0 && o.check != 0.0 &&
                r.check != 0.0 && o.check != r.check) {
                note += (note.empty() ? "" : "; ") + fmt("check %.17g", r.check) +
                        fmt(" differs from reference %.17g", o.check);
            }
        }
        std::cout << "| " << r.plan->caseName << " | " << r.plan->impl << " | " << median << " | "
                  << throughput << " | " << ratio << " | " << target
                  << (note.empty() ? "" : " (" + note + ")") << " |\n";
    }
    std::cout.flush();

    if (!options.keep) {
        std::error_code ec;
        std::filesystem::remove_all(corpus.dir, ec);
    } else {
        std::cerr << "oxbench: corpora kept in " << corpus.dir << "\n";
    }
    return 0;
}
