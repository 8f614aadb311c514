// oxtool csv: reads a separated-values file into the element tree, shows its
// columns and records, finds records and writes the table back.
//
//   oxtool csv parts.csv --find material=steel copy.csv
//
// Prints the column names and the record count, then, with --find, one line
// per matching record ("record N: name=value ..."). ATTR alone finds every
// record that has the attribute; ATTR=VALUE also needs that exact value. With
// OUT.csv the header and records are written there (the records padded to the
// table width). "-" is standard input or output. A file that cannot be read or
// written gives 8, a misused command 2.
#include "OxToolCommand.h"
#include "OxToolFiles.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <iostream>
#include <sstream>
#include <string>

namespace {

void printColumns(const OxCsvFile& csv) {
    const OxGList<char*>& names = csv.getColumnNames();
    std::cout << "columns (" << names.getLength() << "):";
    for (unsigned int i = 0; i < names.getLength(); i++) {
        std::cout << " " << (names[i] != nullptr ? names[i] : "<null>");
    }
    const OxXmlElement* root = csv.getRoot();
    std::cout << "\nrecords: " << (root != nullptr ? root->getNbChildElements() : 0) << "\n";
}

void printRecord(const OxXmlElement& record, unsigned int index) {
    std::cout << "record " << index << ":";
    for (unsigned int i = 0; i < record.getNbAttributes(); i++) {
        const OxXmlAttribute* attribute = record.getAttribute(i);
        if (attribute != nullptr && attribute->getName() != nullptr) {
            std::cout << " " << attribute->getName() << "="
                      << (attribute->getValue() != nullptr ? attribute->getValue() : "");
        }
    }
    std::cout << "\n";
}

/// Prints every record that `find` gives for "ATTR" or "ATTR=VALUE"; returns
/// the number of hits.
unsigned int findAll(const OxCsvFile& csv, const std::string& query) {
    std::string::size_type equals = query.find('=');
    std::string name = query.substr(0, equals);
    std::string value = equals == std::string::npos ? std::string() : query.substr(equals + 1);
    const char* wanted = equals == std::string::npos ? nullptr : value.c_str();
    unsigned int hits = 0;
    unsigned int index = 0;
    for (const OxXmlElement* record = csv.find(name.c_str(), wanted, index); record != nullptr;
         record = csv.find(name.c_str(), wanted, index)) {
        printRecord(*record, index);
        hits++;
        index++;
    }
    std::cout << "found " << hits << " record(s) for " << query << "\n";
    return hits;
}

int runCsv(const OxToolContext& context) {
    std::string separatorText = context.value("sep", ",");
    if (separatorText.size() != 1) {
        std::fprintf(stderr, "oxtool csv: --sep takes one character, not '%s'\n",
                     separatorText.c_str());
        return kOxToolUsage;
    }
    char separator = separatorText[0];
    std::string query = context.value("find");
    if (context.has("find") && (query.empty() || query[0] == '=')) {
        std::fprintf(stderr, "oxtool csv: --find needs ATTR or ATTR=VALUE\n");
        return kOxToolUsage;
    }
    const std::string& inOperand = context.operands[0];
    std::string out = context.operands.size() > 1 ? context.operands[1] : "";
    OxToolTempDir scratch;
    std::string in = inOperand;
    if (inOperand == "-") {
        in = scratch.file("stdin.csv");
        if (scratch.path().empty() || !oxtoolCopyStdinTo(in)) {
            oxtoolReport(OxErrorError, "cannot keep standard input in a scratch file");
            return kOxToolFailed;
        }
    }
    OxCsvFile csv(in.c_str(), OxFile::OxIOInput, separator);
    if (csv.readFile() != OxTrue) {
        oxtoolReport(OxErrorError, "cannot read " + inOperand);
        return kOxToolFailed;
    }
    // With the table on standard output, the report goes to standard error.
    std::streambuf* saved = nullptr;
    if (out == "-") {
        saved = std::cout.rdbuf(std::cerr.rdbuf());
    }
    printColumns(csv);
    if (context.has("find")) {
        findAll(csv, query);
    }
    std::cout << std::flush;
    if (saved != nullptr) {
        std::cout.rdbuf(saved);
    }
    if (!out.empty()) {
        std::string target = out == "-" ? scratch.file("stdout.csv") : out;
        if (csv.open(target.c_str(), OxFile::OxIOOutput) != 0 || csv.writeFile() != OxTrue ||
            (out == "-" && !oxtoolCopyToStdout(target))) {
            oxtoolReport(OxErrorError, "cannot write " + out);
            return kOxToolFailed;
        }
    }
    return 0;
}

// Demo: reads the parts table (a comment line, empty fields), finds the steel
// parts and those with a supplier at all, quotes the descriptions, writes the
// table into the demo directory and shows the written text.
int demoCsv(const OxToolDemoContext& context) {
    std::string logPath = oxtoolLibraryPath(oxtoolJoin(context.outDir, "csv-demo.log"));
    OxMsg msg(oxtoolLibraryPath(context.messageFile).c_str(), nullptr, logPath.c_str(), nullptr);
    std::string in = oxtoolJoin(context.dataDir, "parts.csv");
    std::string out = oxtoolJoin(context.outDir, "parts-out.csv");
    OxCsvFile csv(in.c_str(), OxFile::OxIOInput);
    if (csv.readFile() != OxTrue) {
        std::cerr << "csv demo: cannot read " << in << "\n";
        return 1;
    }
    std::cout << "read parts.csv\n";
    printColumns(csv);
    findAll(csv, "material=steel");
    findAll(csv, "supplier");
    OxXmlElement* root = csv.getRootForUpdate();
    for (unsigned int r = 0; r < root->getNbChildElements(); r++) {
        OxXmlElement* record = root->getChild(r);
        for (unsigned int a = 0; record != nullptr && a < record->getNbAttributes(); a++) {
            csv.convertToCsv(record->getAttribute(a), OxTrue);
        }
    }
    if (csv.open(out.c_str(), OxFile::OxIOOutput) != 0 || csv.writeFile() != OxTrue) {
        std::cerr << "csv demo: cannot write " << out << "\n";
        return 1;
    }
    std::ifstream written(out);
    std::ostringstream text;
    text << written.rdbuf();
    std::cout << "written parts-out.csv (empty fields move left, padding at the end):\n"
              << text.str() << std::flush;
    return 0;
}

OxToolRegistration registration{
    {"csv",
     "IN.csv [OUT.csv]",
     "read a CSV table, find records, write it back",
     "Reads IN.csv and prints its column names and record count. With --find, prints\n"
     "each record that has the attribute ATTR (and, with =VALUE, exactly that value).\n"
     "With OUT.csv the table is written there as the library writes it: the header,\n"
     "then each record's values in order, padded with separators to the table width\n"
     "(a record with an empty field has its later fields moved left: 'oxtool check'\n"
     "warns of it). IN \"-\" is standard input, OUT \"-\" standard output (the report\n"
     "then goes to standard error).\n",
     {{"sep", "C", "the field separator, one character (default ',')"},
      {"find", "ATTR[=VALUE]", "print the records that have ATTR (equal to VALUE)"}},
     1,
     2,
     runCsv,
     demoCsv,
     60}};
} // namespace
