// pugixml as a peer: load_file (comments kept, as the OxBase reader keeps
// them) of the model and of the comment document, save_file of the loaded
// model with one blank of indentation. Built only when libpugixml-dev is
// installed.
#include "OxBench.h"

#include <pugixml.hpp>

#include <memory>
#include <string>

namespace oxbench {
namespace {

constexpr unsigned int kParse = pugi::parse_default | pugi::parse_comments;

double countElements(pugi::xml_node node) {
    double count = 0;
    for (pugi::xml_node child = node.first_child(); child; child = child.next_sibling()) {
        if (child.type() == pugi::node_element) {
            count += 1 + countElements(child);
        }
    }
    return count;
}

class PugiRead : public Runner {
public:
    explicit PugiRead(bool comment) : comment(comment) {}
    bool prepare(const Corpus& corpus, std::string&) override {
        path = comment ? corpus.xmlComment : corpus.xmlInput();
        return true;
    }
    Outcome run() override {
        doc = std::make_unique<pugi::xml_document>();
        pugi::xml_parse_result result = doc->load_file(path.c_str(), kParse);
        Outcome outcome;
        outcome.ok = static_cast<bool>(result);
        if (!outcome.ok) {
            outcome.note = result.description();
        }
        outcome.amount = static_cast<double>(fileSize(path));
        return outcome;
    }
    void afterRun(Outcome& outcome) override {
        outcome.check = countElements(*doc);
        doc.reset();
    }

private:
    bool comment;
    std::string path;
    std::unique_ptr<pugi::xml_document> doc;
};
Registration pugiRead("xml-read", "pugixml load_file",
                      [] { return std::make_unique<PugiRead>(false); });
Registration pugiComment("xml-read-comment", "pugixml load_file",
                         [] { return std::make_unique<PugiRead>(true); });

class PugiWrite : public Runner {
public:
    bool prepare(const Corpus& corpus, std::string& note) override {
        out = corpus.dir + "/write-pugixml.xml";
        pugi::xml_parse_result result = doc.load_file(corpus.xmlInput().c_str(), kParse);
        note = result.description();
        return static_cast<bool>(result);
    }
    Outcome run() override {
        Outcome outcome;
        outcome.ok = doc.save_file(out.c_str(), " ");
        outcome.amount = static_cast<double>(fileSize(out));
        return outcome;
    }

private:
    pugi::xml_document doc;
    std::string out;
};
Registration pugiWrite("xml-write", "pugixml save_file",
                       [] { return std::make_unique<PugiWrite>(); });

} // namespace
} // namespace oxbench
