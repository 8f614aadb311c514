// OxBase side of the CSV case: OxCsvFile::readFile of the table into the
// element tree (one record element per data line).
#include "OxBench.h"
#include "OxBenchDocument.h"

#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/io/OxFile.h"

#include <memory>
#include <string>

namespace oxbench {
namespace {

class OxCsvRead : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.csvInput();
        return true;
    }
    Outcome run() override { return readDocument(path, file); }
    void afterRun(Outcome& outcome) override {
        const OxXmlElement* root = file->getRoot();
        outcome.check = root != nullptr ? root->getNbChildElements() : 0;
        file.reset();
    }

private:
    std::string path;
    std::unique_ptr<OxCsvFile> file;
};
Registration oxCsvRead("csv-read", "OxBase OxCsvFile::readFile",
                       [] { return std::make_unique<OxCsvRead>(); });

} // namespace
} // namespace oxbench
