// XML reader and writer throughput.
//
// A 40 MB document is generated in the writer's layout: an assembly nested six
// levels deep (assembly, group, subgroup, part, points, point), parts with
// colours, index lists with a line end behind every eleventh value, and
// points. Reported: read and write MB/s of that document, and the read of a
// 10 MB multi-line comment next to 10 MB of elements, which should take
// about the same time (the reader is linear per line).
#include "oxbase/doc/OxXmlFile.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>

namespace {
namespace fs = std::filesystem;

class Fixture {
public:
    Fixture() {
        dir = fs::temp_directory_path() /
              ("oxbase-xml-bench-" + std::to_string(std::random_device()()));
        fs::create_directories(dir);
        large = generateElements((dir / "large.xml").string(), 40u << 20);
        elements = generateElements((dir / "elements.xml").string(), 10u << 20);
        comment = generateComment((dir / "comment.xml").string(), 10u << 20);
    }
    ~Fixture() {
        std::error_code error;
        fs::remove_all(dir, error);
    }

    std::string path(const char* name) const { return (dir / name).string(); }

    size_t large = 0;
    size_t elements = 0;
    size_t comment = 0;

private:
    static std::string number(unsigned int seed) {
        // Spread digits the way coordinates look: 1 to 3 digits before the
        // point, up to 4 behind it.
        std::string text = std::to_string(seed % 997) + "." + std::to_string(seed % 9973);
        return (seed & 1) != 0 ? "-" + text : text;
    }

    static size_t generateElements(const std::string& file, size_t target) {
        std::string text = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n"
                           "<assembly name=\"bench\">\n";
        unsigned int seed = 1;
        for (unsigned int g = 0; text.size() < target; g++) {
            text += " <group name=\"g" + std::to_string(g) + "\">\n";
            for (unsigned int s = 0; s < 4 && text.size() < target; s++) {
                text += "  <group name=\"s" + std::to_string(s) + "\">\n";
                for (unsigned int p = 0; p < 8; p++) {
                    text += "   <part name=\"p" + std::to_string(p) + "\" color=\"0.5 0.25 " +
                            std::to_string(p % 2) + ".0\">\n";
                    text += "    <mesh indices=\"";
                    for (unsigned int i = 0; i < 66; i++) {
                        text += (i == 0 ? "" : (i % 11 == 0 ? "\n " : " ")) +
                                std::to_string((seed += 7919) % 50000);
                    }
                    text += "\"/>\n    <points>\n";
                    for (unsigned int i = 0; i < 12; i++) {
                        unsigned int x = seed += 104729;
                        unsigned int y = seed += 7;
                        unsigned int z = seed += 13;
                        text += "     <point vec3d=\"" + number(x) + " " + number(y) + " " +
                                number(z) + "\"/>\n";
                    }
                    text += "    </points>\n   </part>\n";
                }
                text += "  </group>\n";
            }
            text += " </group>\n";
        }
        text += "</assembly>\n";
        std::ofstream(file, std::ios::binary) << text;
        return text.size();
    }

    static size_t generateComment(const std::string& file, size_t target) {
        std::string text = "<?xml version=\"1.0\"?>\n<!-- a long comment\n";
        while (text.size() < target) {
            text += "  line of a comment that goes on over many lines, "
                    "as a licence text or a change log would\n";
        }
        text += "-->\n<root/>\n";
        std::ofstream(file, std::ios::binary) << text;
        return text.size();
    }

    fs::path dir;
};

Fixture& fixture() {
    static Fixture instance;
    return instance;
}

void readDocument(benchmark::State& state, const std::string& path, size_t bytes) {
    for (auto _ : state) {
        OxXmlFile file(path.c_str(), OxFile::OxIOInput);
        OxBool ok = file.readFile();
        benchmark::DoNotOptimize(ok);
        benchmark::DoNotOptimize(file.getRoot());
        if (ok != OxTrue) {
            state.SkipWithError("read failed");
        }
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * bytes));
}

void BM_XmlRead40MB(benchmark::State& state) {
    readDocument(state, fixture().path("large.xml"), fixture().large);
}

void BM_XmlWrite40MB(benchmark::State& state) {
    std::string in = fixture().path("large.xml");
    std::string out = fixture().path("written.xml");
    OxXmlFile file(in.c_str(), OxFile::OxIOInput);
    file.readFile();
    file.open(out.c_str(), OxFile::OxIOOutput);
    for (auto _ : state) {
        OxBool ok = file.writeFile();
        benchmark::DoNotOptimize(ok);
    }
    state.SetBytesProcessed(
        static_cast<int64_t>(state.iterations() * static_cast<size_t>(fs::file_size(out))));
}

void BM_XmlRead10MBElements(benchmark::State& state) {
    readDocument(state, fixture().path("elements.xml"), fixture().elements);
}

void BM_XmlRead10MBComment(benchmark::State& state) {
    readDocument(state, fixture().path("comment.xml"), fixture().comment);
}

BENCHMARK(BM_XmlRead40MB)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_XmlWrite40MB)->Unit(benchmark::kMillisecond)->MinTime(2.0);
BENCHMARK(BM_XmlRead10MBElements)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_XmlRead10MBComment)->Unit(benchmark::kMillisecond);
} // namespace

BENCHMARK_MAIN();
