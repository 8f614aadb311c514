// Corpus generation: XML model in the writer's layout and a dense XML model,
// a one-comment XML document, a CSV table with empty fields and a dense one,
// big-endian doubles, a directory tree and the bench message file.
#include "OxBenchCorpus.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <string>
#include <vector>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace oxbench {

namespace {

// A small deterministic generator, so that every run reads the same bytes.
struct Lcg {
    std::uint64_t state = 0x2545F4914F6CDD1DULL;
    std::uint32_t next() {
        state = state * 6364136223846793005ULL + 1442695040888963407ULL;
        return static_cast<std::uint32_t>(state >> 33);
    }
    // A multiple of 1/steps in [low, high).
    double grid(double low, double high, int steps) {
        int cells = static_cast<int>((high - low) * steps);
        return low + static_cast<double>(next() % static_cast<std::uint32_t>(cells)) / steps;
    }
};

// Appends to a string and hands it to the file every megabyte, so the
// generator itself stays small in memory.
class Sink {
public:
    explicit Sink(const std::string& path) : file(std::fopen(path.c_str(), "wb")) {}
    ~Sink() { close(); }
    bool good() const { return file != nullptr && !failed; }
    std::uint64_t size() const { return written + text.size(); }
    Sink& operator<<(const std::string& s) {
        text += s;
        spill();
        return *this;
    }
    Sink& operator<<(const char* s) {
        text += s;
        spill();
        return *this;
    }
    Sink& operator<<(long long v) {
        text += std::to_string(v);
        spill();
        return *this;
    }
    bool close() {
        if (file != nullptr) {
            flush();
            failed = std::fclose(file) != 0 || failed;
            file = nullptr;
        }
        return !failed;
    }

private:
    void spill() {
        if (text.size() >= (1u << 20)) {
            flush();
        }
    }
    void flush() {
        if (file != nullptr && !text.empty()) {
            failed = std::fwrite(text.data(), 1, text.size(), file) != text.size() || failed;
            written += text.size();
            text.clear();
        }
    }
    std::FILE* file;
    std::string text;
    std::uint64_t written = 0;
    bool failed = false;
};

std::string blanks(int n) {
    return std::string(static_cast<std::size_t>(n), ' ');
}

// The list form of an attribute value: one blank between values, and after
// every eleventh value a line end and a blank.
template <typename T, typename F> std::string listText(const T* values, int count, F spell) {
    std::string text;
    for (int i = 0; i < count; i++) {
        if (i > 0) {
            text += i % 11 == 0 ? "\n " : " ";
        }
        text += spell(values[i]);
    }
    return text;
}

std::string vec3Text(Lcg& rng) {
    return numberText(rng.grid(-500, 500, 8)) + " " + numberText(rng.grid(-500, 500, 8)) + " " +
           numberText(rng.grid(-500, 500, 8));
}

bool writeXmlModel(const std::string& path, std::uint64_t target) {
    Sink out(path);
    Lcg rng;
    out << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n";
    out << "<model name=\"oxbench\" units=\"mm\">\n";
    unsigned int indices[66];
    double normals[33];
    for (long long a = 0; out.size() < target; a++) {
        out << blanks(1) << "<assembly name=\"A" << a
            << "\" matrix=\"1.0 0.0 0.0 0.0 1.0 0.0 0.0 0.0 1.0\">\n";
        for (int b = 0; b < 4; b++) {
            std::string asmName = "A" + std::to_string(a) + "." + std::to_string(b);
            out << blanks(2) << "<assembly name=\"" << asmName << "\">\n";
            for (int p = 0; p < 4; p++) {
                std::string partName = asmName + "." + std::to_string(p);
                out << blanks(3) << "<part name=\"P" << partName << "\" color=\""
                    << numberText(rng.grid(0, 1, 16)) << " " << numberText(rng.grid(0, 1, 16))
                    << " " << numberText(rng.grid(0, 1, 16)) << "\">\n";
                out << blanks(4) << "<label>Bracket " << partName << "</label>\n";
                for (int k = 0; k < 8; k++) {
                    out << blanks(4) << "<point vec3d=\"" << vec3Text(rng) << "\"/>\n";
                }
                for (int k = 0; k < 66; k++) {
                    indices[k] = rng.next() % 5000;
                }
                out << blanks(4) << "<face indices=\""
                    << listText(indices, 66, [](unsigned int v) { return std::to_string(v); })
                    << "\"/>\n";
                for (int k = 0; k < 33; k++) {
                    normals[k] = rng.grid(-1, 1, 64);
                }
                out << blanks(4) << "<normals value_list=\""
                    << listText(normals, 33, [](double v) { return numberText(v); }) << "\"/>\n";
                out << blanks(3) << "</part>\n";
            }
            out << blanks(2) << "</assembly>\n";
        }
        out << blanks(1) << "</assembly>\n";
    }
    out << "</model>\n";
    return out.close();
}

bool writeXmlComment(const std::string& path, std::uint64_t target) {
    Sink out(path);
    Lcg rng;
    out << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n";
    out << "<!-- generated notes of a translation run\n";
    static const char* words[] = {"assembly", "part",  "face",    "edge",  "tolerance", "colour",
                                  "matrix",   "point", "indices", "layer", "shell",     "loop"};
    for (long long line = 0; out.size() < target; line++) {
        std::string text = " note " + std::to_string(line) + ":";
        while (text.size() < 90) {
            text += " ";
            text += words[rng.next() % 12];
        }
        out << text << "\n";
    }
    out << "-->\n";
    out << "<model name=\"comment\"/>\n";
    return out.close();
}

bool writeCsv(const std::string& path, std::uint64_t target) {
    Sink out(path);
    Lcg rng;
    out << "id,name,x,y,z,red,green,blue,layer,note\n";
    static const char* notes[] = {"ok", "check", "reworked", "imported", "mirrored"};
    for (long long row = 0; out.size() < target; row++) {
        if (row % 5000 == 0) {
            out << "# block " << row / 5000 << "\n";
        }
        std::string fields[10];
        fields[0] = std::to_string(row);
        fields[1] = "part_" + std::to_string(row);
        for (int k = 2; k < 5; k++) {
            fields[k] = numberText(rng.grid(-500, 500, 8));
        }
        for (int k = 5; k < 8; k++) {
            fields[k] = numberText(rng.grid(0, 1, 16));
        }
        fields[8] = std::to_string(rng.next() % 64);
        fields[9] = notes[rng.next() % 5];
        // About one field in six is empty; the id never is.
        for (int k = 1; k < 10; k++) {
            if (rng.next() % 6 == 0) {
                fields[k].clear();
            }
        }
        std::string line = fields[0];
        for (int k = 1; k < 10; k++) {
            line += ",";
            line += fields[k];
        }
        out << line << "\n";
    }
    return out.close();
}

// The dense model: many small elements with short attributes (about 11,500
// elements and 29,000 attributes per MB, 2.5 attributes per element), nested
// three levels deep.
bool writeXmlDense(const std::string& path, std::uint64_t target, CorpusStats& stats) {
    Sink out(path);
    Lcg rng;
    static const char* kinds[] = {"hex-bolt-m8-zinc-plated", "lock-nut-m8-zinc-plated",
                                  "flat-washer-form-a",      "dowel-pin-6-hardened",
                                  "blind-rivet-open-end",    "spring-clip-phosphated"};
    static const char* materials[] = {"stainless-steel", "brass-cw614n", "nylon-pa66",
                                      "aluminium-6061"};
    static const char* params[] = {"width-nominal", "height-nominal", "depth-nominal",
                                   "offset-nominal", "angle-nominal"};
    static const char* notes[] = {"checked", "mirrored", "imported", "rework"};
    static const char* layers[] = {"frame-left-upper", "cover-top-outer", "base-plate-lower",
                                   "mount-rear-inner"};
    out << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n";
    out << "<model name=\"dense\" units=\"mm\">\n";
    stats.elements = 1;
    stats.attributes = 2;
    for (long long g = 0; out.size() < target; g++) {
        out << blanks(1) << "<group id=\"G" << g << "\" kind=\"fixture\" layer=\"" << layers[g % 4]
            << "\">\n";
        stats.elements++;
        stats.attributes += 3;
        for (int s = 0; s < 4; s++) {
            out << blanks(2) << "<set id=\"S" << g << "." << s << "\" layer=\""
                << layers[rng.next() % 4] << "\">\n";
            stats.elements++;
            stats.attributes += 2;
            for (int m = 0; m < 6; m++) {
                long long id = 1000000 + g * 24 + s * 6 + m;
                // Four members, two edges, two params, one ref and three
                // notes in twelve, on the average.
                std::uint32_t pick = rng.next() % 12;
                if (pick < 4) {
                    out << blanks(3) << "<member id=\"M-ASM-" << id << "\" kind=\""
                        << kinds[rng.next() % 6] << "\" material=\"" << materials[rng.next() % 4]
                        << "\" layer=\"" << layers[rng.next() % 4] << "\"/>\n";
                    stats.attributes += 4;
                } else if (pick < 6) {
                    out << blanks(3) << "<edge from=\"N-NODE-" << 100000 + rng.next() % 900000
                        << "\" to=\"N-NODE-" << 100000 + rng.next() % 900000
                        << "\" kind=\"weld-seam-continuous\"/>\n";
                    stats.attributes += 3;
                } else if (pick < 8) {
                    out << blanks(3) << "<param name=\"" << params[rng.next() % 5] << "\" value=\""
                        << numberText(rng.grid(-100, 100, 64))
                        << "\" unit=\"millimetre-at-20C\"/>\n";
                    stats.attributes += 3;
                } else if (pick < 9) {
                    out << blanks(3) << "<ref part=\"PART-" << 10000 + rng.next() % 90000
                        << "\" count=\"" << 1 + rng.next() % 8 << "\" revision=\"B\"/>\n";
                    stats.attributes += 3;
                } else {
                    out << blanks(3) << "<note>" << notes[rng.next() % 4] << " by assembly station "
                        << rng.next() % 100
                        << ", seam and torque checked against the assembly drawing B.</note>\n";
                }
                stats.elements++;
            }
            out << blanks(2) << "</set>\n";
        }
        out << blanks(1) << "</group>\n";
    }
    out << "</model>\n";
    return out.close();
}

// The dense table: ten short fields in every record, none empty, about
// 12,500 records per MB.
bool writeCsvDense(const std::string& path, std::uint64_t target, CorpusStats& stats) {
    Sink out(path);
    Lcg rng;
    static const char* codes[] = {"AB", "BC", "CD", "DE", "EF", "FG"};
    out << "id,code,qty,x,y,z,rev,lot,bin,flag\n";
    stats.records = 0;
    for (long long row = 0; out.size() < target; row++) {
        std::string line = std::to_string(100000 + row);
        line += ",";
        line += codes[rng.next() % 6];
        line += "-" + std::to_string(1000 + rng.next() % 9000) + "-X";
        line += "," + std::to_string(rng.next() % 1000);
        for (int k = 0; k < 3; k++) {
            line += "," + numberText(rng.grid(-1000, 1000, 64));
        }
        line += "," + std::to_string(rng.next() % 100);
        line += ",LOT-2026-" + std::to_string(10000 + rng.next() % 90000);
        line += "," + std::to_string(rng.next() % 5000);
        line += rng.next() % 2 == 0 ? ",yes" : ",no";
        out << line << "\n";
        stats.records++;
    }
    return out.close();
}

bool writeDoubles(const std::string& path, std::size_t count) {
    std::FILE* file = std::fopen(path.c_str(), "wb");
    if (file == nullptr) {
        return false;
    }
    std::uint64_t block[8192];
    bool ok = true;
    for (std::size_t i = 0; i < count && ok;) {
        std::size_t n = 0;
        for (; n < 8192 && i < count; n++, i++) {
            double value = static_cast<double>(i) * 0.5 - 1000.25;
            std::uint64_t bits;
            std::memcpy(&bits, &value, 8);
            block[n] = byteSwap64(bits);
        }
        ok = std::fwrite(block, 8, n, file) == n;
    }
    return std::fclose(file) == 0 && ok;
}

bool makeDir(const std::string& path) {
    return mkdir(path.c_str(), 0755) == 0;
}

bool touch(const std::string& path) {
    int fd = open(path.c_str(), O_CREAT | O_WRONLY | O_TRUNC, 0644);
    if (fd < 0) {
        return false;
    }
    return close(fd) == 0;
}

// 10 top directories, 10 below each, 29 below each of those (3,010
// directories); 20 files in each directory of the two lower levels (60,000).
bool writeTree(const std::string& root, bool quick, std::size_t& entries) {
    int top = quick ? 1 : 10;
    entries = 1;
    if (!makeDir(root)) {
        return false;
    }
    for (int t = 0; t < top; t++) {
        std::string dt = root + "/dir" + std::to_string(t);
        if (!makeDir(dt)) {
            return false;
        }
        entries++;
        for (int m = 0; m < 10; m++) {
            std::string dm = dt + "/sub" + std::to_string(m);
            if (!makeDir(dm)) {
                return false;
            }
            entries++;
            for (int f = 0; f < 20; f++) {
                if (!touch(dm + "/file" + std::to_string(f) + ".dat")) {
                    return false;
                }
                entries++;
            }
            for (int l = 0; l < 29; l++) {
                std::string dl = dm + "/leaf" + std::to_string(l);
                if (!makeDir(dl)) {
                    return false;
                }
                entries++;
                for (int f = 0; f < 20; f++) {
                    if (!touch(dl + "/part" + std::to_string(f) + ".xml")) {
                        return false;
                    }
                    entries++;
                }
            }
        }
    }
    return true;
}

bool writeMessageFile(const std::string& path) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
#ifdef OXBENCH_DATA_DIR
    // The library's own messages first, so that what it logs during a case
    // has its text.
    std::ifstream defaults(std::string(OXBENCH_DATA_DIR) + "/oxbase.msg", std::ios::binary);
    if (defaults) {
        out << defaults.rdbuf();
    }
#endif
    out << "\n0 ---- oxbench\n" << kBenchMessage << ",I,0" << kBenchMessageText << "\n";
    return static_cast<bool>(out);
}

} // namespace

std::string numberText(double value) {
    if (value < 1e-9 && value > -1e-9) {
        value = 0.0;
    }
    char text[64];
    std::snprintf(text, sizeof(text), "%.9f", value);
    std::string s = text;
    std::size_t point = s.find('.');
    std::size_t end = s.size();
    while (end > point + 2 && s[end - 1] == '0') {
        end--;
    }
    s.resize(end);
    return s;
}

std::vector<std::string> writerLines(const std::string& path) {
    std::ifstream in(path);
    std::vector<std::string> lines;
    std::string line, unit;
    bool inValue = false;
    while (std::getline(in, line)) {
        if (!inValue && line.empty()) {
            continue;
        }
        // A line end inside a value comes back from the reader as the one
        // blank that begins the next line of the list form.
        unit += line;
        for (char c : line) {
            if (c == '"') {
                inValue = !inValue;
            }
        }
        if (!inValue) {
            lines.push_back(std::move(unit));
            unit.clear();
        }
    }
    return lines;
}

void describeCorpus(Corpus& corpus, const std::string& dir, bool quick) {
    corpus.dir = dir;
    corpus.xmlModel = corpus.dir + "/model.xml";
    corpus.xmlDense = corpus.dir + "/dense.xml";
    corpus.xmlComment = corpus.dir + "/comment.xml";
    corpus.csvTable = corpus.dir + "/table.csv";
    corpus.csvDense = corpus.dir + "/dense.csv";
    corpus.doubles = corpus.dir + "/doubles.bin";
    corpus.tree = corpus.dir + "/tree";
    corpus.messageFile = corpus.dir + "/oxbench.msg";
    corpus.logDir = corpus.dir + "/log";
    corpus.nbDoubles = quick ? 800000 : 8000000;
    corpus.nbMessages = quick ? 100000 : 1000000;
    corpus.rangeRecords = quick ? 10000 : 100000;
    corpus.rangeMembers = quick ? 1000000 : 10000000;
    // The tree of writeTree: the root, then per top directory itself, ten
    // middle directories with 20 files and 29 leaves of 20 files each.
    std::size_t top = quick ? 1 : 10;
    corpus.treeEntries = 1 + top * (1 + 10 * (1 + 20 + 29 * (1 + 20)));
}

bool generateCorpus(Corpus& corpus, bool quick, CorpusStats& stats, std::string& error) {
    const char* tmp = std::getenv("TMPDIR");
    std::string templ = (tmp != nullptr && *tmp != '\0' ? std::string(tmp) : std::string("/tmp")) +
                        "/oxbench.XXXXXX";
    std::string buffer = templ;
    if (mkdtemp(&buffer[0]) == nullptr) {
        error = "cannot create a temporary directory from " + templ;
        return false;
    }
    describeCorpus(corpus, buffer, quick);
    const std::uint64_t textBytes = quick ? 4000000 : 40000000;
    std::size_t treeEntries = 0;
    if (!writeXmlModel(corpus.xmlModel, textBytes)) {
        error = "cannot write " + corpus.xmlModel;
    } else if (!writeXmlDense(corpus.xmlDense, textBytes, stats)) {
        error = "cannot write " + corpus.xmlDense;
    } else if (!writeXmlComment(corpus.xmlComment, textBytes)) {
        error = "cannot write " + corpus.xmlComment;
    } else if (!writeCsv(corpus.csvTable, textBytes)) {
        error = "cannot write " + corpus.csvTable;
    } else if (!writeCsvDense(corpus.csvDense, textBytes, stats)) {
        error = "cannot write " + corpus.csvDense;
    } else if (!writeDoubles(corpus.doubles, corpus.nbDoubles)) {
        error = "cannot write " + corpus.doubles;
    } else if (!writeTree(corpus.tree, quick, treeEntries) || treeEntries != corpus.treeEntries) {
        error = "cannot build the tree below " + corpus.tree;
    } else if (!writeMessageFile(corpus.messageFile) || !makeDir(corpus.logDir)) {
        error = "cannot write the message file or log directory";
    }
    return error.empty();
}

} // namespace oxbench
