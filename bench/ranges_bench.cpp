// ranges_bench: the member walk of a large range list.
//
// A compact list of 100,000 records of 100 members each (10,000,000 members,
// one-number gaps between the records) is walked from getFirstEntry through
// getNextEntry to the end. A search from the first record for each step would
// cost members x records; the walk remembers where the previous answer was
// found, so each step is constant time. The parse and compaction of the
// list's text (about 1.3 MB) are measured apart.
//
// Counters: "members/s" for the walk, "records/s" for the parse.
#include "oxbase/ranges/OxRangeList.h"

#include <benchmark/benchmark.h>

#include <string>

namespace {

constexpr unsigned int kRecords = 100000;
constexpr unsigned int kMembersPerRecord = 100;
constexpr unsigned long long kMembers =
    static_cast<unsigned long long>(kRecords) * kMembersPerRecord;

/// "0-99,101-200,202-301,...": each record followed by a gap of one number.
std::string rangeText() {
    std::string text;
    text.reserve(kRecords * 16);
    unsigned int first = 0;
    for (unsigned int i = 0; i < kRecords; i++) {
        if (i != 0) {
            text += ',';
        }
        text += std::to_string(first) + "-" + std::to_string(first + kMembersPerRecord - 1);
        first += kMembersPerRecord + 1;
    }
    return text;
}

void BM_WalkCompactList(benchmark::State& state) {
    const std::string text = rangeText();
    OxRangeList list(text.c_str(), "member");
    list.compact();
    if (list.isValid() != OxTrue || list.getLength() != kRecords) {
        state.SkipWithError("the range text was not accepted");
        return;
    }
    unsigned long long walked = 0;
    for (auto _ : state) {
        unsigned long long count = 0;
        unsigned int number = 0;
        if (list.getFirstEntry(number) == OxTrue) {
            do {
                count++;
                number = list.getNextEntry(number);
            } while (number != 0);
        }
        benchmark::DoNotOptimize(count);
        walked += count;
        if (count != kMembers) {
            state.SkipWithError("the walk did not visit every member");
            return;
        }
    }
    state.counters["members/s"] =
        benchmark::Counter(static_cast<double>(walked), benchmark::Counter::kIsRate);
}
BENCHMARK(BM_WalkCompactList)->Unit(benchmark::kMillisecond);

void BM_ParseAndCompact(benchmark::State& state) {
    const std::string text = rangeText();
    for (auto _ : state) {
        OxRangeList list(text.c_str(), "member");
        list.compact();
        benchmark::DoNotOptimize(list.getLength());
    }
    state.counters["records/s"] = benchmark::Counter(
        static_cast<double>(state.iterations()) * kRecords, benchmark::Counter::kIsRate);
}
BENCHMARK(BM_ParseAndCompact)->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
