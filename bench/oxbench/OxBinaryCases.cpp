// OxBase side of the binary cases: OxInput::read(double &) over the file of
// big-endian doubles, OxMemory::read(double &) over the same bytes in memory.
#include "OxBench.h"

#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"

#include <string>
#include <vector>

namespace oxbench {
namespace {

class OxInputDoubles : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.doubles;
        count = corpus.nbDoubles;
        return true;
    }
    Outcome run() override {
        OxInput in(path.c_str(), OxFile::FILE_MODE_BINARY);
        Outcome outcome;
        if (in.isGood() != OxTrue) {
            outcome.ok = false;
            outcome.note = "cannot open " + path;
            return outcome;
        }
        double sum = 0.0;
        long long bytes = 0;
        for (std::size_t i = 0; i < count; i++) {
            double value = 0.0;
            bytes += in.read(value);
            sum += value;
        }
        outcome.amount = static_cast<double>(bytes);
        outcome.check = sum;
        return outcome;
    }

private:
    std::string path;
    std::size_t count = 0;
};
Registration oxInput("binary-file", "OxBase OxInput::read(double&)",
                     [] { return std::make_unique<OxInputDoubles>(); });

class OxMemoryDoubles : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        std::string bytes = readWholeFile(corpus.doubles);
        // One byte more than the values: the reader never hands out the
        // last byte of its buffer.
        buffer.assign(bytes.begin(), bytes.end());
        buffer.push_back(0);
        count = corpus.nbDoubles;
        return bytes.size() == count * 8;
    }
    Outcome run() override {
        OxMemory memory(buffer.data(), static_cast<unsigned int>(buffer.size()));
        double sum = 0.0;
        long long bytes = 0;
        for (std::size_t i = 0; i < count; i++) {
            double value = 0.0;
            bytes += memory.read(value);
            sum += value;
        }
        Outcome outcome;
        outcome.amount = static_cast<double>(bytes);
        outcome.check = sum;
        return outcome;
    }

private:
    std::vector<unsigned char> buffer;
    std::size_t count = 0;
};
Registration oxMemory("binary-memory", "OxBase OxMemory::read(double&)",
                      [] { return std::make_unique<OxMemoryDoubles>(); });

} // namespace
} // namespace oxbench
