// CSV tables: reads the input as a table three times, with the separators
// ",", ";" and the input's first byte, and checks the round trip of each.
//
// The property. The format is lossy by definition: the reader trims lines
// and fields and skips blank and "#" lines, and the writer does not consult
// column names: a record with an empty field goes out with its later fields
// moved left, and separators are added at the end of the line. So the first
// tree is not compared. With T1 = read(x), W1 = write(T1), T2 = read(W1),
// W2 = write(T2), T3 = read(W2), W3 = write(T3):
//   - every write answers OxTrue;
//   - T2 and T3 have the same column names and the same records, each with
//     the same attributes (name and value) in the same order;
//   - W2 and W3 are the same bytes.
// Values read from a table cannot hold the separator, so the field count of
// a value (the list form that convertToCsv makes) plays no part here.
//
// Not checked, because the described behaviour breaks even that property:
//   - a separator that is white space or NUL: the reader trims each line
//     before it splits it, so an empty first or last field is lost, and a NUL
//     ends the line's text;
//   - column names whose written header, trimmed, ends in the separator or
//     differs from its untrimmed text (a last name that is empty or white
//     space, left by a header line that ends in separators while no later
//     line completes it): the reader takes that line for a header that goes
//     on, and every round loses a column;
//   - a record with a field of white space alone followed by a field with
//     text: the field is stored as an empty value, written as an empty field,
//     read back as a hole, and the next write closes the hole by moving the
//     later fields left: the described loss, one round later.
// parseCSVString is checked against a split made here on every line.
#include "OxFuzzSupport.h"

#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"

#include <cctype>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace {

std::string textOf(char const* text) {
    return text != nullptr ? std::string("\"") + text + "\"" : std::string("null");
}

bool sameText(char const* a, char const* b) {
    return (a == nullptr && b == nullptr) ||
           (a != nullptr && b != nullptr && std::strcmp(a, b) == 0);
}

std::string trimmed(const std::string& text) {
    size_t begin = 0;
    size_t end = text.size();
    while (begin < end && std::isspace(static_cast<unsigned char>(text[begin])) != 0) {
        begin++;
    }
    while (end > begin && std::isspace(static_cast<unsigned char>(text[end - 1])) != 0) {
        end--;
    }
    return text.substr(begin, end - begin);
}

/// The fields of the trimmed `line` split at `separator`, each that is not
/// empty, trimmed (a field of white space alone gives an empty text).
std::vector<std::string> fieldsOf(const std::string& line, char separator) {
    std::vector<std::string> fields;
    std::string text = trimmed(line);
    size_t start = 0;
    for (;;) {
        size_t end = text.find(separator, start);
        std::string field = text.substr(start, end - start);
        if (!field.empty()) {
            fields.push_back(trimmed(field));
        }
        if (end == std::string::npos) {
            return fields;
        }
        start = end + 1;
    }
}

void checkParseCSVString(const std::string& input, char separator) {
    size_t start = 0;
    while (start <= input.size()) {
        size_t end = input.find('\n', start);
        std::string line = input.substr(start, end - start);
        line = line.substr(0, line.find('\0'));
        OxGList<char*> fields;
        OXFUZZ_CHECK(OxCsvFile::parseCSVString(line.c_str(), separator, fields) == OxTrue,
                     "parseCSVString refused a text");
        std::vector<std::string> expected = fieldsOf(line, separator);
        OXFUZZ_CHECK(fields.getLength() == expected.size(),
                     "parseCSVString gave %u fields of \"%s\", expected %zu", fields.getLength(),
                     oxfuzz::shown(line).c_str(), expected.size());
        for (unsigned int i = 0; i < fields.getLength(); i++) {
            OXFUZZ_CHECK(fields[i] != nullptr && expected[i] == fields[i],
                         "parseCSVString field %u: %s, expected \"%s\"", i,
                         oxfuzz::shown(textOf(fields[i])).c_str(),
                         oxfuzz::shown(expected[i]).c_str());
            delete[] fields[i];
        }
        if (end == std::string::npos) {
            break;
        }
        start = end + 1;
    }
}

/// Whether the header line the writer makes reads back otherwise.
bool hasOpenHeader(OxCsvFile const& table) {
    OxGList<char*> const& columns = table.getColumnNames();
    std::string header;
    for (unsigned int i = 0; i < columns.getLength(); i++) {
        header += std::string(i > 0 ? 1 : 0, table.getSeparator()) +
                  (columns[i] != nullptr ? columns[i] : "");
    }
    std::string read = trimmed(header);
    return read != header || (!read.empty() && read.back() == table.getSeparator());
}

/// Whether a record holds a value of white space alone (stored empty) with a
/// value that has text behind it.
bool hasInnerBlankField(OxXmlElement const* root) {
    for (unsigned int r = 0; root != nullptr && r < root->getNbChildElements(); r++) {
        OxXmlElement const* record = root->getChild(r);
        bool blank = false;
        for (unsigned int a = 0; record != nullptr && a < record->getNbAttributes(); a++) {
            char const* value = record->getAttribute(a)->getValue();
            if (value != nullptr && *value == '\0') {
                blank = true;
            } else if (blank && value != nullptr) {
                return true;
            }
        }
    }
    return false;
}

void checkSameTable(OxCsvFile const& a, OxCsvFile const& b) {
    OxGList<char*> const& columnsA = a.getColumnNames();
    OxGList<char*> const& columnsB = b.getColumnNames();
    OXFUZZ_CHECK(columnsA.getLength() == columnsB.getLength(), "%u columns became %u",
                 columnsA.getLength(), columnsB.getLength());
    for (unsigned int i = 0; i < columnsA.getLength(); i++) {
        OXFUZZ_CHECK(sameText(columnsA[i], columnsB[i]), "column %u: %s became %s", i,
                     oxfuzz::shown(textOf(columnsA[i])).c_str(),
                     oxfuzz::shown(textOf(columnsB[i])).c_str());
    }
    OxXmlElement const* rootA = a.getRoot();
    OxXmlElement const* rootB = b.getRoot();
    OXFUZZ_CHECK(rootA != nullptr && rootB != nullptr, "a table read has no root");
    OXFUZZ_CHECK(rootA->getNbChildElements() == rootB->getNbChildElements(), "%u records became %u",
                 rootA->getNbChildElements(), rootB->getNbChildElements());
    for (unsigned int r = 0; r < rootA->getNbChildElements(); r++) {
        OxXmlElement const* x = rootA->getChild(r);
        OxXmlElement const* y = rootB->getChild(r);
        OXFUZZ_CHECK(x->getNbAttributes() == y->getNbAttributes(),
                     "record %u: %u attributes became %u", r, x->getNbAttributes(),
                     y->getNbAttributes());
        for (unsigned int i = 0; i < x->getNbAttributes(); i++) {
            OxXmlAttribute const* p = x->getAttribute(i);
            OxXmlAttribute const* q = y->getAttribute(i);
            OXFUZZ_CHECK(
                sameText(p->getName(), q->getName()) && sameText(p->getValue(), q->getValue()),
                "record %u: %s=%s became %s=%s", r, oxfuzz::shown(textOf(p->getName())).c_str(),
                oxfuzz::shown(textOf(p->getValue())).c_str(),
                oxfuzz::shown(textOf(q->getName())).c_str(),
                oxfuzz::shown(textOf(q->getValue())).c_str());
        }
    }
}

/// Reads `path` into `table` (made by the caller) and writes it to `target`.
void readAndWrite(OxCsvFile& table, const std::string& target) {
    OXFUZZ_CHECK(table.readFile() == OxTrue, "readFile answered OxFalse");
    OXFUZZ_CHECK(table.open(target.c_str(), OxFile::OxIOOutput) == 0, "cannot open %s",
                 target.c_str());
    OXFUZZ_CHECK(table.writeFile() == OxTrue, "writeFile answered OxFalse");
}

void roundTrip(const std::string& input, char separator) {
    static const std::string written[] = {oxfuzz::scratchFile("write1.csv"),
                                          oxfuzz::scratchFile("write2.csv"),
                                          oxfuzz::scratchFile("write3.csv")};
    OxCsvFile first(input.c_str(), OxFile::OxIOInput, separator);
    readAndWrite(first, written[0]);
    std::ostrstream dumped;
    first.dump(&dumped);
    dumped.freeze(false);
    unsigned int at = 0;
    first.find("id", nullptr, at);
    if (std::isspace(static_cast<unsigned char>(separator)) != 0 || separator == '\0' ||
        hasOpenHeader(first) || hasInnerBlankField(first.getRoot())) {
        return;
    }
    OxCsvFile second(written[0].c_str(), OxFile::OxIOInput, separator);
    readAndWrite(second, written[1]);
    OxCsvFile third(written[1].c_str(), OxFile::OxIOInput, separator);
    readAndWrite(third, written[2]);
    checkSameTable(second, third);
    std::string write2 = oxfuzz::readFile(written[1]);
    std::string write3 = oxfuzz::readFile(written[2]);
    OXFUZZ_CHECK(write2 == write3,
                 "separator 0x%02x: the second and third writes differ:\n%s\n----\n%s",
                 static_cast<unsigned char>(separator), oxfuzz::shown(write2, 2000).c_str(),
                 oxfuzz::shown(write3, 2000).c_str());

    // The values prepared for writing, both ways, on the tree of the first read.
    OxXmlElement* root = first.getRootForUpdate();
    for (unsigned int r = 0; r < root->getNbChildElements(); r++) {
        OxXmlElement* record = root->getChild(r);
        for (unsigned int a = 0; a < record->getNbAttributes(); a++) {
            first.convertToCsv(record->getAttribute(a), (r + a) % 2 == 0 ? OxTrue : OxFalse);
        }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, size_t size) {
    oxfuzz::startMessages();
    static const std::string input = oxfuzz::scratchFile("input.csv");
    oxfuzz::writeFile(input, data, size);
    std::string text(reinterpret_cast<const char*>(data), size);
    for (char separator : {',', ';', size > 0 ? static_cast<char>(data[0]) : '|'}) {
        roundTrip(input, separator);
        checkParseCSVString(text, separator);
    }
    return 0;
}
