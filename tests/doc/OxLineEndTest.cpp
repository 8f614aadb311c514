// Files with CR LF line ends read the same as with LF ones, on every
// platform: the XML and CSV readers, list files and message files. On
// Windows the text mode of the streams turns CR LF into "\n" (so a file
// gives fewer characters than its length); elsewhere the readers drop the
// CR with the white space at the end of a line.
#include "oxbase/diag/OxMsg.h"
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/io/OxFileList.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace {

/// `text` with every "\n" made "\r\n".
std::string crlf(const std::string& text) {
    std::string out;
    for (char c : text) {
        if (c == '\n') {
            out += '\r';
        }
        out += c;
    }
    return out;
}

/// What the XML reader made of `bytes`, as the document is written back.
std::string xmlReadBack(oxtest::TempDir& dir, const std::string& name, const std::string& bytes) {
    oxtest::writeFile(dir.file(name), bytes);
    OxXmlFile file(dir.file(name).c_str(), OxFile::OxIOInput);
    EXPECT_EQ(file.readFile(), OxTrue) << name;
    const OxXmlElement* part =
        file.getRoot() != nullptr ? file.getRoot()->getChildByName("part") : nullptr;
    EXPECT_NE(part, nullptr) << name;
    if (part != nullptr) {
        EXPECT_STREQ(part->getAttributeValue("vec3d"), "1 2 3") << name;
    }
    std::string out = dir.file(name + ".out");
    file.open(out.c_str(), OxFile::OxIOOutput);
    EXPECT_EQ(file.writeFile(), OxTrue) << name;
    return oxtest::readText(out);
}

/// The records of a CSV file of `bytes`: "name=value" of every field.
std::vector<std::string> csvRecords(oxtest::TempDir& dir, const std::string& name,
                                    const std::string& bytes) {
    oxtest::writeFile(dir.file(name), bytes);
    OxCsvFile csv(dir.file(name).c_str(), OxFile::OxIOInput);
    EXPECT_EQ(csv.readFile(), OxTrue) << name;
    std::vector<std::string> fields;
    const OxXmlElement* root = csv.getRoot();
    for (unsigned int r = 0; root != nullptr && r < root->getNbChildElements(); r++) {
        const OxXmlElement* record = root->getChild(r);
        for (unsigned int a = 0; a < record->getNbAttributes(); a++) {
            fields.push_back(std::string(record->getAttribute(a)->getName()) + "=" +
                             record->getAttribute(a)->getValue());
        }
        fields.push_back("|");
    }
    return fields;
}

std::vector<std::string> listNames(oxtest::TempDir& dir, const std::string& name,
                                   const std::string& bytes) {
    oxtest::writeFile(dir.file(name), bytes);
    OxFileList list(dir.file(name).c_str());
    EXPECT_EQ(list.readListFiles(), OxTrue) << name;
    std::vector<std::string> names;
    for (unsigned int i = 0; i < list.getFileNameList().getLength(); i++) {
        names.push_back(list.getFileNameList()[i]);
    }
    return names;
}

/// The texts of messages 1 to 3 from a message file of `bytes`.
std::vector<std::string> messageTexts(oxtest::TempDir& dir, const std::string& name,
                                      const std::string& bytes) {
    oxtest::writeFile(dir.file(name), bytes);
    OxMsg msg(dir.file(name).c_str(), nullptr, nullptr, nullptr);
    EXPECT_EQ(OxMsg::isValid(), OxTrue) << name;
    std::vector<std::string> texts;
    for (unsigned int number = 1; number <= 3; number++) {
        const char* text = OxMsg::LogToString(number);
        texts.push_back(text != nullptr ? text : "<none>");
    }
    return texts;
}

} // namespace

TEST(OxLineEnds, CrLfFilesReadAsLfFiles) {
    oxtest::TempDir dir;

    const std::string xml = "<?xml version=\"1.0\"?>\n"
                            "<!-- a comment\n"
                            "   over two lines -->\n"
                            "<assembly name=\"gear box\"\n"
                            "    note=\"a value over\n"
                            "  two lines\">\n"
                            " <part id=\"1\" vec3d=\"1 2 3\"/>\n"
                            " <label>text</label>\n"
                            "</assembly>\n";
    std::string fromLf = xmlReadBack(dir, "lf.xml", xml);
    EXPECT_NE(fromLf.find("<assembly"), std::string::npos);
    EXPECT_EQ(xmlReadBack(dir, "crlf.xml", crlf(xml)), fromLf);
    // A long document: the reader reads in blocks, and on Windows the text
    // is shorter than the file by one character a line.
    std::string big = "<?xml version=\"1.0\"?>\n<model>\n";
    for (int i = 0; i < 20000; i++) {
        big += " <part id=\"" + std::to_string(i) + "\" vec3d=\"1 2 3\"/>\n";
    }
    big += "</model>\n";
    EXPECT_EQ(xmlReadBack(dir, "big-crlf.xml", crlf(big)), xmlReadBack(dir, "big-lf.xml", big));

    const std::string csv = "name,x,y\n# a comment\nbolt,1,2\n\nnut,3,\n  washer , 5,6  \n";
    std::vector<std::string> records = csvRecords(dir, "lf.csv", csv);
    EXPECT_EQ(records, (std::vector<std::string>{"name=bolt", "x=1", "y=2", "|", "name=nut", "x=3",
                                                 "|", "name=washer", "x=5", "y=6", "|"}));
    EXPECT_EQ(csvRecords(dir, "crlf.csv", crlf(csv)), records);

    const std::string list = "one.xml\n# a comment\ntwo.xml # and a tail\n\n  three.xml  \n";
    std::vector<std::string> names = listNames(dir, "lf.lst", list);
    EXPECT_EQ(names, (std::vector<std::string>{"one.xml", "two.xml", "three.xml"}));
    EXPECT_EQ(listNames(dir, "crlf.lst", crlf(list)), names);

    const std::string messages = "0 comment line\n1,I,0first\n1 and its second line\n"
                                 "2,W,0second\n3,E,0third\n";
    std::vector<std::string> texts = messageTexts(dir, "lf.msg", messages);
    // A continuation joins its message on a new line with a tab.
    EXPECT_EQ(texts,
              (std::vector<std::string>{"first\n\t and its second line", "second", "third"}));
    EXPECT_EQ(messageTexts(dir, "crlf.msg", crlf(messages)), texts);
}
