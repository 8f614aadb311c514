// Message-file load: time and peak memory of starting OxMsg on large message
// files of several shapes, each load in a fresh child process.
//
// Targets: a 1,000,000-line file loads in under 2 seconds, with the process
// growing by less than 3 times the file's size. Regimes: "cold" is the first
// load of a fresh process; "default" a second load in the same process (after
// the first was shut down) with plain malloc; "warm" the same with an
// allocator that keeps what is freed (no mmap, no trimming).
//
//   msgfile_bench            all shapes, all regimes
//   msgfile_bench --quick    files of a tenth of the size
#include "oxbase/diag/OxMsg.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>
#include <vector>

#include <malloc.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

struct Shape {
    const char* name;
    std::string path;
    std::uintmax_t size = 0;
};

/// Writes the shapes below `dir`: short messages in order, the same numbers
/// shuffled, long texts, and messages of many continuation lines.
std::vector<Shape> makeShapes(const std::string& dir, unsigned int lines) {
    std::vector<Shape> shapes = {{"short, ascending", dir + "/short.msg"},
                                 {"short, shuffled", dir + "/shuffled.msg"},
                                 {"long texts", dir + "/long.msg"},
                                 {"continuations", dir + "/continued.msg"}};
    std::vector<unsigned int> numbers(lines);
    for (unsigned int i = 0; i < lines; i++) {
        numbers[i] = i + 1;
    }
    auto shortLine = [](unsigned int n) {
        return std::to_string(n) + ",I,0Message " + std::to_string(n % 1000) + "\n";
    };
    {
        std::ofstream out(shapes[0].path);
        for (unsigned int n : numbers) {
            out << shortLine(n);
        }
    }
    {
        std::mt19937 random(7);
        std::shuffle(numbers.begin(), numbers.end(), random);
        std::ofstream out(shapes[1].path);
        for (unsigned int n : numbers) {
            out << shortLine(n);
        }
    }
    {
        std::ofstream out(shapes[2].path);
        std::string text(150, 'x');
        for (unsigned int n = 1; n <= lines / 8; n++) {
            out << n << ",E,0In file part.xml the part " << n << " failed: " << text << "\n";
        }
    }
    {
        // A thousand messages, each continued over many lines.
        std::ofstream out(shapes[3].path);
        for (unsigned int n = 1; n <= 1000; n++) {
            out << n << ",W,0Start of message " << n << "\n";
        }
        for (unsigned int i = 0; i < lines; i++) {
            out << (i % 1000 + 1) << " continued line " << i << "\n";
        }
    }
    for (Shape& shape : shapes) {
        shape.size = std::filesystem::file_size(shape.path);
    }
    return shapes;
}

long long residentBytes() {
    std::ifstream statm("/proc/self/statm");
    long long pages = 0, resident = 0;
    statm >> pages >> resident;
    return resident * sysconf(_SC_PAGESIZE);
}

struct Result {
    double seconds = 0.0;
    long long growth = 0; ///< peak resident bytes above the start of the load
    int valid = 0;
};

/// One load in this process; the subsystem is shut down afterwards.
Result load(const std::string& path) {
    Result result;
    long long before = residentBytes();
    auto start = std::chrono::steady_clock::now();
    {
        OxMsg msg(path.c_str(), nullptr, nullptr, nullptr);
        result.seconds =
            std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
        result.valid = OxMsg::isValid() == OxTrue ? 1 : 0;
        rusage usage{};
        getrusage(RUSAGE_SELF, &usage);
        result.growth = usage.ru_maxrss * 1024 - before;
    }
    return result;
}

/// Runs `regime` for `path` in a fresh child and returns what it measured.
Result inChild(const std::string& path, const std::string& regime) {
    int ends[2];
    if (pipe(ends) != 0) {
        return {};
    }
    std::fflush(stdout);
    pid_t child = fork();
    if (child == 0) {
        close(ends[0]);
        if (regime == "warm") {
            mallopt(M_MMAP_MAX, 0);
            mallopt(M_TRIM_THRESHOLD, -1);
        }
        Result result = load(path);
        if (regime != "cold") {
            result = load(path); // the first load warmed the heap up
        }
        ssize_t written = write(ends[1], &result, sizeof result);
        _exit(written == static_cast<ssize_t>(sizeof result) ? 0 : 1);
    }
    close(ends[1]);
    Result result;
    if (child < 0 || read(ends[0], &result, sizeof result) != static_cast<ssize_t>(sizeof result)) {
        result = Result{};
    }
    close(ends[0]);
    int status = 0;
    if (child > 0) {
        waitpid(child, &status, 0);
    }
    return result;
}

} // namespace

int main(int argc, char** argv) {
    bool quick = argc > 1 && std::strcmp(argv[1], "--quick") == 0;
    unsigned int lines = quick ? 100000 : 1000000;
    std::string dir = (std::filesystem::temp_directory_path() /
                       ("oxbase-msgfile-bench-" + std::to_string(getpid())))
                          .string();
    std::filesystem::create_directories(dir);
    std::vector<Shape> shapes = makeShapes(dir, lines);
    std::printf("Message-file load, %u lines a shape (continuations: 1000 messages), each load "
                "in a fresh process.\n\n",
                lines);
    std::printf(
        "| Shape | File | Regime | Load | Peak growth | Target |\n|---|---|---|---|---|---|\n");
    bool allMet = true;
    for (const Shape& shape : shapes) {
        for (const char* regime : {"cold", "default", "warm"}) {
            Result r = inChild(shape.path, regime);
            double ratio = static_cast<double>(r.growth) / static_cast<double>(shape.size);
            // The memory target is judged on the first load of a process,
            // where the growth is all the load's own.
            bool timeMet = r.valid == 1 && r.seconds < 2.0;
            bool memoryMet = std::strcmp(regime, "cold") != 0 || ratio < 3.0;
            allMet = allMet && timeMet && memoryMet;
            std::printf("| %s | %.1f MB | %s | %.3f s | %s | %s |\n", shape.name,
                        static_cast<double>(shape.size) / 1e6, regime, r.seconds,
                        std::strcmp(regime, "cold") == 0
                            ? (std::to_string(r.growth / 100000 / 10.0).substr(0, 5) + " MB (" +
                               std::to_string(ratio).substr(0, 4) + "x file)")
                                  .c_str()
                            : "",
                        timeMet && memoryMet ? "met" : "MISSED");
        }
    }
    std::error_code error;
    std::filesystem::remove_all(dir, error);
    return allMet ? 0 : 1;
}
