#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/io/OxInput.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace {
using Messages = std::vector<std::string>;

class OxXmlFileTest : public testing::Test {
protected:
    void SetUp() override { OxXmlFile::setIndent(0); }
    void TearDown() override { OxXmlFile::setIndent(0); }

    /// Reads `text` from a file of its own; `ok` is the result of readFile.
    std::unique_ptr<OxXmlFile> read(const std::string& text, OxBool expected,
                                    const char* name = "in.xml") {
        std::string path = messages.dir.file(name);
        oxtest::writeFile(path, text);
        auto file = std::make_unique<OxXmlFile>(path.c_str(), OxFile::OxIOInput);
        EXPECT_EQ(file->readFile(), expected) << text;
        return file;
    }
    /// Writes `file` to out.xml and returns the bytes.
    std::string write(OxXmlFile& file, OxBool expected, const char* name = "out.xml") {
        std::string path = messages.dir.file(name);
        EXPECT_EQ(file.open(path.c_str(), OxFile::OxIOOutput), 0);
        EXPECT_EQ(file.writeFile(), expected);
        return oxtest::readText(path);
    }
    std::string in() const { return messages.dir.file("in.xml"); }
    std::string place(unsigned int line, unsigned int offset, const std::string& text) {
        return "at " + in() + "|" + std::to_string(line) + "|" + std::to_string(offset) + "|" +
               text;
    }

    // Texts that spell out every argument.
    oxtest::MessageLog messages{"1,I,0open %s\n2,I,0read %s\n3,I,0seek %s\n18,I,0eof\n19,I,0fail\n"
                                "20,I,0bad\n179,I,0write %s\n560,I,0e560\n561,I,0e561\n"
                                "562,I,0e562\n564,I,0e564\n566,I,0at %s|%u|%u|%s\n"
                                "567,I,0mismatch %s|%u|%u|%s|%s\n568,I,0second %s|%u|%u|%s\n"
                                "569,I,0nul %s|%u|%u\n579,I,0written %s\n"};
};

const char* const kDecl = "<?xml version=\"1.0\"?>\n";

} // namespace

TEST_F(OxXmlFileTest, DeclarationAndErrorPlaces) {
    read("<root/>\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(1, 0, "<root/>"), "e561"}));

    // Blank lines count; the offset is in the trimmed line.
    auto file = read("\n  \n\t<?xml version=\"1.0\"?>  \n   <a b=1>\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(4, 5, "<a b=1>"), "e560"}));
    ASSERT_NE(file->getRoot(), nullptr); // what was built stays
    EXPECT_EQ(file->getRoot()->getNbAttributes(), 1u);

    read(std::string(kDecl) + "<r>\n<?xml version=\"1.0\"?>\n</r>\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(3, 0, "<?xml version=\"1.0\"?>"), "e562"}));

    read(std::string(kDecl) + "<r>\n<a/ >\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(3, 2, "<a/ >"), "e564"}));
    read(std::string(kDecl) + "<a>x\n</a>\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(2, 4, "<a>x"), "e564"}));
    file = read(std::string(kDecl) + "<a>x<b/></a>\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(2, 4, "<a>x<b/></a>"), "e564"}));
    EXPECT_STREQ(file->getRoot()->getValue(), "x"); // stored before the error
    read(std::string(kDecl) + "<a b=\"1\" /x>\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(2, 9, "<a b=\"1\" /x>"), "e564"}));
    read("no markup here\n", OxFalse);
    EXPECT_EQ(messages.take(), (Messages{place(1, 0, "no markup here"), "e561"}));

    // The declaration node holds the whole line; what follows "?>" is read.
    file = read("<?xml version=\"1.0\"?><a/>\n", OxTrue);
    ASSERT_NE(file->getRoot(), nullptr);
    EXPECT_STREQ(file->getRoot()->getName(), "a");
    EXPECT_EQ(messages.take(), Messages{});
}

TEST_F(OxXmlFileTest, TagsValuesAndAttributes) {
    auto file = read(std::string(kDecl) + "<a b=\"1\" c='2'/>\n<!-- after -->\n", OxTrue);
    const OxXmlElement* root = file->getRoot();
    ASSERT_NE(root, nullptr);
    EXPECT_EQ(root->getNbAttributes(), 2u);
    EXPECT_STREQ(root->getAttributeValue("c"), "2");
    EXPECT_EQ(root->getValue(), nullptr);
    EXPECT_EQ(root->getNbChildElements(), 0u); // the comment went behind the root

    file = read(std::string(kDecl) + "<p>\n<a/>\n<a />\n<b c = \"1\">x</b>\n<d>1 &lt; 2</d>\n"
                                     "<e f=\"1\n  2\n\n 3 \">\n</e>\n<g>\nv</g>\n<h></h>\n</p>\n",
                OxTrue);
    root = file->getRoot();
    ASSERT_EQ(root->getNbChildElements(), 7u);
    EXPECT_TRUE(root->getChild(1)->isNamed("a"));
    EXPECT_EQ(root->getChild(1)->getParent(), root);
    EXPECT_STREQ(root->getChild(2)->getAttributeValue("c"), "1");
    EXPECT_STREQ(root->getChild(2)->getValue(), "x");
    EXPECT_STREQ(root->getChild(3)->getValue(), "1 &lt; 2");
    EXPECT_STREQ(root->getChild(4)->getAttributeValue("f"), "1 2 3");
    EXPECT_STREQ(root->getChild(5)->getValue(), "v");
    EXPECT_EQ(root->getChild(6)->getValue(), nullptr);

    // Both elements behind one another are read, with or without a blank.
    file = read(std::string(kDecl) + "<r>\n<a>1</a> <b>2</b>\n<c>3</c><d>4</d>\n</r>\n", OxTrue);
    root = file->getRoot();
    ASSERT_EQ(root->getNbChildElements(), 4u);
    EXPECT_STREQ(root->getChildByName("b")->getValue(), "2");
    EXPECT_STREQ(root->getChildByName("d")->getValue(), "4");

    // A tag name must end on its line; a name without "=" vanishes; tabs
    // belong to names; an attribute may stand on the next line.
    file = read(std::string(kDecl) + "<r\n><a\tb x y=\"1\"\nz=\"2\"/>\n</r>\n", OxTrue);
    root = file->getRoot();
    ASSERT_NE(root, nullptr);
    EXPECT_STREQ(root->getName(), "a\tb");
    EXPECT_EQ(root->getNbAttributes(), 2u);
    EXPECT_STREQ(root->getAttributeValue("z"), "2");

    // An opening quote at a line end leaves nothing to gather: the read ends
    // at the closing quote, without a message.
    read(std::string(kDecl) + "<a b=\"\n1\">\n", OxFalse);
    EXPECT_EQ(messages.take(), Messages{});
}

TEST_F(OxXmlFileTest, RawNodesAndWhereTheyGo) {
    std::string text = std::string(kDecl) +
                       "<!DOCTYPE r [\n<!ELEMENT r ANY>\n]>\n<!-- one\n\n  two -->\n"
                       "<r>\n<!-- x --><b>\n<![CDATA[ <c> ]]>\n</r>\n<!-- tail --> <z/>\n";
    auto file = read(text, OxTrue);
    const OxXmlElement* root = file->getRoot();
    ASSERT_NE(root, nullptr);
    ASSERT_EQ(root->getNbChildElements(), 2u);
    EXPECT_STREQ(root->getChild(0)->getValue(), "<!-- x --><b>");
    EXPECT_EQ(root->getChild(0)->getName(), nullptr);
    EXPECT_EQ(root->getChild(0)->getParent(), root);
    EXPECT_STREQ(root->getChild(1)->getValue(), "<![CDATA[ <c> ]]>");
    EXPECT_EQ(root->getChild(1)->getType(), OxXmlElement::XML_TYPE_COMMENT);

    // Written back: raw nodes at the margin, the comment's rest dropped with
    // it, the declaration as read and without an empty line.
    EXPECT_EQ(write(*file, OxTrue),
              "<?xml version=\"1.0\"?>\n<!DOCTYPE r [\n<!ELEMENT r ANY>\n"
              "<!-- one\ntwo -->\n<r>\n<!-- x --><b>\n<![CDATA[ <c> ]]>\n</r>\n<!-- tail --> "
              "<z/>\n");
    EXPECT_EQ(messages.take(), Messages{"written " + messages.dir.file("out.xml")});

    // A document may end anywhere.
    file = read(std::string(kDecl) + "<r>\n<a x=\"1\n2", OxTrue);
    EXPECT_STREQ(file->getRoot()->getChild(0)->getAttributeValue("x"), "1 2");
    file = read(std::string(kDecl) + "<r>\n<!-- open\nstill", OxTrue);
    EXPECT_STREQ(file->getRoot()->getChild(0)->getValue(), "<!-- open\nstill");
}

TEST_F(OxXmlFileTest, EndTagsAndSecondTopLevelElement) {
    auto file = read(std::string(kDecl) + "</b>\n<a>\n<c>\n</x>\n</a>\n<d/><e>1</e>\n", OxTrue);
    ASSERT_NE(file->getRoot(), nullptr);
    EXPECT_EQ(file->getRoot()->getNbChildElements(), 1u);
    EXPECT_EQ(messages.take(),
              (Messages{"mismatch " + in() + "|5|0|x|c", "second " + in() + "|7|0|d",
                        "second " + in() + "|7|4|e"}));
    // Nothing is lost: the elements come back behind the root.
    EXPECT_EQ(write(*file, OxTrue), "<?xml version=\"1.0\"?>\n<a>\n <c/>\n</a>\n<d/>\n<e>1</e>\n");
}

TEST_F(OxXmlFileTest, WrittenLayout) {
    // An empty document: the generated declaration and its empty line.
    auto file = read("", OxTrue);
    EXPECT_EQ(write(*file, OxTrue), "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n");
    OxXmlFile::setIndent(6);
    EXPECT_EQ(write(*file, OxTrue), "  <?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n");
    OxXmlFile::setIndent(0);

    const std::string decl = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";
    file = read(decl + "<root id=\"7\">\n<child a=\"lost\">text</child>\n<empty/>\n"
                       "<gone>\n</gone>\n<n skip=\"\"/>\n</root>\n",
                OxTrue);
    EXPECT_EQ(write(*file, OxTrue), decl + "<root id=\"7\">\n <child>text</child>\n <empty/>\n"
                                           " <gone/>\n <n/>\n</root>\n");
    OxXmlFile::setIndent(2);
    EXPECT_EQ(write(*file, OxTrue), decl + "  <root id=\"7\">\n   <child>text</child>\n"
                                           "   <empty/>\n   <gone/>\n   <n/>\n"
                                           "  </root>\n");
    OxXmlFile::setIndent(0);

    // A second write starts again at the front; nothing cuts off the rest.
    write(*file, OxTrue);
    std::string longer = oxtest::readFile(messages.dir.file("out.xml"));
    file->getRootForUpdate()->deleteChildren("child");
    EXPECT_EQ(file->writeFile(), OxTrue);
    std::string shorter =
        oxtest::textBytes(decl + "<root id=\"7\">\n <empty/>\n <gone/>\n <n/>\n</root>\n");
    EXPECT_EQ(oxtest::readFile(messages.dir.file("out.xml")),
              shorter + longer.substr(shorter.size()));

    // Nodes that cannot be written: OxFalse, the rest still goes out.
    file = read(decl + "<r>\n<a x=\"1\"/>\n</r>\n<!-- end -->\n", OxTrue);
    OxXmlElement* a = file->getRootForUpdate()->getChild(0);
    a->addAttribute(new OxXmlAttribute(static_cast<const char*>(nullptr), "v"));
    EXPECT_EQ(write(*file, OxFalse), decl + "<r>\n<!-- end -->\n");
    EXPECT_EQ(OxXmlFile::getIndent(), 1); // the level left early keeps its step
    OxXmlFile::setIndent(0);
    messages.take();
    a->setName(nullptr);
    EXPECT_EQ(write(*file, OxFalse), decl + "<r>\n<!-- end -->\n");
    EXPECT_EQ(messages.take(), Messages{"written " + messages.dir.file("out.xml")});
}

TEST_F(OxXmlFileTest, IndentationBounds) {
    OxXmlFile::setIndent(21);
    OxXmlFile::setIndent(-1);
    EXPECT_EQ(OxXmlFile::getIndent(), 0);
    OxXmlFile::adjustIndent(-1);
    EXPECT_EQ(OxXmlFile::getIndent(), 0);
    OxXmlFile::setIndent(20);
    EXPECT_EQ(OxXmlFile::indent[20], '\0');
    OxXmlFile::adjustIndent(1);
    EXPECT_EQ(OxXmlFile::getIndent(), 20);
    OxXmlFile::adjustIndent(-20);
    EXPECT_EQ(OxXmlFile::getIndent(), 0);
    EXPECT_EQ(OxXmlFile::indent[20], ' ');
    OxXmlFile::setIndent(0);

    // 25 levels: the steps up stop at 20, the steps down do not.
    const int depth = 25;
    std::string text = kDecl;
    std::string expected = kDecl;
    for (int k = 0; k < depth; k++) {
        text += "<e" + std::to_string(k) + (k + 1 < depth ? ">\n" : "/>\n");
        expected += std::string(std::min(k, 20), ' ') + "<e" + std::to_string(k) +
                    (k + 1 < depth ? ">\n" : "/>\n");
    }
    int pos = std::min(depth - 1, 20);
    for (int k = depth - 2; k >= 0; k--) {
        pos = std::max(pos - 1, 0);
        text += "</e" + std::to_string(k) + ">\n";
        expected += std::string(pos, ' ') + "</e" + std::to_string(k) + ">\n";
    }
    auto file = read(text, OxTrue);
    EXPECT_EQ(write(*file, OxTrue), expected);
    EXPECT_EQ(OxXmlFile::getIndent(), 0);
}

TEST_F(OxXmlFileTest, StreamsAndRepeatedReads) {
    auto file = read(std::string(kDecl) + "<a/>", OxTrue); // no line end at the last line
    ASSERT_NE(file->getRoot(), nullptr);
    const OxXmlElement* root = file->getRoot();
    EXPECT_EQ(file->isGood(OxFile::OxIOInput), OxFalse); // at its end
    EXPECT_EQ(file->readFile(), OxFalse);
    EXPECT_EQ(file->getRoot(), root);
    EXPECT_EQ(file->writeFile(), OxFalse); // no output
    EXPECT_EQ(file->isGood(static_cast<OxFile::OxIOType>(5)), OxFalse);
    EXPECT_EQ(file->open("x", static_cast<OxFile::OxIOType>(5)), 0);

    OxXmlFile output(messages.dir.file("o.xml").c_str(), OxFile::OxIOOutput);
    EXPECT_EQ(output.isGood(OxFile::OxIOOutput), OxTrue);
    EXPECT_EQ(output.readFile(), OxFalse);
    OxXmlFile missing(messages.dir.file("missing.xml").c_str(), OxFile::OxIOInput);
    EXPECT_EQ(missing.isGood(OxFile::OxIOInput), OxFalse);
    EXPECT_EQ(missing.readFile(), OxFalse);
    EXPECT_EQ(missing.open(messages.dir.file("missing.xml").c_str(), OxFile::OxIOInput), -1);

    OxPrt prt;
    OxPrt::setIndent(0);
    file = read(std::string(kDecl) + "<!DOCTYPE d>\n<a b=\"1\"/>\n", OxTrue);
    file->dump(prt.getStr());
    std::unique_ptr<char[]> text(prt.flushToString());
    EXPECT_EQ(std::string(text.get()), " OxXmlFile :\n   XML Input File Name: " + in() +
                                           "\n<?xml version=\"1.0\"?>\n<!DOCTYPE d>\n"
                                           "<!DOCTYPE d>\n   XML Element: \"a\"\n"
                                           "     attribute[0]:\n     XML Attribute: b=\"1\"\n");
}

TEST_F(OxXmlFileTest, LongLinesAndBadInput) {
    // Lines of any length are read whole.
    std::string exact(1039 - 9, 'x'); // a line of exactly 1039 characters
    std::string longValue(200000, 'y');
    auto file = read(std::string(kDecl) + "<r>\n<a v=\"" + exact + "\"/>\n<b v=\"" + longValue +
                         "\"/>\n</r>\n",
                     OxTrue);
    EXPECT_EQ(std::string(file->getRoot()->getChild(0)->getAttributeValue("v")), exact);
    EXPECT_EQ(std::string(file->getRoot()->getChild(1)->getAttributeValue("v")), longValue);

    // NUL bytes are read as blanks, and said so.
    file = read(std::string(kDecl) + "<a>x" + std::string(2, '\0') + "y</a>\n", OxTrue);
    EXPECT_STREQ(file->getRoot()->getValue(), "x  y");
    EXPECT_EQ(messages.take(), Messages{"nul " + in() + "|2|2"});

    // Every cut of a document, and random bytes behind a declaration, end
    // with a result and without a fault.
    std::string whole =
        std::string(kDecl) + "<r a=\"1\n2\">\n<!-- c\nd -->\n<b>t</b>\n<![CDATA[x\n]]>\n<c/></r>\n";
    for (size_t cut = 0; cut < whole.size(); cut++) {
        std::string path = messages.dir.file("cut.xml");
        oxtest::writeFile(path, whole.substr(0, cut));
        OxXmlFile cutFile(path.c_str(), OxFile::OxIOInput);
        cutFile.readFile();
    }
    std::mt19937 random(12345);
    for (int round = 0; round < 200; round++) {
        std::string garbage = kDecl;
        size_t length = random() % 400;
        for (size_t i = 0; i < length; i++) {
            garbage += "<>/=\"' \n!-?[]ab\0\t\xff"[random() % 19];
        }
        std::string path = messages.dir.file("garbage.xml");
        oxtest::writeFile(path, garbage);
        OxXmlFile garbageFile(path.c_str(), OxFile::OxIOInput);
        garbageFile.readFile();
        OxPrt prt;
        garbageFile.dumpXML(prt.getStr());
        delete[] prt.flushToString();
        garbageFile.open(messages.dir.file("garbage-out.xml").c_str(), OxFile::OxIOOutput);
        garbageFile.writeFile();
    }
    OxXmlFile::setIndent(0);
}

TEST_F(OxXmlFileTest, RoundTrip) {
    std::string text = std::string(kDecl) + "<!-- assembly -->\n<assembly name=\"a\">\n";
    for (int part = 0; part < 5; part++) {
        text += "<part id=\"" + std::to_string(part) + "\">\n";
        OxGList<unsigned int> indices;
        for (unsigned int i = 0; i < 30; i++) {
            indices.append(i * 7 + part);
        }
        OxXmlAttribute list("indices", indices);
        double xyz[3] = {part * 0.5, -1.25, 1e-12};
        OxXmlAttribute point("vec3d", 3, xyz);
        text += std::string("<mesh ") + list.getName() + "=\"" + list.getValue() + "\" " +
                point.getName() + "=\"" + point.getValue() + "\"/>\n<label>p" +
                std::to_string(part) + "</label>\n</part>\n";
    }
    text += "</assembly>\n";
    auto first = read(text, OxTrue);
    std::string once = write(*first, OxTrue);
    auto second = read(once, OxTrue, "again.xml");
    // The dump shows every name, value, attribute and child of both trees.
    EXPECT_EQ(oxtest::dumpText(*second->getRoot()), oxtest::dumpText(*first->getRoot()));
    first.reset(); // its output stays open, and Windows removes no open file
    std::string twice = write(*second, OxTrue);
    EXPECT_EQ(once, twice);
    OxGList<unsigned int> indices;
    EXPECT_EQ(second->getRoot()->getChild(2)->getChildByName("mesh")->getIndices(&indices), OxTrue);
    ASSERT_EQ(indices.getLength(), 30u);
    EXPECT_EQ(indices[29], 29u * 7 + 2);
}

TEST_F(OxXmlFileTest, MillionLevelsDeep) {
    const unsigned int depth = 1000000;
    std::string text = kDecl;
    text.reserve(depth * 9 + 64);
    for (unsigned int i = 0; i < depth; i++) {
        text += "<a>\n";
    }
    for (unsigned int i = 0; i < depth; i++) {
        text += "</a>\n";
    }
    auto file = read(text, OxTrue);
    const OxXmlElement* element = file->getRoot();
    unsigned int levels = 0;
    for (; element != nullptr; element = element->getChild(0)) {
        levels++;
    }
    EXPECT_EQ(levels, depth);

    OxPrt prt;
    OxPrt::setIndent(0);
    file->dumpXML(prt.getStr());
    std::unique_ptr<char[]> dumped(prt.flushToString());
    std::string dump(dumped.get());
    EXPECT_EQ(std::count(dump.begin(), dump.end(), '\n'), 4 + 2 * (depth - 1));
    std::string deepest = "\n" + std::string(41, ' ') + "XML Element: \"a\"\n";
    EXPECT_EQ(dump.substr(dump.size() - deepest.size()), deepest);
    EXPECT_EQ(OxPrt::getIndent(), 0);

    // The written size: opening lines indented up to 20 blanks, closing lines
    // stepping down from 19 to 0.
    size_t expected = std::string(kDecl).size();
    for (unsigned int k = 0; k < depth; k++) {
        expected += std::min(k, 20u) + (k + 1 < depth ? 4 : 5);
    }
    for (unsigned int j = 0; j + 1 < depth; j++) {
        expected += (j < 19 ? 19 - j : 0) + 5;
    }
    std::string written = write(*file, OxTrue);
    EXPECT_EQ(written.size(), expected);
    EXPECT_EQ(written.substr(written.size() - 10), "</a>\n</a>\n");
    file.reset(); // destroyed without recursion
}

TEST_F(OxXmlFileTest, UnflushedWriteGivesTheSameBytes) {
    // A document of several 64 KiB blocks: raw nodes before, inside and
    // behind the root, values, attributes, list values over several lines.
    std::string text = std::string(kDecl) + "<!-- before -->\n<model a=\"1\">\n";
    for (int i = 0; i < 3000; i++) {
        text += " <part id=\"" + std::to_string(i) + "\" list=\"1 2 3 4 5 6 7 8 9 10 11\n 12\">\n";
        text += "  <label>part " + std::to_string(i) + "</label>\n  <!-- inside\n two -->\n";
        text += "  <empty/>\n </part>\n";
    }
    text += "</model>\n<!-- behind -->\n";
    auto file = read(text, OxTrue);
    EXPECT_EQ(file->getFlushEveryLine(), OxTrue); // the default
    std::string flushed = write(*file, OxTrue);
    ASSERT_GT(flushed.size(), 3u * 65536);
    file->setFlushEveryLine(OxFalse);
    EXPECT_EQ(file->getFlushEveryLine(), OxFalse);
    messages.take();
    EXPECT_EQ(write(*file, OxTrue), flushed);
    EXPECT_EQ(messages.take(), Messages{"written " + messages.dir.file("out.xml")});

    // A generated declaration keeps its empty line; a failed node leaves the
    // same lines in both modes.
    auto empty = read("", OxTrue);
    empty->setFlushEveryLine(OxFalse);
    // (Another name: Windows removes no file that another document holds open.)
    EXPECT_EQ(write(*empty, OxTrue, "empty.xml"), "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n\n");
    file->getRootForUpdate()->getChild(1)->addChild(new OxXmlElement(nullptr));
    std::string failedUnflushed = write(*file, OxFalse);
    OxXmlFile::setIndent(0);
    file->setFlushEveryLine(OxTrue);
    EXPECT_EQ(write(*file, OxFalse), failedUnflushed);
    OxXmlFile::setIndent(0);
    const std::string behind = "\n<!-- behind -->\n";
    EXPECT_EQ(
        failedUnflushed.compare(failedUnflushed.size() - behind.size(), behind.size(), behind), 0);

    // A file that cannot take the whole document: message 179 and OxFalse,
    // and what reached the file is the document's start.
    if (!oxtest::canFork()) {
        return;
    }
    file = read(text, OxTrue);
    std::string whole = write(*file, OxTrue);
    std::string path = messages.dir.file("limited.xml");
    messages.take();
    std::string result = oxtest::inChild(
        [&] {
            file->open(path.c_str(), OxFile::OxIOOutput);
            file->setFlushEveryLine(OxFalse);
            std::string report = file->writeFile() == OxTrue ? "written" : "failed";
            for (const std::string& message : messages.take()) {
                report += "|" + message.substr(0, message.find(' '));
            }
            return report;
        },
        {false, 100000});
    EXPECT_EQ(result.rfind("failed|write|", 0), 0u) << result;
    EXPECT_NE(result.find("|written"), std::string::npos) << result;
    std::string limited = oxtest::readFile(path);
    EXPECT_EQ(limited.size(), 100000u);
    EXPECT_EQ(whole.compare(0, limited.size(), limited), 0);
}
