// Feeds arbitrary bytes to the XML reader as a document file, then reads the
// tree the way callers do (typed getters, dump) and writes it out again: the
// target is every path a bad file can take through the document classes.
// Run with -close_fd_mask=3 to keep the reports off the terminal.
#include "oxbase/diag/OxMsg.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxVec.h"

#include <cstdint>
#include <fstream>
#include <string>
#include <unistd.h>

namespace {
/// Reads every element of the tree, without recursion.
void readTree(OxXmlElement const* root) {
    OxGList<OxXmlElement const*> pending;
    pending.append(root);
    while (pending.length > 0) {
        OxXmlElement const* element = pending.data[--pending.length];
        if (element == nullptr) {
            continue;
        }
        OxColor color;
        OxVec3d point;
        OxGList<unsigned int> indices;
        element->getColor(color);
        element->getPoint(point);
        element->getIndices(&indices);
        element->getChildByName("part");
        for (unsigned int i = 0; i < element->getNbChildElements(); i++) {
            pending.append(element->getChild(i));
        }
    }
}
} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    static const std::string path = "/tmp/oxbase-fuzz-" + std::to_string(getpid()) + ".xml";
    static const std::string copy = "/tmp/oxbase-fuzz-" + std::to_string(getpid()) + "-copy.xml";
    {
        std::ofstream out(path, std::ios::binary | std::ios::trunc);
        out.write(reinterpret_cast<const char*>(data), static_cast<std::streamsize>(size));
    }
    OxXmlFile document(path.c_str(), OxFile::OxIOInput);
    document.readFile();
    readTree(document.getRoot());
    std::ostrstream text;
    document.dump(&text);
    text.freeze(false);
    if (document.open(copy.c_str(), OxFile::OxIOOutput) == 0) {
        document.writeFile();
    }
    return 0;
}
