// io_bench: throughput of the big-endian binary streams.
//
// Writes and reads 8,000,000 doubles (64 MB) through OxOutput / OxInput and
// reads them through OxMemory, next to plain loops over the same file in the
// same run: fwrite + byte swap, ifstream::read of 8 bytes + swap, and fread
// of 64 KiB blocks + swap. Each benchmark
// reports bytes per second and an "MB/s" counter (10^6 bytes).
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"
#include "oxbase/io/OxOutput.h"

#include <benchmark/benchmark.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

namespace {

constexpr std::size_t kValues = 8000000;
constexpr std::size_t kBytes = kValues * sizeof(double);
constexpr std::size_t kChunkValues = 8192;

// The scratch file shared by all benchmarks, removed at exit.
struct BenchFile {
    std::string path;
    BenchFile() {
        path =
            (std::filesystem::temp_directory_path() /
             ("oxbase-io-bench-" + std::to_string(reinterpret_cast<std::uintptr_t>(this)) + ".bin"))
                .string();
    }
    ~BenchFile() {
        std::error_code ignored;
        std::filesystem::remove(path, ignored);
    }
};

BenchFile& benchFile() {
    static BenchFile file;
    return file;
}

double valueAt(std::size_t i) {
    return static_cast<double>(i) * 0.5 - 1000.25;
}

std::uint64_t swap64(std::uint64_t v) {
    v = ((v & 0x00ff00ff00ff00ffull) << 8) | ((v >> 8) & 0x00ff00ff00ff00ffull);
    v = ((v & 0x0000ffff0000ffffull) << 16) | ((v >> 16) & 0x0000ffff0000ffffull);
    return (v << 32) | (v >> 32);
}

// Writes the values big-endian to `f` in blocks of `chunk`'s size.
void writeSwapped(std::FILE* f, std::vector<std::uint64_t>& chunk) {
    for (std::size_t i = 0; i < kValues; i += kChunkValues) {
        std::size_t n = std::min(kChunkValues, kValues - i);
        for (std::size_t k = 0; k < n; k++) {
            double v = valueAt(i + k);
            std::uint64_t bits;
            std::memcpy(&bits, &v, 8);
            chunk[k] = swap64(bits);
        }
        std::fwrite(chunk.data(), 8, n, f);
    }
}

// Writes the file with fwrite when no benchmark has written it yet.
void ensureFile() {
    if (std::filesystem::exists(benchFile().path) &&
        std::filesystem::file_size(benchFile().path) == kBytes) {
        return;
    }
    std::FILE* f = std::fopen(benchFile().path.c_str(), "wb");
    if (f == nullptr) {
        return;
    }
    std::vector<std::uint64_t> chunk(kChunkValues);
    writeSwapped(f, chunk);
    std::fclose(f);
}

void report(benchmark::State& state) {
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(kBytes));
    state.counters["MB/s"] = benchmark::Counter(static_cast<double>(state.iterations()) *
                                                    static_cast<double>(kBytes) / 1e6,
                                                benchmark::Counter::kIsRate);
}

void BM_OxOutputWriteDoubles(benchmark::State& state) {
    for (auto _ : state) {
        OxOutput out(benchFile().path.c_str(), OxFile::FILE_MODE_BINARY);
        if (out.isGood() != OxTrue) {
            state.SkipWithError("cannot open the output file");
            return;
        }
        for (std::size_t i = 0; i < kValues; i++) {
            out.write(valueAt(i));
        }
    }
    report(state);
}

void BM_FwriteSwapDoubles(benchmark::State& state) {
    std::vector<std::uint64_t> chunk(kChunkValues);
    for (auto _ : state) {
        std::FILE* f = std::fopen(benchFile().path.c_str(), "wb");
        if (f == nullptr) {
            state.SkipWithError("cannot open the output file");
            return;
        }
        writeSwapped(f, chunk);
        std::fclose(f);
    }
    report(state);
}

void BM_OxInputReadDoubles(benchmark::State& state) {
    ensureFile();
    for (auto _ : state) {
        OxInput in(benchFile().path.c_str(), OxFile::FILE_MODE_BINARY);
        double sum = 0.0;
        double value = 0.0;
        for (std::size_t i = 0; i < kValues; i++) {
            in.read(value);
            sum += value;
        }
        benchmark::DoNotOptimize(sum);
        if (sum != 0.25 * static_cast<double>(kValues) * static_cast<double>(kValues - 1) -
                       1000.25 * static_cast<double>(kValues)) {
            state.SkipWithError("the values read back differ");
            return;
        }
    }
    report(state);
}

void BM_IfstreamReadSwapDoubles(benchmark::State& state) {
    ensureFile();
    for (auto _ : state) {
        std::ifstream in(benchFile().path, std::ios::binary);
        double sum = 0.0;
        for (std::size_t i = 0; i < kValues; i++) {
            std::uint64_t bits;
            in.read(reinterpret_cast<char*>(&bits), 8);
            bits = swap64(bits);
            double v;
            std::memcpy(&v, &bits, 8);
            sum += v;
        }
        benchmark::DoNotOptimize(sum);
    }
    report(state);
}

void BM_OxMemoryReadDoubles(benchmark::State& state) {
    ensureFile();
    // One spare byte: the memory reader never hands out the last one.
    std::vector<unsigned char> bytes(kBytes + 1, 0);
    std::FILE* f = std::fopen(benchFile().path.c_str(), "rb");
    if (f == nullptr || std::fread(bytes.data(), 1, kBytes, f) != kBytes) {
        if (f != nullptr) {
            std::fclose(f);
        }
        state.SkipWithError("cannot read the file");
        return;
    }
    std::fclose(f);
    for (auto _ : state) {
        OxMemory memory(bytes.data(), static_cast<unsigned int>(bytes.size()));
        double sum = 0.0;
        double value = 0.0;
        for (std::size_t i = 0; i < kValues; i++) {
            memory.read(value);
            sum += value;
        }
        benchmark::DoNotOptimize(sum);
    }
    report(state);
}

void BM_FreadSwapDoubles(benchmark::State& state) {
    ensureFile();
    std::vector<std::uint64_t> chunk(kChunkValues);
    for (auto _ : state) {
        std::FILE* f = std::fopen(benchFile().path.c_str(), "rb");
        if (f == nullptr) {
            state.SkipWithError("cannot open the file");
            return;
        }
        double sum = 0.0;
        std::size_t n;
        while ((n = std::fread(chunk.data(), 8, kChunkValues, f)) > 0) {
            for (std::size_t k = 0; k < n; k++) {
                std::uint64_t bits = swap64(chunk[k]);
                double v;
                std::memcpy(&v, &bits, 8);
                sum += v;
            }
        }
        std::fclose(f);
        benchmark::DoNotOptimize(sum);
    }
    report(state);
}

} // namespace

BENCHMARK(BM_OxOutputWriteDoubles)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_FwriteSwapDoubles)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_OxInputReadDoubles)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_IfstreamReadSwapDoubles)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_OxMemoryReadDoubles)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_FreadSwapDoubles)->Unit(benchmark::kMillisecond);

BENCHMARK_MAIN();
