// libxml2 as a peer: xmlReadFile of the model and of the comment document
// (XML_PARSE_HUGE, for the 40 MB comment). Built only when libxml2-dev is
// installed.
#include "OxBench.h"

#include <libxml/parser.h>
#include <libxml/tree.h>

#include <string>

namespace oxbench {
namespace {

double countElements(xmlNode* node) {
    double count = 0;
    for (; node != nullptr; node = node->next) {
        if (node->type == XML_ELEMENT_NODE) {
            count += 1 + countElements(node->children);
        }
    }
    return count;
}

class Libxml2Read : public Runner {
public:
    explicit Libxml2Read(bool comment) : comment(comment) {}
    ~Libxml2Read() override {
        if (doc != nullptr) {
            xmlFreeDoc(doc);
        }
    }
    bool prepare(const Corpus& corpus, std::string&) override {
        xmlInitParser();
        path = comment ? corpus.xmlComment : corpus.xmlInput();
        return true;
    }
    Outcome run() override {
        doc = xmlReadFile(path.c_str(), nullptr, XML_PARSE_HUGE | XML_PARSE_NONET);
        Outcome outcome;
        outcome.ok = doc != nullptr;
        outcome.amount = static_cast<double>(fileSize(path));
        return outcome;
    }
    void afterRun(Outcome& outcome) override {
        outcome.check = countElements(xmlDocGetRootElement(doc));
        xmlFreeDoc(doc);
        doc = nullptr;
    }

private:
    bool comment;
    std::string path;
    xmlDoc* doc = nullptr;
};
Registration libxmlRead("xml-read", "libxml2 xmlReadFile",
                        [] { return std::make_unique<Libxml2Read>(false); });
Registration libxmlComment("xml-read-comment", "libxml2 xmlReadFile",
                           [] { return std::make_unique<Libxml2Read>(true); });

} // namespace
} // namespace oxbench
