// csv_bench: throughput of OxCsvFile reading and writing.
//
// Generates a table of about 40 MB (ten columns, a header, a comment line,
// empty fields in three of the columns) in the temporary directory once, then
// measures readFile of the whole table into the element tree, and writeFile of
// that tree back to a second file. Each benchmark reports an "MB/s" counter
// (10^6 bytes of the file per second) and the record count.
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/io/OxFile.h"

#include <benchmark/benchmark.h>

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>

namespace {

constexpr std::size_t kTargetBytes = 40u * 1000u * 1000u;

// The scratch files shared by the benchmarks, removed at exit.
struct BenchFiles {
    std::string table;
    std::string copy;
    std::uintmax_t tableBytes = 0;
    BenchFiles() {
        std::string stem =
            (std::filesystem::temp_directory_path() /
             ("oxbase-csv-bench-" + std::to_string(reinterpret_cast<std::uintptr_t>(this))))
                .string();
        table = stem + ".csv";
        copy = stem + "-out.csv";
        generate();
    }
    ~BenchFiles() {
        std::error_code ignored;
        std::filesystem::remove(table, ignored);
        std::filesystem::remove(copy, ignored);
    }

    // Deterministic rows: a linear congruential sequence decides the values
    // and which of the optional columns stay empty.
    void generate() {
        std::ofstream out(table, std::ios::binary);
        out << "# generated parts table\n"
               "id,name,material,mass,length,width,height,color,supplier,description\n";
        static const char* const materials[] = {"steel", "alu", "rubber", "brass", "abs"};
        static const char* const suppliers[] = {"Acme", "Lightparts", "Boltworks", ""};
        std::uint32_t state = 12345u;
        auto next = [&state]() {
            state = state * 1664525u + 1013904223u;
            return state >> 8;
        };
        std::size_t written = 0;
        char line[256];
        for (unsigned int id = 1; written < kTargetBytes; id++) {
            std::uint32_t r = next();
            int n = std::snprintf(line, sizeof line, "%u,part %u,%s,%s,%u,%s,%u,%s,%s,%s\n", id,
                                  r % 9973, materials[r % 5], (r & 4) ? "" : "1.25", 10 + r % 990,
                                  (r & 8) ? "" : "40", 1 + r % 50, (r & 16) ? "0.5 0.5 0.5" : "",
                                  suppliers[(r >> 5) % 4], "generated description text");
            out.write(line, n);
            written += static_cast<std::size_t>(n);
        }
        out.close();
        tableBytes = std::filesystem::file_size(table);
    }
};

BenchFiles& files() {
    static BenchFiles instance;
    return instance;
}

void BM_CsvRead(benchmark::State& state) {
    BenchFiles& f = files();
    unsigned int records = 0;
    for (auto _ : state) {
        OxCsvFile csv(f.table.c_str(), OxFile::OxIOInput);
        if (csv.readFile() != OxTrue) {
            state.SkipWithError("readFile answered OxFalse");
            return;
        }
        records = csv.getRoot()->getNbChildElements();
        benchmark::DoNotOptimize(records);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * f.tableBytes));
    state.counters["MB/s"] = benchmark::Counter(
        static_cast<double>(state.iterations() * f.tableBytes) / 1e6, benchmark::Counter::kIsRate);
    state.counters["records"] = records;
}
BENCHMARK(BM_CsvRead)->Unit(benchmark::kMillisecond)->Iterations(3)->UseRealTime();

void BM_CsvWrite(benchmark::State& state) {
    BenchFiles& f = files();
    OxCsvFile csv(f.table.c_str(), OxFile::OxIOInput);
    if (csv.readFile() != OxTrue) {
        state.SkipWithError("readFile answered OxFalse");
        return;
    }
    for (auto _ : state) {
        if (csv.open(f.copy.c_str(), OxFile::OxIOOutput) != 0 || csv.writeFile() != OxTrue) {
            state.SkipWithError("writeFile answered OxFalse");
            return;
        }
    }
    // Every line is flushed by putline, so the file is complete here.
    std::uintmax_t bytes = std::filesystem::file_size(f.copy);
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * bytes));
    state.counters["MB/s"] = benchmark::Counter(
        static_cast<double>(state.iterations() * bytes) / 1e6, benchmark::Counter::kIsRate);
    state.counters["records"] = csv.getRoot()->getNbChildElements();
}
BENCHMARK(BM_CsvWrite)->Unit(benchmark::kMillisecond)->Iterations(3)->UseRealTime();

} // namespace

BENCHMARK_MAIN();
