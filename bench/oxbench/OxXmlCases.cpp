// OxBase side of the XML cases: OxXmlFile::readFile of the models and of the
// comment document, the destruction of a read document, and
// OxXmlFile::writeFile of a model as it was read, flushed at every line (the
// default) and unflushed (setFlushEveryLine(OxFalse)).
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
        path = comment ? corpus.xmlComment : corpus.xmlInput();
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

// The end of a read document: the read is untimed, the destructor timed.
class OxXmlDestroy : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string&) override {
        path = corpus.xmlInput();
        return true;
    }
    bool beforeRun(std::string& note) override {
        Outcome read = readDocument(path, file);
        note = read.note;
        elements = countElements(file->getRoot());
        return read.ok;
    }
    Outcome run() override {
        file.reset();
        Outcome outcome;
        outcome.amount = static_cast<double>(fileSize(path));
        outcome.check = elements;
        return outcome;
    }

private:
    std::string path;
    std::unique_ptr<OxXmlFile> file;
    double elements = 0;
};
Registration oxXmlDestroy("xml-destroy", "OxBase ~OxXmlFile",
                          [] { return std::make_unique<OxXmlDestroy>(); });

class OxXmlWrite : public Runner {
public:
    explicit OxXmlWrite(bool flushEveryLine) : flushEveryLine(flushEveryLine) {}
    bool prepare(const Corpus& corpus, std::string& note) override {
        model = corpus.xmlInput();
        out = corpus.dir + (flushEveryLine ? "/write-oxbase.xml" : "/write-oxbase-unflushed.xml");
        file = std::make_unique<OxXmlFile>(model.c_str(), OxFile::OxIOInput);
        if (file->readFile() != OxTrue) {
            note = "readFile of the model answered OxFalse";
            return false;
        }
        if (file->open(out.c_str(), OxFile::OxIOOutput) != 0) {
            note = "cannot open " + out;
            return false;
        }
        file->setFlushEveryLine(flushEveryLine ? OxTrue : OxFalse);
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
    bool flushEveryLine;
    std::string model;
    std::string out;
    std::unique_ptr<OxXmlFile> file;
    bool compared = false;
};
Registration oxXmlWrite("xml-write", "OxBase OxXmlFile::writeFile",
                        [] { return std::make_unique<OxXmlWrite>(true); });
Registration oxXmlWriteUnflushed("xml-write", "OxBase OxXmlFile::writeFile, unflushed",
                                 [] { return std::make_unique<OxXmlWrite>(false); });

} // namespace
} // namespace oxbench
