// The reference implementations that need nothing but the C++ and POSIX
// libraries: getline + split (CSV), ifstream::read and fread + swap (binary),
// ofstream with a flush per line (XML write, messages), nftw (walk) and a
// nested loop over a vector of ranges (range walk).
#include "OxBench.h"
#include "OxBenchCorpus.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <iomanip>
#include <string>
#include <vector>

#include <ftw.h>

namespace oxbench {
namespace {

// ---- CSV: getline + split, keeping every row ----------------------------

class CsvGetline : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.csvInput();
        return true;
    }
    Outcome run() override {
        std::ifstream in(path);
        std::string line;
        bool header = true;
        while (std::getline(in, line)) {
            if (line.empty() || line[0] == '#') {
                continue;
            }
            std::vector<std::string> fields;
            std::size_t start = 0;
            for (;;) {
                std::size_t comma = line.find(',', start);
                if (comma == std::string::npos) {
                    fields.emplace_back(line, start);
                    break;
                }
                fields.emplace_back(line, start, comma - start);
                start = comma + 1;
            }
            if (header) {
                columns = std::move(fields);
                header = false;
            } else {
                rows.push_back(std::move(fields));
            }
        }
        Outcome outcome;
        outcome.amount = static_cast<double>(fileSize(path));
        return outcome;
    }
    void afterRun(Outcome& outcome) override {
        outcome.check = static_cast<double>(rows.size());
        rows.clear();
        rows.shrink_to_fit();
    }

private:
    std::string path;
    std::vector<std::string> columns;
    std::vector<std::vector<std::string>> rows;
};
Registration csvGetline("csv-read", "getline + split, all rows kept",
                        [] { return std::make_unique<CsvGetline>(); });

// ---- Binary: ifstream::read of 8 bytes + swap ---------------------------

double swappedDouble(const char* bytes) {
    std::uint64_t bits;
    std::memcpy(&bits, bytes, 8);
    bits = byteSwap64(bits);
    double value;
    std::memcpy(&value, &bits, 8);
    return value;
}

class BinaryIfstream : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.doubles;
        return true;
    }
    Outcome run() override {
        std::ifstream in(path, std::ios::binary);
        char bytes[8];
        double sum = 0.0;
        std::size_t count = 0;
        while (in.read(bytes, 8)) {
            sum += swappedDouble(bytes);
            count++;
        }
        Outcome outcome;
        outcome.amount = static_cast<double>(count * 8);
        outcome.check = sum;
        return outcome;
    }

private:
    std::string path;
};
Registration binaryIfstream("binary-file", "ifstream::read 8 bytes + swap",
                            [] { return std::make_unique<BinaryIfstream>(); });

// ---- Binary: fread of 1 MiB blocks + swap --------------------------------

class BinaryFread : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.doubles;
        block.resize(1u << 20);
        return true;
    }
    Outcome run() override {
        Outcome outcome;
        std::FILE* file = std::fopen(path.c_str(), "rb");
        if (file == nullptr) {
            outcome.ok = false;
            outcome.note = "cannot open " + path;
            return outcome;
        }
        double sum = 0.0;
        std::size_t total = 0;
        std::size_t n;
        while ((n = std::fread(block.data(), 1, block.size(), file)) > 0) {
            for (std::size_t i = 0; i + 8 <= n; i += 8) {
                sum += swappedDouble(block.data() + i);
            }
            total += n;
        }
        std::fclose(file);
        outcome.amount = static_cast<double>(total);
        outcome.check = sum;
        return outcome;
    }

private:
    std::string path;
    std::vector<char> block;
};
Registration binaryFread("binary-memory", "fread 1 MiB blocks + swap",
                         [] { return std::make_unique<BinaryFread>(); });

// ---- XML write: ofstream, one flush per line -------------------------------

class XmlWriteOfstream : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        lines = writerLines(corpus.xmlInput());
        out = corpus.dir + "/write-ofstream.xml";
        return !lines.empty();
    }
    Outcome run() override {
        std::ofstream file(out, std::ios::trunc);
        for (const std::string& line : lines) {
            file << line << "\n" << std::flush;
        }
        file.close();
        Outcome outcome;
        outcome.ok = static_cast<bool>(file);
        outcome.amount = static_cast<double>(fileSize(out));
        return outcome;
    }

private:
    std::vector<std::string> lines;
    std::string out;
};
Registration xmlWriteOfstream("xml-write", "ofstream, flush per line",
                              [] { return std::make_unique<XmlWriteOfstream>(); });

// ---- Walk: nftw with FTW_PHYS ----------------------------------------------

std::size_t nftwCount = 0;

int countEntry(const char*, const struct stat*, int, struct FTW*) {
    nftwCount++;
    return 0;
}

class WalkNftw : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        root = corpus.tree;
        return true;
    }
    Outcome run() override {
        nftwCount = 0;
        Outcome outcome;
        outcome.ok = nftw(root.c_str(), countEntry, 10, FTW_PHYS) == 0;
        outcome.amount = static_cast<double>(nftwCount);
        outcome.check = static_cast<double>(nftwCount);
        return outcome;
    }
    bool countsItems() const override { return true; }

private:
    std::string root;
};
Registration walkNftw("walk", "nftw FTW_PHYS", [] { return std::make_unique<WalkNftw>(); });

// ---- Messages: ofstream, the same formatted lines, one flush each --------

class MessagesOfstream : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.logDir + "/reference.log";
        count = corpus.nbMessages;
        return true;
    }
    Outcome run() override {
        std::ofstream log(path, std::ios::out | std::ios::trunc);
        for (std::size_t i = 0; i < count; i++) {
            // "%3u" + type letter + ": " + "Part %s %d read with %u points"
            log << std::right << std::setfill(' ') << std::setw(3) << kBenchMessage << std::left
                << 'I' << ": Part "
                << "bracket"
                << " " << static_cast<int>(i) << " read with " << static_cast<unsigned int>(i % 97)
                << " points"
                << "\n"
                << std::flush;
        }
        log.close();
        Outcome outcome;
        outcome.ok = static_cast<bool>(log);
        outcome.amount = static_cast<double>(count);
        return outcome;
    }
    bool countsItems() const override { return true; }

private:
    std::string path;
    std::size_t count = 0;
};
Registration messagesOfstream("messages", "ofstream, flush per line",
                              [] { return std::make_unique<MessagesOfstream>(); });

// ---- Range walk: nested loop over a vector of closed ranges ----------------

class RangeVector : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        std::uint32_t width = static_cast<std::uint32_t>(corpus.rangeMembers / corpus.rangeRecords);
        for (std::uint32_t i = 0; i < corpus.rangeRecords; i++) {
            ranges.push_back({i * 2 * width, i * 2 * width + width - 1});
        }
        return true;
    }
    Outcome run() override {
        double sum = 0.0;
        std::size_t members = 0;
        for (const auto& r : ranges) {
            for (std::uint64_t n = r.first; n <= r.second; n++) {
                sum += static_cast<double>(n);
                members++;
            }
        }
        Outcome outcome;
        outcome.amount = static_cast<double>(members);
        outcome.check = sum;
        return outcome;
    }
    bool countsItems() const override { return true; }

private:
    std::vector<std::pair<std::uint32_t, std::uint32_t>> ranges;
};
Registration rangeVector("range-walk", "vector of ranges, nested loop",
                         [] { return std::make_unique<RangeVector>(); });

} // namespace
} // namespace oxbench
