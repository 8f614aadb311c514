// oxtool xml, oxtool xml-dump: read XML documents and write them back.
//
//   oxtool xml IN.xml [OUT.xml]   read IN (syntax errors reported by message
//                                 with file, line and offset); write to OUT
//   oxtool xml-dump IN.xml        print the document's dump
//
// "-" as IN is standard input, as OUT standard output: the library reads and
// writes files by name, so the text passes through a scratch file. Messages go
// to standard error (and the log of --log); the exit status is the worst of
// them, so a document with a warning (an end tag that does not match) gives 4
// and one with a syntax error 8. The demo step logs to oxtool-xml.log in its
// scratch directory.
#include "OxToolCommand.h"
#include "OxToolFiles.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/doc/OxXmlFile.h"

#include <cstdio>
#include <memory>
#include <string>

namespace {

/// A read that failed without a message of its own (an attribute value whose
/// opening quote ends a line) is reported, so that no failed read ends well.
int readFailure(OxBool read, const std::string& operand) {
    if (read == OxTrue) {
        return 0;
    }
    if (oxtoolWorst() < OxErrorError) {
        oxtoolReport(OxErrorError, operand + ": the reader stopped before the end of the document");
    }
    return kOxToolFailed;
}

/// Where a document is read from: the operand, or a copy of standard input.
bool inputPath(const std::string& operand, OxToolTempDir& scratch, std::string& path) {
    if (operand != "-") {
        path = operand;
        return true;
    }
    path = scratch.file("stdin.xml");
    if (scratch.path().empty() || !oxtoolCopyStdinTo(path)) {
        oxtoolReport(OxErrorError, "cannot keep standard input in a scratch file");
        return false;
    }
    return true;
}

/// Reads `in` (and writes `out` when given, "-" standing for standard
/// output); 0, or kOxToolFailed when a file cannot be opened or written.
int readAndWrite(const std::string& inOperand, const char* out, bool quietReport) {
    OxToolTempDir scratch;
    std::string in;
    if (!inputPath(inOperand, scratch, in)) {
        return kOxToolFailed;
    }
    OxXmlFile file(in.c_str(), OxFile::OxIOInput);
    if (file.isGood(OxFile::OxIOInput) != OxTrue) {
        oxtoolReport(OxErrorError, "cannot open " + inOperand);
        return kOxToolFailed;
    }
    OxBool read = file.readFile();
    const OxXmlElement* root = file.getRoot();
    bool toStdout = out != nullptr && std::string(out) == "-";
    std::FILE* report = toStdout || quietReport ? stderr : stdout;
    std::fprintf(report, "%s: %s, root %s with %u child nodes\n", inOperand.c_str(),
                 read ? "read" : "read with errors",
                 root != nullptr && root->getName() != nullptr ? root->getName() : "(none)",
                 root != nullptr ? root->getNbChildElements() : 0u);
    int status = readFailure(read, inOperand);
    if (out == nullptr) {
        return status;
    }
    std::string target = toStdout ? scratch.file("stdout.xml") : out;
    if (toStdout && scratch.path().empty()) {
        oxtoolReport(OxErrorError, "no scratch directory for standard output");
        return kOxToolFailed;
    }
    if (file.open(target.c_str(), OxFile::OxIOOutput) != 0) {
        oxtoolReport(OxErrorError, std::string("cannot write ") + out);
        return kOxToolFailed;
    }
    file.setFlushEveryLine(OxFalse); // one flush at the end: the same bytes, faster
    OxBool written = file.writeFile();
    if (toStdout && !oxtoolCopyToStdout(target)) {
        oxtoolReport(OxErrorError, "cannot write standard output");
        return kOxToolFailed;
    }
    std::fprintf(report, "%s: %s\n", out, written ? "written" : "written with errors");
    return written ? status : kOxToolFailed;
}

int runXml(const OxToolContext& context) {
    return readAndWrite(context.operands[0],
                        context.operands.size() > 1 ? context.operands[1].c_str() : nullptr, false);
}

int runXmlDump(const OxToolContext& context) {
    OxToolTempDir scratch;
    std::string in;
    if (!inputPath(context.operands[0], scratch, in)) {
        return kOxToolFailed;
    }
    OxXmlFile file(in.c_str(), OxFile::OxIOInput);
    if (file.isGood(OxFile::OxIOInput) != OxTrue) {
        oxtoolReport(OxErrorError, "cannot open " + context.operands[0]);
        return kOxToolFailed;
    }
    OxBool read = file.readFile();
    OxPrt prt;
    file.dumpXML(prt.getStr());
    char* text = prt.flushToString();
    if (text != nullptr) {
        std::fputs(text, stdout);
    }
    delete[] text;
    return readFailure(read, context.operands[0]);
}

// Demo: the sample assembly read, a few typed values taken out of it, and
// the document written back into the scratch directory.
int demoXml(const OxToolDemoContext& context) {
    std::string logName = oxtoolLibraryPath(oxtoolJoin(context.outDir, "oxtool-xml.log"));
    OxMsg msg(oxtoolLibraryPath(context.messageFile).c_str(), nullptr, logName.c_str(), nullptr);
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
    return readAndWrite(in, out.c_str(), false) == 0 ? 0 : 1;
}

OxToolRegistration xmlRegistration{
    {"xml",
     "IN.xml [OUT.xml]",
     "read an XML document, report errors, write it back",
     "Reads IN.xml with the library's reader; syntax errors are logged with file, line\n"
     "and offset. With OUT.xml the document is written there as the library's writer\n"
     "writes it (see 'oxtool check' for what that does not give back). IN \"-\" is\n"
     "standard input; OUT \"-\" is standard output, and the report line then goes to\n"
     "standard error.\n",
     {},
     1,
     2,
     runXml,
     demoXml,
     50}};
OxToolRegistration xmlDumpRegistration{
    {"xml-dump",
     "IN.xml",
     "print the dump of an XML document",
     "Reads IN.xml (\"-\": standard input) and prints the dump of the document: the\n"
     "declaration, the nodes before and behind the root, and the element tree.\n",
     {},
     1,
     1,
     runXmlDump}};
} // namespace
