// oxbench: one program that times OxBase next to the libraries a user would
// otherwise pick, on the same generated corpora, in the same run.
//
// Every implementation of a case is a Runner that registers itself with a
// static OxBenchRegistration. The harness runs each runner in a child process
// of its own (the oxbench program itself, started again with --child), so a
// crash or a runaway case costs one row, not the table, and each heap regime
// gets the process it needs; it prints the median of the timed runs.
//
//   class MyRunner : public oxbench::Runner { ... };
//   static oxbench::Registration reg("csv-read", "getline+split",
//                                    [] { return std::make_unique<MyRunner>(); });
#ifndef OXBENCH_OXBENCH_H
#define OXBENCH_OXBENCH_H

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace oxbench {

/// The generated inputs of one run, all below one temporary directory.
struct Corpus {
    std::string dir;         ///< the temporary directory, removed at exit
    std::string xmlModel;    ///< the XML model in the writer's layout
    std::string xmlDense;    ///< the dense XML model: many small elements, short attributes
    std::string xmlComment;  ///< a document that is one long multi-line comment
    std::string csvTable;    ///< the CSV table, header line first
    std::string csvDense;    ///< the dense CSV table: ten short fields in every record
    std::string doubles;     ///< big-endian doubles, no framing
    std::string tree;        ///< root of the directory tree
    std::string messageFile; ///< message file with the bench's own message
    std::string logDir;      ///< directory of the log files
    std::size_t nbDoubles = 0;
    std::size_t nbMessages = 0;
    std::size_t rangeRecords = 0;
    std::size_t rangeMembers = 0;
    std::size_t treeEntries = 0; ///< directories + files + the root itself
    /// The shape a document case reads in this process: the dense corpora
    /// when set (set by the harness per row, before prepare).
    bool dense = false;
    const std::string& xmlInput() const { return dense ? xmlDense : xmlModel; }
    const std::string& csvInput() const { return dense ? csvDense : csvTable; }
};

/// The message the message case logs: number, its text in the message file.
constexpr unsigned int kBenchMessage = 900;
constexpr const char* kBenchMessageText = "Part %s %d read with %u points";

/// What one timed run produced. `check` lets the harness compare the
/// implementations of a case (same count, same sum), `amount` is the number
/// of bytes or items processed.
struct Outcome {
    bool ok = true;
    double amount = 0.0;
    double check = 0.0;
    std::string note;
};

class Runner {
public:
    virtual ~Runner() = default;
    /// Untimed, once before the warm-up. Returns false (and a note) when the
    /// runner cannot work with this corpus.
    virtual bool prepare(const Corpus& corpus, std::string& note) {
        (void)corpus;
        (void)note;
        return true;
    }
    /// Untimed, before each run (a case that times the end of something
    /// builds it here). Returns false (and a note) when it cannot.
    virtual bool beforeRun(std::string& note) {
        (void)note;
        return true;
    }
    /// The timed work.
    virtual Outcome run() = 0;
    /// Untimed, after each run: may fill in `outcome.check` from what the
    /// run built, then frees it.
    virtual void afterRun(Outcome& outcome) { (void)outcome; }
    /// True when `amount` counts items rather than bytes.
    virtual bool countsItems() const { return false; }
};

using Factory = std::function<std::unique_ptr<Runner>()>;

struct Entry {
    std::string caseName;
    std::string impl;
    Factory factory;
};

std::vector<Entry>& registry();

struct Registration {
    Registration(const char* caseName, const char* impl, Factory factory) {
        registry().push_back({caseName, impl, std::move(factory)});
    }
};

/// Helpers shared by the runners.
std::uint64_t fileSize(const std::string& path);
std::string readWholeFile(const std::string& path);

inline std::uint64_t byteSwap64(std::uint64_t v) {
    return __builtin_bswap64(v);
}

} // namespace oxbench

#endif
