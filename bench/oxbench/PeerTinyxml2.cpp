// tinyxml2 as a peer: LoadFile of the model and of the comment document,
// SaveFile of the loaded model. Built only when libtinyxml2-dev is installed.
#include "OxBench.h"

#include <tinyxml2.h>

#include <memory>
#include <string>

namespace oxbench {
namespace {

double countElements(const tinyxml2::XMLElement* element) {
    double count = 0;
    for (; element != nullptr; element = element->NextSiblingElement()) {
        count += 1 + countElements(element->FirstChildElement());
    }
    return count;
}

class Tinyxml2Read : public Runner {
public:
    explicit Tinyxml2Read(bool comment) : comment(comment) {}
    bool prepare(const Corpus& corpus, std::string&) override {
        path = comment ? corpus.xmlComment : corpus.xmlInput();
        return true;
    }
    Outcome run() override {
        doc = std::make_unique<tinyxml2::XMLDocument>();
        Outcome outcome;
        outcome.ok = doc->LoadFile(path.c_str()) == tinyxml2::XML_SUCCESS;
        if (!outcome.ok) {
            outcome.note = doc->ErrorStr();
        }
        outcome.amount = static_cast<double>(fileSize(path));
        return outcome;
    }
    void afterRun(Outcome& outcome) override {
        outcome.check = countElements(doc->FirstChildElement());
        doc.reset();
    }

private:
    bool comment;
    std::string path;
    std::unique_ptr<tinyxml2::XMLDocument> doc;
};
Registration tinyRead("xml-read", "tinyxml2 LoadFile",
                      [] { return std::make_unique<Tinyxml2Read>(false); });
Registration tinyComment("xml-read-comment", "tinyxml2 LoadFile",
                         [] { return std::make_unique<Tinyxml2Read>(true); });

class Tinyxml2Write : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string& note) override {
        out = corpus.dir + "/write-tinyxml2.xml";
        if (doc.LoadFile(corpus.xmlInput().c_str()) != tinyxml2::XML_SUCCESS) {
            note = doc.ErrorStr();
            return false;
        }
        return true;
    }
    Outcome run() override {
        Outcome outcome;
        outcome.ok = doc.SaveFile(out.c_str()) == tinyxml2::XML_SUCCESS;
        outcome.amount = static_cast<double>(fileSize(out));
        return outcome;
    }

private:
    tinyxml2::XMLDocument doc;
    std::string out;
};
Registration tinyWrite("xml-write", "tinyxml2 SaveFile",
                       [] { return std::make_unique<Tinyxml2Write>(); });

} // namespace
} // namespace oxbench
