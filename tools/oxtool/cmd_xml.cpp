// oxtool xml, oxtool xml-dump: read XML documents and write them back.
//
//   oxtool xml IN.xml [OUT.xml]   read IN (syntax errors reported by message
//                                 with file, line and offset); write to OUT
//   oxtool xml-dump IN.xml        print the document's dump
//
// Messages go through the default message file (oxbase.msg, in the working
// directory or the bundled data directory) to standard error; the demo step
// logs to oxtool-xml.log in its scratch directory.
#include "OxToolCommand.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlFile.h"

#include <cstdio>
#include <memory>
#include <string>

namespace {
/// Starts the message subsystem on the default message file. Without a log
/// directory there is no log file and every message reaches standard error;
/// with one, the log is oxtool-xml.log there and only warnings and worse do.
std::unique_ptr<OxMsg> startMessages(const std::string& dataDir, const std::string& logDir) {
    return std::make_unique<OxMsg>("oxbase.msg", dataDir.c_str(),
                                   logDir.empty() ? nullptr : "oxtool-xml.log",
                                   logDir.empty() ? nullptr : logDir.c_str());
}

/// Reads `in` (and writes `out` when given); 0 on success, 1 on failure.
int readAndWrite(const char* in, const char* out) {
    OxXmlFile file(in, OxFile::OxIOInput);
    if (file.isGood(OxFile::OxIOInput) != OxTrue) {
        std::fprintf(stderr, "oxtool xml: cannot open %s\n", in);
        return 1;
    }
    OxBool read = file.readFile();
    const OxXmlElement* root = file.getRoot();
    std::printf("%s: %s, root %s with %u child nodes\n", in, read ? "read" : "read with errors",
                root != nullptr && root->getName() != nullptr ? root->getName() : "(none)",
                root != nullptr ? root->getNbChildElements() : 0u);
    if (out == nullptr) {
        return read ? 0 : 1;
    }
    if (file.open(out, OxFile::OxIOOutput) != 0) {
        std::fprintf(stderr, "oxtool xml: cannot write %s\n", out);
        return 1;
    }
    file.setFlushEveryLine(OxFalse); // one flush at the end: the same bytes, faster
    OxBool written = file.writeFile();
    std::printf("%s: %s\n", out, written ? "written" : "written with errors");
    return read && written ? 0 : 1;
}

int runXml(int argc, char** argv) {
    if (argc < 2 || argc > 3) {
        std::fprintf(stderr, "usage: oxtool xml IN.xml [OUT.xml]\n");
        return 2;
    }
    auto msg = startMessages(OXTOOL_DEFAULT_DATA_DIR, "");
    return readAndWrite(argv[1], argc > 2 ? argv[2] : nullptr);
}

int runXmlDump(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: oxtool xml-dump IN.xml\n");
        return 2;
    }
    auto msg = startMessages(OXTOOL_DEFAULT_DATA_DIR, "");
    OxXmlFile file(argv[1], OxFile::OxIOInput);
    if (file.isGood(OxFile::OxIOInput) != OxTrue) {
        std::fprintf(stderr, "oxtool xml-dump: cannot open %s\n", argv[1]);
        return 1;
    }
    OxBool read = file.readFile();
    OxPrt prt;
    file.dumpXML(prt.getStr());
    char* text = prt.flushToString();
    if (text != nullptr) {
        std::fputs(text, stdout);
    }
    delete[] text;
    return read ? 0 : 1;
}

// Demo: the sample assembly read, a few typed values taken out of it, and
// the document written back into the scratch directory.
int demoXml(const OxToolDemoContext& context) {
    auto msg = startMessages(context.dataDir, context.outDir);
    std::string in = oxtoolJoin(context.dataDir, "assembly.xml");
    std::string out = oxtoolJoin(context.outDir, "assembly.xml");
    OxXmlFile file(in.c_str(), OxFile::OxIOInput);
    if (file.readFile() != OxTrue || file.getRoot() == nullptr) {
        std::fprintf(stderr, "oxtool demo: cannot read %s\n", in.c_str());
        return 1;
    }
    const OxXmlElement* root = file.getRoot();
    OxGList<OxXmlElement const*> parts = root->getChildrenByName("part");
    std::printf("%s: assembly \"%s\" with %u parts\n", in.c_str(),
                root->getAttributeValue(OxXmlFile::OX_XML_FIELD_NAME), parts.getLength());
    for (unsigned int i = 0; i < parts.getLength(); i++) {
        const OxXmlElement* mesh = parts[i]->getChildByName("mesh");
        OxGList<unsigned int> indices;
        if (mesh != nullptr) {
            mesh->getIndices(&indices);
        }
        std::printf("  part %s: colour %s, %u indices\n",
                    parts[i]->getAttributeValue(OxXmlFile::OX_XML_FIELD_NAME),
                    parts[i]->getAttributeValue(OxXmlFile::OX_XML_FIELD_COLOR),
                    indices.getLength());
    }
    return readAndWrite(in.c_str(), out.c_str());
}

OxToolRegistration xmlRegistration{{"xml", "IN.xml [OUT.xml]",
                                    "read an XML document, report errors, write it back", runXml,
                                    demoXml, 50}};
OxToolRegistration xmlDumpRegistration{
    {"xml-dump", "IN.xml", "print the dump of an XML document", runXmlDump}};
} // namespace
