// walk_bench: entries per second of the file tree walk, next to nftw.
//
// Generates a tree of 60,000 empty files in 3,030 directories (30 top
// directories of 100 directories of 20 files each) under the temporary
// directory, then walks it with OxFileTreeWalk (10 stream slots, and 1 slot
// where every directory is parked) and with POSIX nftw (FTW_PHYS, 10
// descriptors) in the same run. Each benchmark reports the entries visited
// per second ("entries/s") and checks that every walk saw the whole tree.
#include "oxbase/io/OxFileTreeWalk.h"

#include <benchmark/benchmark.h>

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <ftw.h>
#include <string>

namespace {

constexpr int kTop = 30;
constexpr int kPerTop = 100;
constexpr int kFilesPerDir = 20;
/// The root, the directories and the files: what a full walk reports.
constexpr std::size_t kEntries = 1 + kTop + kTop * kPerTop + kTop * kPerTop * kFilesPerDir;

struct BenchTree {
    std::string root;
    BenchTree() {
        root = (std::filesystem::temp_directory_path() /
                ("oxbase-walk-bench-" + std::to_string(reinterpret_cast<std::uintptr_t>(this))))
                   .string();
        for (int top = 0; top < kTop; top++) {
            for (int dir = 0; dir < kPerTop; dir++) {
                std::string path =
                    root + "/top" + std::to_string(top) + "/dir" + std::to_string(dir);
                std::filesystem::create_directories(path);
                for (int file = 0; file < kFilesPerDir; file++) {
                    std::ofstream(path + "/file" + std::to_string(file) + ".xml");
                }
            }
        }
    }
    ~BenchTree() {
        std::error_code ignored;
        std::filesystem::remove_all(root, ignored);
    }
};

const BenchTree& tree() {
    static BenchTree instance;
    return instance;
}

int countEntry(const char*, const OxStat*, OxFileTreeWalkType, void* userData) {
    ++*static_cast<std::size_t*>(userData);
    return 0;
}

void BM_OxFileTreeWalk(benchmark::State& state) {
    const std::string& root = tree().root;
    std::size_t total = 0;
    for (auto _ : state) {
        std::size_t count = 0;
        // One object per walk: its inode table remembers what it entered.
        OxFileTreeWalk walk(root.c_str(), countEntry, static_cast<int>(state.range(0)), &count);
        if (walk.run() != 0 || count != kEntries) {
            state.SkipWithError("the walk did not report the whole tree");
            break;
        }
        total += count;
    }
    state.SetItemsProcessed(static_cast<int64_t>(total));
    state.counters["entries/s"] =
        benchmark::Counter(static_cast<double>(total), benchmark::Counter::kIsRate);
}
BENCHMARK(BM_OxFileTreeWalk)->ArgName("streams")->Arg(10)->Arg(1)->Unit(benchmark::kMillisecond);

std::size_t nftwCount = 0;

int nftwEntry(const char*, const struct stat*, int, struct FTW*) {
    ++nftwCount;
    return 0;
}

void BM_nftw(benchmark::State& state) {
    const std::string& root = tree().root;
    std::size_t total = 0;
    for (auto _ : state) {
        nftwCount = 0;
        if (nftw(root.c_str(), nftwEntry, 10, FTW_PHYS) != 0 || nftwCount != kEntries) {
            state.SkipWithError("nftw did not report the whole tree");
            break;
        }
        total += nftwCount;
    }
    state.SetItemsProcessed(static_cast<int64_t>(total));
    state.counters["entries/s"] =
        benchmark::Counter(static_cast<double>(total), benchmark::Counter::kIsRate);
}
BENCHMARK(BM_nftw)->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
