// oxtool csv: reads a separated-values file into the element tree, shows its
// columns and records, finds records and writes the table back.
//
//   oxtool csv parts.csv --find material=steel copy.csv
//
// Prints the column names and the record count, then, with --find, one line
// per matching record ("record N: name=value ..."). ATTR alone finds every
// record that has the attribute; ATTR=VALUE also needs that exact value. With
// OUT.csv the header and records are written there (the records padded to the
// table width). Exit status: 0 done, 1 the file could not be read or written,
// 2 a misused command.
#include "OxToolCommand.h"

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

#ifndef OXTOOL_DEFAULT_DATA_DIR
#define OXTOOL_DEFAULT_DATA_DIR "data"
#endif

namespace {

int usage() {
    std::fprintf(stderr, "usage: oxtool csv IN.csv [--sep C] [--find ATTR[=VALUE]] [OUT.csv]\n");
    return 2;
}

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

int runCsv(int argc, char** argv) {
    const char* in = nullptr;
    const char* out = nullptr;
    const char* query = nullptr;
    char separator = ',';
    for (int i = 1; i < argc; i++) {
        if (std::strcmp(argv[i], "--sep") == 0 && i + 1 < argc) {
            if (std::strlen(argv[i + 1]) != 1) {
                return usage();
            }
            separator = argv[++i][0];
        } else if (std::strcmp(argv[i], "--find") == 0 && i + 1 < argc) {
            query = argv[++i];
        } else if (argv[i][0] == '-' && argv[i][1] == '-') {
            return usage();
        } else if (in == nullptr) {
            in = argv[i];
        } else if (out == nullptr) {
            out = argv[i];
        } else {
            return usage();
        }
    }
    if (in == nullptr || (query != nullptr && (*query == '\0' || *query == '='))) {
        return usage();
    }
    OxMsg msg("oxbase.msg", OXTOOL_DEFAULT_DATA_DIR, nullptr, nullptr);
    OxCsvFile csv(in, OxFile::OxIOInput, separator);
    if (csv.readFile() != OxTrue) {
        std::fprintf(stderr, "oxtool csv: cannot read %s\n", in);
        return 1;
    }
    printColumns(csv);
    if (query != nullptr) {
        findAll(csv, query);
    }
    if (out != nullptr) {
        if (csv.open(out, OxFile::OxIOOutput) != 0 || csv.writeFile() != OxTrue) {
            std::fprintf(stderr, "oxtool csv: cannot write %s\n", out);
            return 1;
        }
    }
    return 0;
}

// Demo: reads the parts table (a comment line, empty fields), finds the steel
// parts and those with a supplier at all, quotes the descriptions, writes the
// table into the demo directory and shows the written text.
int demoCsv(const OxToolDemoContext& context) {
    std::string logPath = oxtoolJoin(context.outDir, "csv-demo.log");
    OxMsg msg("oxbase.msg", context.dataDir.c_str(), logPath.c_str(), nullptr);
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

OxToolRegistration registration{{"csv", "IN.csv [--sep C] [--find ATTR[=VALUE]] [OUT.csv]",
                                 "read a CSV table, find records, write it back", runCsv, demoCsv,
                                 60}};
} // namespace
