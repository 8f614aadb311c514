// oxbench main: options, corpus generation, the child-process runner and the
// Markdown table.
//
//   oxbench                  full corpora, 5 timed runs per row, every regime
//   oxbench --quick          corpora of a tenth of the size
//   oxbench --case xml-read  one case only (repeatable)
//   oxbench --regime warm    one heap regime (warm, default, cold or all)
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
#include <sstream>
#include <string>
#include <vector>

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

// ---- Regimes ----------------------------------------------------------------
//
// warm     the allocator keeps what is freed: the child is this program started
//          again (execve) with GLIBC_TUNABLES=glibc.malloc.mmap_max=0:
//          glibc.malloc.trim_threshold=4294967295 in its environment. glibc
//          reads the tunables once, when the process starts, so a forked child
//          could not get them; mallopt in a forked child would, but that child
//          would also carry the parent's heap (the corpus generator's blocks)
//          and pay copy-on-write faults on it. A fresh process has neither.
//          After the warm-up run every run reuses the freed memory and pays
//          for the parsing work only.
// default  plain glibc malloc in a fresh process: large blocks come from mmap
//          and go back at free, the top of the heap is trimmed.
// cold     one timed run in a fresh process, no warm-up: every page touched
//          is new. The median is taken over one fresh process per run.
enum class Regime { Warm, Default, Cold, Fresh };

const char* regimeName(Regime regime) {
    switch (regime) {
    case Regime::Warm:
        return "warm";
    case Regime::Default:
        return "default";
    case Regime::Cold:
        return "cold";
    case Regime::Fresh:
        break;
    }
    return "fresh process";
}

const char* const kWarmTunables =
    "GLIBC_TUNABLES=glibc.malloc.mmap_max=0:glibc.malloc.trim_threshold=4294967295";

// ---- Rows and targets ---------------------------------------------------------

// A target of a row. Ratio: the time of `otherImpl` in the same case and
// regime (the case's reference when null) divided by the row's time is at
// least the need of the regime. Memory: the peak is at most `need` times the
// file. Fraction: the row's time is at most `need` times the time of
// `otherImpl` in case `otherCase`, same regime. Under: the row takes less
// than `need` seconds.
struct Target {
    enum Kind { None, Ratio, Memory, Fraction, Under } kind = None;
    const char* otherCase = nullptr;
    const char* otherImpl = nullptr;
    double needWarm = 0.0, needDefault = 0.0, needCold = 0.0;
    const char* label = "";
    double need(Regime regime) const {
        return regime == Regime::Warm ? needWarm : regime == Regime::Cold ? needCold : needDefault;
    }
};

Target ratio(const char* impl, double warm, double def, double cold, const char* label) {
    return Target{Target::Ratio, nullptr, impl, warm, def, cold, label};
}
Target memoryTimes(double limit, const char* label) {
    return Target{Target::Memory, nullptr, nullptr, limit, limit, limit, label};
}
Target fraction(const char* otherCase, const char* otherImpl, double limit, const char* label) {
    return Target{Target::Fraction, otherCase, otherImpl, limit, limit, limit, label};
}

// One row of the table: the case as printed, the registered case it runs,
// which corpus shape, which implementation, whether it is the reference of
// its case, and its targets.
struct RowSpec {
    const char* caseName;
    const char* entryCase;
    bool dense;
    const char* impl;
    bool reference;
    Target targets[2];
    bool memory() const { return std::strstr(caseName, "-memory") != nullptr; }
};

constexpr const char* kOxRead = "OxBase OxXmlFile::readFile";
constexpr const char* kOxCsv = "OxBase OxCsvFile::readFile";
constexpr const char* kTiny = "tinyxml2 LoadFile";
constexpr const char* kPugi = "pugixml load_file";
constexpr const char* kLibxml = "libxml2 xmlReadFile";
constexpr const char* kOxWrite = "OxBase OxXmlFile::writeFile";
constexpr const char* kOxWriteUnflushed = "OxBase OxXmlFile::writeFile, unflushed";
constexpr const char* kGetline = "getline + split, all rows kept";

const Target kReadTargets[2] = {ratio(kTiny, 1.0, 1.0, 1.0, ">= 1.0x tinyxml2"),
                                ratio(kPugi, 0.5, 1.0, 1.0, ">= 1.0x pugixml (warm 0.5x)")};

#define OX_XML_READ_ROWS(name, dense)                                                              \
    {name, "xml-read", dense, kOxRead, false, {kReadTargets[0], kReadTargets[1]}},                 \
        {name, "xml-read", dense, kTiny, true, {}}, {name, "xml-read", dense, kPugi, false, {}}, { \
        name, "xml-read", dense, kLibxml, false, {}                                                \
    }
#define OX_XML_MEMORY_ROWS(name, dense)                                                            \
    {name, "xml-read", dense, kOxRead, false, {memoryTimes(2.5, "<= 2.5x file size")}},            \
        {name, "xml-read", dense, kTiny, true, {}}, {name, "xml-read", dense, kPugi, false, {}}, { \
        name, "xml-read", dense, kLibxml, false, {}                                                \
    }
#define OX_XML_WRITE_ROWS(name, dense)                                                             \
    {name,     "xml-write", dense,                                                                 \
     kOxWrite, false,       {ratio(nullptr, 0.9, 0.9, 0.9, ">= 0.9x ofstream")}},                  \
        {name, "xml-write", dense, "ofstream, flush per line", true, {}},                          \
        {name,  "xml-write",                                                                       \
         dense, kOxWriteUnflushed,                                                                 \
         false, {ratio("pugixml save_file", 1.0, 1.0, 1.0, ">= 1.0x pugixml save_file")}},         \
        {name, "xml-write", dense, "tinyxml2 SaveFile", false, {}}, {                              \
        name, "xml-write", dense, "pugixml save_file", false, {}                                   \
    }

// The table in the order it is printed. Rows whose runner is not registered
// (class or peer library missing) are printed as "not built".
const RowSpec kRows[] = {
    OX_XML_READ_ROWS("xml-read", false),
    OX_XML_READ_ROWS("xml-read-dense", true),
    OX_XML_MEMORY_ROWS("xml-read-memory", false),
    OX_XML_MEMORY_ROWS("xml-read-memory-dense", true),
    {"xml-destroy",
     "xml-destroy",
     false,
     "OxBase ~OxXmlFile",
     false,
     {fraction("xml-read", kOxRead, 0.25, "<= 0.25x OxBase read")}},
    {"xml-destroy-dense",
     "xml-destroy",
     true,
     "OxBase ~OxXmlFile",
     false,
     {fraction("xml-read-dense", kOxRead, 0.25, "<= 0.25x OxBase read")}},
    {"xml-read-comment",
     "xml-read-comment",
     false,
     kOxRead,
     false,
     {fraction("xml-read", kOxRead, 2.0, "<= 2x OxBase model read")}},
    {"xml-read-comment", "xml-read-comment", false, kTiny, true, {}},
    {"xml-read-comment", "xml-read-comment", false, kPugi, false, {}},
    {"xml-read-comment", "xml-read-comment", false, kLibxml, false, {}},
    OX_XML_WRITE_ROWS("xml-write", false),
    OX_XML_WRITE_ROWS("xml-write-dense", true),
    {"csv-read",
     "csv-read",
     false,
     kOxCsv,
     false,
     {ratio(nullptr, 1.0, 1.0, 1.0, ">= 1.0x getline+split")}},
    {"csv-read", "csv-read", false, kGetline, true, {}},
    {"csv-read-dense",
     "csv-read",
     true,
     kOxCsv,
     false,
     {ratio(nullptr, 1.0, 1.0, 1.0, ">= 1.0x getline+split")}},
    {"csv-read-dense", "csv-read", true, kGetline, true, {}},
    {"csv-read-memory", "csv-read", false, kOxCsv, false, {memoryTimes(3.0, "<= 3x file size")}},
    {"csv-read-memory", "csv-read", false, kGetline, true, {}},
    {"csv-read-memory-dense",
     "csv-read",
     true,
     kOxCsv,
     false,
     {memoryTimes(3.0, "<= 3x file size")}},
    {"csv-read-memory-dense", "csv-read", true, kGetline, true, {}},
    {"binary-file",
     "binary-file",
     false,
     "OxBase OxInput::read(double&)",
     false,
     {ratio(nullptr, 0.8, 0.8, 0.8, ">= 0.8x ifstream")}},
    {"binary-file", "binary-file", false, "ifstream::read 8 bytes + swap", true, {}},
    {"binary-memory",
     "binary-memory",
     false,
     "OxBase OxMemory::read(double&)",
     false,
     {ratio(nullptr, 0.5, 0.5, 0.5, ">= 0.5x fread")}},
    {"binary-memory", "binary-memory", false, "fread 1 MiB blocks + swap", true, {}},
    {"walk",
     "walk",
     false,
     "OxBase OxFileTreeWalk, 10 slots",
     false,
     {ratio(nullptr, 0.8, 0.8, 0.8, ">= 0.8x nftw")}},
    {"walk", "walk", false, "nftw FTW_PHYS", true, {}},
    {"messages",
     "messages",
     false,
     "OxBase OxMsg::Log by number",
     false,
     {ratio(nullptr, 0.8, 0.8, 0.8, ">= 0.8x ofstream")}},
    {"messages", "messages", false, "ofstream, flush per line", true, {}},
    {"range-walk",
     "range-walk",
     false,
     "OxBase OxRangeList walk",
     false,
     {Target{Target::Under, nullptr, nullptr, 1.0, 1.0, 1.0, "< 1 s"}}},
    {"range-walk", "range-walk", false, "vector of ranges, nested loop", true, {}},
};

struct Options {
    bool quick = false;
    bool keep = false;
    int runs = 5;
    int timeoutSeconds = 180;
    std::vector<Regime> regimes;
    std::vector<std::string> cases;
};

// What a child sends back through its pipe, plain data, one write each: once
// when it is ready, then once per run.
struct RunReport {
    int state = 0; // 0 ok, 1 prepare failed, 2 the run failed
    double seconds = 0.0;
    double amount = 0.0;
    double check = 0.0;
    int countsItems = 0;
    long long peakBytes = -1;
    char note[512] = {};
};

struct RowResult {
    const RowSpec* plan = nullptr;
    Regime regime = Regime::Default;
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

// ---- The child's side ---------------------------------------------------------

// What afterRun freed is consolidated now, untimed, and not by the first
// large allocation of the next run (a large request makes the allocator merge
// its freed small chunks first).
void consolidateHeap() {
    // volatile: a malloc and free of an unused block is otherwise elided.
    void* volatile large = std::malloc(std::size_t(1) << 20);
    std::free(large);
}

// Prepare, report ready, then one run per 'r' until 'q' or the end of the
// pipe. In memory mode: one run, its peak resident memory, and the end.
int serveRuns(const Entry& entry, const Corpus& corpus, bool memory, int cmdFd, int reportFd) {
    std::unique_ptr<Runner> runner = entry.factory();
    RunReport ready;
    std::string note;
    ready.state = runner->prepare(corpus, note) ? 0 : 1;
    ready.countsItems = runner->countsItems() ? 1 : 0;
    copyText(ready.note, sizeof(ready.note), note);
    if (memory && ready.state == 0) {
        if (!runner->beforeRun(note)) {
            ready.state = 2;
            copyText(ready.note, sizeof(ready.note), note);
        } else {
            long long before = currentRssBytes();
            Outcome outcome = runner->run();
            struct rusage usage {};
            getrusage(RUSAGE_SELF, &usage);
            runner->afterRun(outcome);
            ready.peakBytes =
                std::max(0LL, static_cast<long long>(usage.ru_maxrss) * 1024 - before);
            ready.amount = outcome.amount;
            ready.check = outcome.check;
            ready.state = outcome.ok ? 0 : 2;
            copyText(ready.note, sizeof(ready.note), outcome.note);
        }
    }
    writeAll(reportFd, &ready, sizeof(ready));
    char command = 0;
    while (!memory && ready.state == 0 && read(cmdFd, &command, 1) == 1 && command == 'r') {
        RunReport report;
        report.countsItems = ready.countsItems;
        std::string setup;
        if (!runner->beforeRun(setup)) {
            report.state = 2;
            copyText(report.note, sizeof(report.note), setup);
        } else {
            auto start = std::chrono::steady_clock::now();
            Outcome outcome = runner->run();
            auto stop = std::chrono::steady_clock::now();
            runner->afterRun(outcome);
            consolidateHeap();
            report.state = outcome.ok ? 0 : 2;
            report.seconds = std::chrono::duration<double>(stop - start).count();
            report.amount = outcome.amount;
            report.check = outcome.check;
            copyText(report.note, sizeof(report.note), outcome.note);
        }
        if (!writeAll(reportFd, &report, sizeof(report))) {
            break;
        }
    }
    return 0;
}

// oxbench --child ENTRY-CASE IMPL DENSE QUICK CORPUS-DIR CMD-FD REPORT-FD MODE
int childMain(int argc, char** argv) {
    if (argc != 10) {
        return 2;
    }
    const Entry* entry = findEntry(argv[2], argv[3]);
    if (entry == nullptr) {
        return 2;
    }
    Corpus corpus;
    describeCorpus(corpus, argv[6], std::strcmp(argv[5], "1") == 0);
    corpus.dense = std::strcmp(argv[4], "1") == 0;
    int cmdFd = std::atoi(argv[7]);
    int reportFd = std::atoi(argv[8]);
    bool memory = std::strcmp(argv[9], "memory") == 0;
    // The library's own messages (and the bench message) have their texts;
    // each child logs to a file of its own below the corpus directory.
    std::string log = "child-" + std::to_string(getpid()) + ".log";
    OxMsg messages(corpus.messageFile.c_str(), nullptr, log.c_str(), corpus.logDir.c_str());
    int result = serveRuns(*entry, corpus, memory, cmdFd, reportFd);
    close(reportFd);
    close(cmdFd);
    return result;
}

// ---- The parent's side --------------------------------------------------------

struct Worker {
    RowResult* result = nullptr;
    pid_t pid = -1;
    int cmdFd = -1;
    int reportFd = -1;
    std::vector<double> times;
    bool alive = false;
};

std::string g_exe;       // this program, for the children
std::string g_corpusDir; // the corpus the children read

// Starts the child of `plan` in `regime` (a fresh process of this program)
// and waits until it is ready. On failure the result's status tells.
Worker startWorker(RowResult* result, const Options& options, const std::vector<Worker>& others,
                   bool memory) {
    Worker w;
    w.result = result;
    const RowSpec& plan = *result->plan;
    if (findEntry(plan.entryCase, plan.impl) == nullptr) {
        result->status = "not built";
        return w;
    }
    std::fflush(stdout);
    std::fflush(stderr);
    std::cout.flush();
    std::cerr.flush();
    int cmd[2], rep[2];
    if (pipe(cmd) != 0) {
        result->status = "pipe failed";
        return w;
    }
    if (pipe(rep) != 0) {
        close(cmd[0]);
        close(cmd[1]);
        result->status = "pipe failed";
        return w;
    }
    // Everything the child needs is built before the fork: only async-signal
    // safe calls run between fork and execve.
    std::vector<std::string> args = {g_exe,
                                     "--child",
                                     plan.entryCase,
                                     plan.impl,
                                     plan.dense ? "1" : "0",
                                     options.quick ? "1" : "0",
                                     g_corpusDir,
                                     std::to_string(cmd[0]),
                                     std::to_string(rep[1]),
                                     memory ? "memory" : "runs"};
    std::vector<char*> argv;
    for (std::string& a : args) {
        argv.push_back(a.data());
    }
    argv.push_back(nullptr);
    std::vector<std::string> envText;
    for (char** e = environ; *e != nullptr; e++) {
        if (std::strncmp(*e, "GLIBC_TUNABLES=", 15) != 0) {
            envText.emplace_back(*e);
        }
    }
    if (result->regime == Regime::Warm) {
        envText.emplace_back(kWarmTunables);
    }
    std::vector<char*> envp;
    for (std::string& e : envText) {
        envp.push_back(e.data());
    }
    envp.push_back(nullptr);
    pid_t pid = fork();
    if (pid == 0) {
        close(cmd[1]);
        close(rep[0]);
        for (const Worker& other : others) {
            if (other.cmdFd >= 0) {
                close(other.cmdFd);
                close(other.reportFd);
            }
        }
        execve(g_exe.c_str(), argv.data(), envp.data());
        _exit(127);
    }
    close(cmd[0]);
    close(rep[1]);
    if (pid < 0) {
        close(cmd[1]);
        close(rep[0]);
        result->status = "fork failed";
        return w;
    }
    w.pid = pid;
    w.cmdFd = cmd[1];
    w.reportFd = rep[0];
    return w;
}

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

// Waits for the child's ready report; a ready child is alive.
void awaitReady(Worker& w, const Options& options, RunReport& ready) {
    if (w.pid <= 0) {
        return;
    }
    bool timedOut = false;
    if (!readAll(w.reportFd, &ready, sizeof ready, options.timeoutSeconds, timedOut)) {
        stopWorker(w, failureStatus(timedOut, options.timeoutSeconds), timedOut);
    } else if (ready.state != 0) {
        w.result->note = ready.note;
        stopWorker(w, ready.state == 1 ? "skipped" : "failed", false);
    } else {
        w.alive = true;
    }
}

// One read in a fresh process: its peak resident memory.
void runMemoryRow(RowResult& result, const Options& options) {
    std::vector<Worker> none;
    Worker w = startWorker(&result, options, none, true);
    RunReport ready;
    awaitReady(w, options, ready);
    if (w.alive) {
        result.peakBytes = ready.peakBytes;
        result.amount = ready.amount;
        result.check = ready.check;
        result.note = ready.note;
        stopWorker(w, "", false);
    }
}

// Asks a ready worker for one run and files its time.
bool oneRun(Worker& w, const Options& options, bool keep) {
    RunReport report;
    bool timedOut = false;
    if (!writeAll(w.cmdFd, "r", 1) ||
        !readAll(w.reportFd, &report, sizeof report, options.timeoutSeconds, timedOut)) {
        stopWorker(w, failureStatus(timedOut, options.timeoutSeconds), timedOut);
        return false;
    }
    if (report.state != 0) {
        w.result->note = report.note;
        stopWorker(w, "failed", false);
        return false;
    }
    if (report.note[0] != '\0') {
        w.result->note = report.note;
    }
    w.result->amount = report.amount;
    w.result->check = report.check;
    w.result->countsItems = report.countsItems != 0;
    if (keep) {
        w.times.push_back(report.seconds);
    }
    return true;
}

double median(std::vector<double> times) {
    if (times.empty()) {
        return 0.0;
    }
    std::sort(times.begin(), times.end());
    std::size_t n = times.size();
    return n % 2 == 1 ? times[n / 2] : (times[n / 2 - 1] + times[n / 2]) / 2.0;
}

// ---- Interleaved timing -------------------------------------------------
//
// The implementations of one case are timed in turns, round by round, the
// first of a round rotating, so that on a shared, noisy machine all of them
// see the same load. Warm and default: each lives in one child (prepared
// once), one warm-up round, then the timed rounds. Cold: every run is the
// first and only run of a fresh child.
void runCase(std::vector<RowResult*>& results, const Options& options, Regime regime) {
    std::vector<Worker> workers;
    bool cold = regime == Regime::Cold;
    for (RowResult* r : results) {
        Worker w;
        w.result = r;
        if (!cold) {
            w = startWorker(r, options, workers, false);
            RunReport ready;
            awaitReady(w, options, ready);
        } else if (findEntry(r->plan->entryCase, r->plan->impl) == nullptr) {
            r->status = "not built";
        } else {
            w.alive = true; // started afresh for each run
        }
        workers.push_back(w);
    }
    for (int round = cold ? 0 : -1; round < options.runs; round++) {
        std::size_t n = workers.size();
        for (std::size_t k = 0; k < n; k++) {
            Worker& w = workers[(k + static_cast<std::size_t>(round + 1)) % n];
            if (!w.alive) {
                continue;
            }
            if (!cold) {
                oneRun(w, options, round >= 0);
                continue;
            }
            std::vector<Worker> none;
            Worker fresh = startWorker(w.result, options, none, false);
            RunReport ready;
            awaitReady(fresh, options, ready);
            if (!fresh.alive) {
                w.alive = false;
                continue;
            }
            if (oneRun(fresh, options, true)) {
                w.times.push_back(fresh.times.back());
                stopWorker(fresh, "", false);
            } else {
                w.alive = false;
            }
        }
    }
    for (Worker& w : workers) {
        if (w.alive) {
            w.result->median = median(w.times);
            if (!cold) {
                stopWorker(w, "", false);
            }
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
    std::cerr << "usage: oxbench [--quick] [--case NAME]... [--regime warm|default|cold|all] "
                 "[--runs N] [--timeout SECONDS] [--keep] [--list]\n";
}

bool wanted(const Options& options, const std::string& caseName) {
    if (options.cases.empty()) {
        return true;
    }
    for (const std::string& c : options.cases) {
        if (c == caseName) {
            return true;
        }
        // The dense, memory, destroy and comment rows go with their read.
        if ((c == "xml-read" &&
             (caseName.rfind("xml-read", 0) == 0 || caseName.rfind("xml-destroy", 0) == 0)) ||
            (c == "csv-read" && caseName.rfind("csv-read", 0) == 0) ||
            (c == "xml-write" && caseName.rfind("xml-write", 0) == 0)) {
            return true;
        }
    }
    return false;
}

const RowResult* findResult(const std::vector<RowResult>& all, const char* caseName,
                            const char* impl, Regime regime) {
    for (const RowResult& o : all) {
        if (std::strcmp(o.plan->caseName, caseName) == 0 && o.regime == regime &&
            (impl == nullptr ? o.plan->reference : std::strcmp(o.plan->impl, impl) == 0)) {
            return &o;
        }
    }
    return nullptr;
}

// Judges one target of a row: "label (value): met" or "MISSED".
std::string judge(const RowResult& r, const Target& t, const std::vector<RowResult>& all) {
    double value = 0.0;
    bool met = false;
    double need = t.need(r.regime);
    std::string shown;
    if (t.kind == Target::Memory) {
        if (r.peakBytes < 0 || r.amount <= 0) {
            return t.label;
        }
        value = static_cast<double>(r.peakBytes) / r.amount;
        met = value <= need;
        shown = fmt("%.2fx", value);
    } else if (t.kind == Target::Under) {
        met = r.median < need;
        shown = timeText(r.median);
    } else {
        const RowResult* other = t.kind == Target::Fraction
                                     ? findResult(all, t.otherCase, t.otherImpl, r.regime)
                                     : findResult(all, r.plan->caseName, t.otherImpl, r.regime);
        if (other == nullptr || !other->status.empty() || other->median <= 0.0 || r.median <= 0.0) {
            return t.label;
        }
        if (t.kind == Target::Fraction) {
            value = r.median / other->median;
            met = value <= need;
        } else {
            value = other->median / r.median;
            met = value >= need;
        }
        shown = fmt("%.2fx", value);
    }
    std::string label = t.label;
    if (t.kind == Target::Ratio && t.needWarm != t.needDefault) {
        // The need of this regime, spelled out.
        label = fmt(">= %.1fx ", need) + (t.otherImpl != nullptr ? t.otherImpl : "reference");
    }
    return label + " (" + shown + "): " + (met ? "met" : "MISSED");
}

// The ratio to the case's reference in the same regime.
std::string ratioText(const RowResult& r, const std::vector<RowResult>& all) {
    const RowResult* ref = findResult(all, r.plan->caseName, nullptr, r.regime);
    if (!r.status.empty() || ref == nullptr || !ref->status.empty()) {
        return "";
    }
    if (r.plan->memory()) {
        if (r.peakBytes > 0 && ref->peakBytes > 0) {
            return fmt("%.2fx the memory",
                       static_cast<double>(r.peakBytes) / static_cast<double>(ref->peakBytes));
        }
        return "";
    }
    if (r.median <= 0.0) {
        return "";
    }
    return r.plan->reference ? "1.00x (reference)" : fmt("%.2fx", ref->median / r.median);
}

bool parseRegime(const std::string& text, std::vector<Regime>& regimes) {
    if (text == "all") {
        regimes = {Regime::Warm, Regime::Default, Regime::Cold};
    } else if (text == "warm") {
        regimes = {Regime::Warm};
    } else if (text == "default") {
        regimes = {Regime::Default};
    } else if (text == "cold") {
        regimes = {Regime::Cold};
    } else {
        return false;
    }
    return true;
}

std::string perMb(double count, std::uint64_t bytes) {
    return fmt("%.0f", bytes > 0 ? count * 1e6 / static_cast<double>(bytes) : 0.0);
}

} // namespace

int main(int argc, char** argv) {
    if (argc > 1 && std::strcmp(argv[1], "--child") == 0) {
        return childMain(argc, argv);
    }
    Options options;
    for (int i = 1; i < argc; i++) {
        std::string arg = argv[i];
        if (arg == "--quick") {
            options.quick = true;
        } else if (arg == "--keep") {
            options.keep = true;
        } else if (arg == "--case" && i + 1 < argc) {
            options.cases.push_back(argv[++i]);
        } else if (arg == "--regime" && i + 1 < argc) {
            if (!parseRegime(argv[++i], options.regimes)) {
                usage();
                return 2;
            }
        } else if (arg == "--runs" && i + 1 < argc) {
            options.runs = std::clamp(std::atoi(argv[++i]), 1, 64);
        } else if (arg == "--timeout" && i + 1 < argc) {
            options.timeoutSeconds = std::max(1, std::atoi(argv[++i]));
        } else if (arg == "--list") {
            for (const RowSpec& row : kRows) {
                std::cout << row.caseName << "\t" << row.impl << "\t"
                          << (findEntry(row.entryCase, row.impl) ? "built" : "not built") << "\n";
            }
            return 0;
        } else {
            usage();
            return 2;
        }
    }
    if (options.regimes.empty()) {
        parseRegime("all", options.regimes);
    }
    // A child that ended (a memory row, a crash) must not end the parent
    // that still writes to its pipe.
    std::signal(SIGPIPE, SIG_IGN);
    std::error_code ec;
    g_exe = std::filesystem::canonical("/proc/self/exe", ec).string();
    if (ec) {
        std::cerr << "oxbench: cannot find its own program file\n";
        return 1;
    }

    Corpus corpus;
    CorpusStats stats;
    std::string error;
    std::cerr << "oxbench: generating corpora" << (options.quick ? " (quick)" : "") << "...\n";
    auto genStart = std::chrono::steady_clock::now();
    if (!generateCorpus(corpus, options.quick, stats, error)) {
        std::cerr << "oxbench: " << error << "\n";
        return 1;
    }
    g_corpusDir = corpus.dir;
    std::cerr
        << "oxbench: corpora in " << corpus.dir << " ("
        << fmt("%.1f",
               std::chrono::duration<double>(std::chrono::steady_clock::now() - genStart).count())
        << " s)\n";

    // Rows of one case stand together in kRows. Memory rows are measured
    // once, one read in a fresh process each; the others once per regime.
    std::size_t count = sizeof(kRows) / sizeof(kRows[0]);
    std::vector<RowResult> results;
    results.reserve(count * options.regimes.size());
    for (std::size_t i = 0; i < count;) {
        std::size_t j = i;
        while (j < count && std::strcmp(kRows[j].caseName, kRows[i].caseName) == 0) {
            j++;
        }
        if (wanted(options, kRows[i].caseName)) {
            bool memory = kRows[i].memory();
            std::vector<Regime> regimes =
                memory ? std::vector<Regime>{Regime::Fresh} : options.regimes;
            for (Regime regime : regimes) {
                std::cerr << "oxbench: " << kRows[i].caseName << " (" << regimeName(regime)
                          << ")..." << std::flush;
                std::size_t first = results.size();
                for (std::size_t k = i; k < j; k++) {
                    RowResult r;
                    r.plan = &kRows[k];
                    r.regime = regime;
                    results.push_back(r);
                }
                if (memory) {
                    for (std::size_t k = first; k < results.size(); k++) {
                        runMemoryRow(results[k], options);
                    }
                } else {
                    std::vector<RowResult*> group;
                    for (std::size_t k = first; k < results.size(); k++) {
                        group.push_back(&results[k]);
                    }
                    runCase(group, options, regime);
                }
                for (std::size_t k = first; k < results.size(); k++) {
                    const RowResult& r = results[k];
                    std::cerr << " "
                              << (!r.status.empty()  ? r.status
                                  : r.peakBytes >= 0 ? fmt("peak %.1f MB", r.peakBytes / 1e6)
                                                     : timeText(r.median));
                }
                std::cerr << "\n";
            }
        }
        i = j;
    }

    char date[64];
    std::time_t now = std::time(nullptr);
    std::strftime(date, sizeof(date), "%Y-%m-%d %H:%M UTC", std::gmtime(&now));
    std::cout << "oxbench " << (options.quick ? "--quick " : "") << "on " << cpuModel() << ", "
              << sysconf(_SC_NPROCESSORS_ONLN) << " CPUs, " << date << "; regimes";
    for (Regime regime : options.regimes) {
        std::cout << " " << regimeName(regime);
    }
    std::cout << "; median of " << options.runs
              << " runs (warm, default: after one warm-up in one process; cold: one fresh "
                 "process per run).\n\n";
    std::uint64_t denseXml = fileSize(corpus.xmlDense);
    std::uint64_t denseCsv = fileSize(corpus.csvDense);
    std::cout << "Corpora: XML model " << fmt("%.1f", fileSize(corpus.xmlModel) / 1e6)
              << " MB, dense XML model " << fmt("%.1f", denseXml / 1e6) << " MB ("
              << perMb(static_cast<double>(stats.elements), denseXml) << " elements and "
              << perMb(static_cast<double>(stats.attributes), denseXml)
              << " attributes per MB), comment document "
              << fmt("%.1f", fileSize(corpus.xmlComment) / 1e6) << " MB, CSV "
              << fmt("%.1f", fileSize(corpus.csvTable) / 1e6) << " MB, dense CSV "
              << fmt("%.1f", denseCsv / 1e6) << " MB ("
              << perMb(static_cast<double>(stats.records), denseCsv)
              << " records of 10 fields per MB), " << corpus.nbDoubles << " doubles, tree of "
              << corpus.treeEntries << " entries, " << corpus.nbMessages
              << " messages, range list of " << corpus.rangeRecords << " records / "
              << corpus.rangeMembers << " members.\n\n";
    std::cout
        << "| Case | Regime | Implementation | Median | Throughput | vs reference | Target |\n";
    std::cout << "|---|---|---|---|---|---|---|\n";
    for (const RowResult& r : results) {
        std::string target;
        if (r.status.empty()) {
            for (const Target& t : r.plan->targets) {
                if (t.kind != Target::None) {
                    target += (target.empty() ? "" : "; ") + judge(r, t, results);
                }
            }
        }
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
        const RowResult* ref = findResult(results, r.plan->caseName, nullptr, r.regime);
        if (ref != nullptr && ref != &r && r.status.empty() && ref->status.empty() &&
            ref->check != 0.0 && r.check != 0.0 && ref->check != r.check) {
            note += (note.empty() ? "" : "; ") + fmt("check %.17g", r.check) +
                    fmt(" differs from reference %.17g", ref->check);
        }
        std::cout << "| " << r.plan->caseName << " | " << regimeName(r.regime) << " | "
                  << r.plan->impl << " | " << median << " | " << throughput << " | "
                  << ratioText(r, results) << " | " << target
                  << (note.empty() ? "" : " (" + note + ")") << " |\n";
    }
    std::cout.flush();

    if (!options.keep) {
        std::filesystem::remove_all(corpus.dir, ec);
    } else {
        std::cerr << "oxbench: corpora kept in " << corpus.dir << "\n";
    }
    return 0;
}
