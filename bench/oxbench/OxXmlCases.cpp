// OxBase side of the XML cases: OxXmlFile::readFile of the model and of the
// comment document, and OxXmlFile::writeFile of the model as it was read.
#include "OxBench.h"
#include "OxBenchCorpus.h"
#include "OxBenchDocument.h"

#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/io/OxFile.h"

#include <memory>
#include <string>

namespace oxbench {
namespace {

// Elements with a name; comment and other raw nodes have none.
double countElements(const OxXmlElement* element) {
    if (element == nullptr || element->getName() == nullptr) {
        return 0;
    }
    double count = 1;
    unsigned int n = element->getNbChildElements();
    for (unsigned int i = 0; i < n; i++) {
        count += countElements(element->getChild(i));
    }
    return count;
}

class OxXmlRead : public Runner {
public:
    explicit OxXmlRead(bool comment) : comment(comment) {}
    bool prepare(const Corpus& corpus, std::string&) override {
        path = comment ? corpus.xmlComment : corpus.xmlModel;
        return true;
    }
    Outcome run() override { return readDocument(path, file); }
    void afterRun(Outcome& outcome) override {
        outcome.check = countElements(file->getRoot());
        file.reset();
    }

private:
    bool comment;
    std::string path;
    std::unique_ptr<OxXmlFile> file;
};
Registration oxXmlRead("xml-read", "OxBase OxXmlFile::readFile",
                       [] { return std::make_unique<OxXmlRead>(false); });
Registration oxXmlComment("xml-read-comment", "OxBase OxXmlFile::readFile",
                          [] { return std::make_unique<OxXmlRead>(true); });

class OxXmlWrite : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string& note) override {
        model = corpus.xmlModel;
        out = corpus.dir + "/write-oxbase.xml";
        file = std::make_unique<OxXmlFile>(model.c_str(), OxFile::OxIOInput);
        if (file->readFile() != OxTrue) {
            note = "readFile of the model answered OxFalse";
            return false;
        }
        if (file->open(out.c_str(), OxFile::OxIOOutput) != 0) {
            note = "cannot open " + out;
            return false;
        }
        return true;
    }
    // Each run rewinds the one output stream and writes the document again
    // (an object opens each direction once).
    Outcome run() override {
        Outcome outcome;
        outcome.ok = file->writeFile() == OxTrue;
        if (!outcome.ok) {
            outcome.note = "writeFile answered OxFalse";
        }
        outcome.amount = static_cast<double>(fileSize(out));
        return outcome;
    }
    void afterRun(Outcome& outcome) override {
        if (compared) {
            return;
        }
        compared = true;
        // The model is in the writer's layout: what comes back is the
        // writer's lines of it.
        std::string expected;
        for (const std::string& line : writerLines(model)) {
            expected += line;
            expected += "\n";
        }
        if (readWholeFile(out) != expected) {
            outcome.note = "output differs from the writer's lines of the model";
        }
    }

private:
    std::string model;
    std::string out;
    std::unique_ptr<OxXmlFile> file;
    bool compared = false;
};
Registration oxXmlWrite("xml-write", "OxBase OxXmlFile::writeFile",
                        [] { return std::make_unique<OxXmlWrite>(); });

} // namespace
} // namespace oxbench
