#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace {

/// A scratch directory with a running message subsystem that records what is
/// logged; the texts spell the numbers ("m578 path").
class CsvTest : public testing::Test {
protected:
    oxtest::MessageLog log{"1,I,0m1 %s\n2,I,0m2 %s\n3,I,0m3 %s\n18,I,0m18\n19,I,0m19\n20,I,0m20\n"
                           "578,I,0m578 %s\n"};
    const oxtest::TempDir& dir = log.dir;

    /// Reads `text` as a file into `csv` (opened on it); returns readFile's result.
    OxBool read(std::unique_ptr<OxCsvFile>& csv, const std::string& text, char sep = ',') {
        oxtest::writeFile(dir.file("in.csv"), text);
        csv = std::make_unique<OxCsvFile>(dir.file("in.csv").c_str(), OxFile::OxIOInput, sep);
        return csv->readFile();
    }
};

/// "name=value" of every attribute of record `index`, joined by "|".
std::string record(const OxCsvFile& csv, unsigned int index) {
    const OxXmlElement* r = csv.getRoot()->getChild(index);
    std::string text;
    for (unsigned int i = 0; r != nullptr && i < r->getNbAttributes(); i++) {
        const OxXmlAttribute* a = r->getAttribute(i);
        text += (i ? "|" : "") + std::string(a->getName() ? a->getName() : "<null>") + "=" +
                (a->getValue() ? a->getValue() : "<null>");
    }
    return text;
}

TEST_F(CsvTest, ReadKeepsPositionsAndSkipsCommentsAndBlankLines) {
    std::unique_ptr<OxCsvFile> csv;
    ASSERT_EQ(read(csv, "# note\n\n  # indented note\na,b,\n c\n1,,3\n\"x,y\",2\n,,\n9,8,7,6"),
              OxTrue);
    ASSERT_EQ(csv->getColumnNames().getLength(), 3u); // the open header took " c" on line 2
    ASSERT_EQ(csv->getRoot()->getNbChildElements(), 4u);
    EXPECT_STREQ(csv->getRoot()->getName(), "root");
    EXPECT_STREQ(csv->getRoot()->getChild(0)->getName(), "record");
    EXPECT_EQ(csv->getRoot()->getChild(0)->getParent(), csv->getRoot());
    EXPECT_EQ(record(*csv, 0), "a=1|c=3");
    EXPECT_EQ(record(*csv, 1), "a=\"x|b=y\"|c=2");
    EXPECT_EQ(record(*csv, 2), ""); // a record even without any field
    // A field behind the last column, on a last line without a line end.
    EXPECT_EQ(record(*csv, 3), "a=9|b=8|c=7|column3=6");
    EXPECT_EQ(csv->readFile(), OxFalse); // the input is at its end

    // Preset columns: the first line is data; ";" makes "," plain data.
    oxtest::writeFile(dir.file("semi.csv"), "p,q;r\n");
    OxCsvFile semi(dir.file("semi.csv").c_str(), OxFile::OxIOInput, ';');
    OxGList<char*> names;
    names.append(const_cast<char*>("u"));
    names.append(nullptr);
    names.append(const_cast<char*>("v"));
    semi.setColumnNames(names);
    ASSERT_EQ(semi.readFile(), OxTrue);
    EXPECT_EQ(record(semi, 0), "u=p,q|v=r");
}

TEST_F(CsvTest, WriteBackPadsMissingFieldsAtTheEnd) {
    std::unique_ptr<OxCsvFile> csv;
    ASSERT_EQ(read(csv, "a,b,c\n1,,3\n"), OxTrue);
    std::string out = dir.file("out.csv");
    ASSERT_EQ(csv->open(out.c_str(), OxFile::OxIOOutput), 0);
    log.take();
    ASSERT_EQ(csv->writeFile(), OxTrue);
    EXPECT_EQ(oxtest::readText(out), "a,b,c\n1,3,\n");
    EXPECT_EQ(log.take(), std::vector<std::string>{"m578 " + out});

    // No columns: the first record's field count is the width; a quoted value
    // is one field, a value with separators is several.
    OxCsvFile plain(dir.file("plain.csv").c_str(), OxFile::OxIOOutput);
    OxXmlElement* root = new OxXmlElement("root");
    const char* rows[3][3] = {{"1", "2", "3"}, {"4", nullptr, nullptr}, {"\"a,b\"", "x", nullptr}};
    for (auto& row : rows) {
        OxXmlElement* r = new OxXmlElement("record");
        for (const char* value : row) {
            if (value != nullptr) {
                r->addAttribute(new OxXmlAttribute("f", value));
            }
        }
        root->addChild(r);
    }
    root->addChild(nullptr);
    OxXmlElement* wide = new OxXmlElement("record");
    wide->addAttribute(new OxXmlAttribute("f", "a,b"));
    root->addChild(wide);
    plain.setRoot(root);
    ASSERT_EQ(plain.writeFile(), OxTrue);
    EXPECT_EQ(oxtest::readText(dir.file("plain.csv")), "1,2,3\n4,,\n\"a,b\",x,\na,b,\n");

    OxCsvFile closed(nullptr, OxFile::OxIOInput);
    EXPECT_EQ(closed.writeFile(), OxFalse);
    EXPECT_EQ(closed.readFile(), OxFalse);
}

TEST_F(CsvTest, ConvertQuotesAndSplitsValues) {
    OxCsvFile csv(dir.file("c.csv").c_str(), OxFile::OxIOOutput);
    OxXmlAttribute say("a", "say \"hi\""), list("a", "a,b"), plain("a", "ab"), none("a");
    OxXmlAttribute vec("a", "  1.0 2.0 3.0 ");
    csv.convertToCsv(&say, OxTrue);
    csv.convertToCsv(&list, OxTrue);
    csv.convertToCsv(&plain, OxTrue);
    csv.convertToCsv(&none, OxTrue);
    csv.convertToCsv(&vec, OxFalse);
    csv.convertToCsv(nullptr, OxTrue);
    EXPECT_STREQ(say.getValue(), "\"say \"\"hi\"\"\"");
    EXPECT_STREQ(list.getValue(), "\"a,b\"");
    EXPECT_STREQ(plain.getValue(), "ab");
    EXPECT_EQ(none.getValue(), nullptr);
    EXPECT_STREQ(vec.getValue(), "1.0,2.0,3.0");

    OxGList<char*> fields;
    EXPECT_EQ(OxCsvFile::parseCSVString(" a,, b ,", ',', fields), OxTrue);
    EXPECT_EQ(OxCsvFile::parseCSVString("   ", ',', fields), OxTrue);
    EXPECT_EQ(OxCsvFile::parseCSVString(nullptr, ',', fields), OxFalse);
    ASSERT_EQ(fields.getLength(), 2u);
    EXPECT_STREQ(fields[0], "a");
    EXPECT_STREQ(fields[1], "b");
    for (unsigned int i = 0; i < fields.getLength(); i++) {
        delete[] fields[i];
    }
}

TEST_F(CsvTest, FindWalksASeries) {
    std::unique_ptr<OxCsvFile> csv;
    ASSERT_EQ(read(csv, "id,mat\n1,steel\n2,\n3,steel\n4,alu\n"), OxTrue);
    unsigned int at = 0;
    std::vector<unsigned int> hits;
    while (csv->find("mat", "steel", at) != nullptr) {
        hits.push_back(at++);
    }
    EXPECT_EQ(hits, (std::vector<unsigned int>{0, 2}));
    EXPECT_EQ(at, 3u); // no hit: the index stays
    at = 1;
    EXPECT_EQ(csv->find("mat", nullptr, at), csv->getRoot()->getChild(2));
    EXPECT_EQ(at, 2u);
    at = 4;
    EXPECT_EQ(csv->find("id", nullptr, at), nullptr);
    at = 0;
    EXPECT_EQ(csv->find(nullptr, "steel", at), nullptr);
}

TEST_F(CsvTest, HostileInputIsReadWithoutLoss) {
    std::unique_ptr<OxCsvFile> csv;
    EXPECT_EQ(read(csv, ""), OxTrue);
    EXPECT_EQ(csv->getRoot()->getNbChildElements(), 0u);

    std::string longValue(100000, 'x'); // beyond the first block of lines
    std::string seps(400, ',');
    std::string text = "a,b\n" + longValue + ",1\n" + std::string("p,q\0r,s\n", 8) + seps + "z\n" +
                       std::string(3, '\0') + "\nlast,1";
    ASSERT_EQ(read(csv, text), OxTrue);
    ASSERT_EQ(csv->getRoot()->getNbChildElements(), 4u);
    EXPECT_EQ(record(*csv, 0), "a=" + longValue + "|b=1");
    EXPECT_EQ(record(*csv, 1), "a=p|b=q"); // the text of a line ends at a NUL byte
    EXPECT_EQ(record(*csv, 2), "column400=z");
    EXPECT_EQ(record(*csv, 3), "a=last|b=1");
    EXPECT_NE(oxtest::dumpText(*csv).find("  CSV Input File Name: " + dir.file("in.csv")),
              std::string::npos);

    // Any separator is safe, NUL included: it never matches inside a text,
    // so each line is one field.
    ASSERT_EQ(read(csv, "a,b\n1,2\n", '\0'), OxTrue);
    ASSERT_EQ(csv->getColumnNames().getLength(), 1u);
    EXPECT_EQ(record(*csv, 0), "a,b=1,2");
    OxGList<char*> fields;
    EXPECT_EQ(OxCsvFile::parseCSVString("x;y", '\0', fields), OxTrue);
    ASSERT_EQ(fields.getLength(), 1u);
    EXPECT_STREQ(fields[0], "x;y");
    delete[] fields[0];
    for (int sep = -128; sep < 128; sep++) {
        ASSERT_EQ(read(csv, "h1 h2,h3\n#\nv 1,v2\n", static_cast<char>(sep)), OxTrue);
        // One record, or none where the header ends in the separator.
        EXPECT_EQ(csv->getRoot()->getNbChildElements(), sep == '3' ? 0u : 1u) << sep;
    }
}

} // namespace
