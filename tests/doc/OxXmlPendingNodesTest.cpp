// The attributes and children of read elements and records are built on
// first use; every way in must see the same objects, names, values and
// parents as if they had been built while reading.
#include "oxbase/doc/OxCsvFile.h"
#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/doc/OxXmlFile.h"
#include "oxbase/geom/OxVec.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <string>

namespace {

class PendingTest : public testing::Test {
protected:
    void SetUp() override { OxXmlFile::setIndent(0); }
    oxtest::TempDir dir;

    std::unique_ptr<OxXmlFile> readXml(const std::string& text) {
        oxtest::writeFile(dir.file("in.xml"), text);
        auto file = std::make_unique<OxXmlFile>(dir.file("in.xml").c_str(), OxFile::OxIOInput);
        EXPECT_EQ(file->readFile(), OxTrue);
        return file;
    }
    std::unique_ptr<OxCsvFile> readCsv(const std::string& text) {
        oxtest::writeFile(dir.file("in.csv"), text);
        auto file = std::make_unique<OxCsvFile>(dir.file("in.csv").c_str(), OxFile::OxIOInput);
        EXPECT_EQ(file->readFile(), OxTrue);
        return file;
    }
};

const char* const kTag = "<?xml version=\"1.0\"?>\n"
                         "<a x=\" 1 \" y='two' z=\"\" vec3d=\"1 2\n 3\"/>\n";

TEST_F(PendingTest, XmlAttributesAreTheSameObjectsWhicheverWayIn) {
    auto file = readXml(kTag);
    OxXmlElement* a = file->getRootForUpdate();
    ASSERT_NE(a, nullptr);
    EXPECT_EQ(a->getNbAttributes(), 4u); // counted without building
    OxXmlAttribute* y = a->getAttributeByName("y");
    ASSERT_NE(y, nullptr);
    EXPECT_EQ(a->getAttribute(1), y);
    EXPECT_EQ(a->getAttributeByName("y"), y);
    EXPECT_STREQ(a->getAttribute(0)->getValue(), "1");
    EXPECT_EQ(a->getAttribute(2)->getValue(), nullptr); // z="" has no value
    EXPECT_STREQ(a->getAttributeValue("vec3d"), "1 2 3");
    EXPECT_EQ(a->getAttribute(4), nullptr);

    // The value text is the attribute's: stable, and writable in place.
    const char* before = y->getValue();
    y->getValueForUpdate()[0] = 'T';
    EXPECT_EQ(a->getAttributeValue("y"), before);
    EXPECT_STREQ(a->getAttributeValue("y"), "Two");
    y->setValue("three");
    EXPECT_STREQ(a->getAttribute(1)->getValue(), "three");

    // Written before anyone asked (from the pending form) and dumped, the
    // read tree gives the texts of the same tree built by hand.
    auto other = readXml(kTag);
    other->open(dir.file("out.xml").c_str(), OxFile::OxIOOutput);
    ASSERT_EQ(other->writeFile(), OxTrue);
    EXPECT_EQ(oxtest::readText(dir.file("out.xml")),
              "<?xml version=\"1.0\"?>\n<a x=\"1\" y=\"two\" vec3d=\"1 2 3\"/>\n");
    OxXmlElement byHand("a");
    byHand.addAttribute(new OxXmlAttribute("x", "1"));
    byHand.addAttribute(new OxXmlAttribute("y", "two"));
    byHand.addAttribute(new OxXmlAttribute("z"));
    byHand.addAttribute(new OxXmlAttribute("vec3d", "1 2 3"));
    EXPECT_EQ(oxtest::dumpText(*other->getRoot()), oxtest::dumpText(byHand));

    // An attribute without a name fails the write alike, pending or built.
    for (bool built : {false, true}) {
        auto nameless = readXml("<?xml version=\"1.0\"?>\n<r>\n <a b=\"1\" =\"2\"/>\n</r>\n");
        if (built) {
            EXPECT_EQ(nameless->getRoot()->getChild(0)->getAttribute(1)->getName(), nullptr);
        }
        OxXmlFile::setIndent(0); // a failed write keeps the levels it opened
        // A name of its own: Windows removes no file another document holds open.
        std::string out = dir.file(built ? "built.xml" : "pending.xml");
        nameless->open(out.c_str(), OxFile::OxIOOutput);
        EXPECT_EQ(nameless->writeFile(), OxFalse);
        EXPECT_EQ(oxtest::readText(out), "<?xml version=\"1.0\"?>\n<r>\n") << built;
    }
}

TEST_F(PendingTest, XmlFirstUseThroughAMutatorOrATypedGetter) {
    // A typed getter as the first use.
    auto typed = readXml(kTag);
    OxVec3d point(9, 9, 9);
    EXPECT_EQ(typed->getRoot()->getPoint(point), OxTrue);
    EXPECT_EQ(point, OxVec3d(1, 2, 3));
    EXPECT_EQ(typed->getRoot()->isYes("x"), OxFalse);

    // addAttribute as the first use: the read ones stay in front.
    auto added = readXml(kTag);
    OxXmlElement* a = added->getRootForUpdate();
    a->setName("b"); // element setters leave the attributes pending
    a->setValue("text");
    EXPECT_EQ(a->getNbAttributes(), 4u);
    a->addAttribute(new OxXmlAttribute("w", 5));
    ASSERT_EQ(a->getNbAttributes(), 5u);
    EXPECT_STREQ(a->getAttribute(0)->getName(), "x");
    EXPECT_STREQ(a->getAttribute(3)->getName(), "vec3d");
    EXPECT_STREQ(a->getAttribute(4)->getValue(), "5");

    // reserveAttributes as the first use changes nothing that can be read.
    auto reserved = readXml(kTag);
    reserved->getRootForUpdate()->reserveAttributes(16);
    EXPECT_EQ(reserved->getRoot()->getNbAttributes(), 4u);
    EXPECT_STREQ(reserved->getRoot()->getAttribute(1)->getValue(), "two");

    // Elements of a read tree deleted with and without their attributes built.
    auto tree = readXml("<?xml version=\"1.0\"?>\n<r>\n <p i=\"1\"/>\n <p i=\"2\"/>\n</r>\n");
    OxXmlElement* r = tree->getRootForUpdate();
    EXPECT_STREQ(r->getChild(1)->getAttributeValue("i"), "2");
    EXPECT_EQ(r->deleteChildren("p"), OxTrue);
    EXPECT_EQ(r->getNbChildElements(), 0u);
}

TEST_F(PendingTest, ReadChildListsAndNamesChangeLikeAnyOther) {
    // The child lists and names of read elements live in the document's
    // store until they change; every change reads back as on a built tree.
    auto tree = readXml("<?xml version=\"1.0\"?>\n<r>\n <p i=\"1\"/>\n <q/>\n <p i=\"3\">\n"
                        "  <s/>\n </p>\n</r>\n");
    OxXmlElement* r = tree->getRootForUpdate();
    ASSERT_EQ(r->getNbChildElements(), 3u);
    EXPECT_EQ(r->getChild(2)->getNbChildElements(), 1u);
    EXPECT_EQ(r->getChild(2)->getChild(0)->getParent(), r->getChild(2));
    r->addChild(new OxXmlElement("t")); // the read list moves, in order
    ASSERT_EQ(r->getNbChildElements(), 4u);
    EXPECT_STREQ(r->getChild(1)->getName(), "q");
    EXPECT_STREQ(r->getChild(3)->getName(), "t");
    EXPECT_EQ(r->deleteChild(1), OxTrue);
    EXPECT_EQ(r->getChild(1), nullptr);
    r->getChild(0)->setName("renamed"); // a read name replaced, twice
    r->getChild(0)->setName("again");
    r->getChild(2)->getChild(0)->addChild(new OxXmlElement("u"));
    EXPECT_EQ(r->deleteChildren("p"), OxTrue);
    ASSERT_EQ(r->getNbChildElements(), 2u);
    EXPECT_STREQ(r->getChild(0)->getName(), "again");
    EXPECT_STREQ(r->getChild(1)->getName(), "t");
}

const char* const kNested = "<?xml version=\"1.0\"?>\n"
                            "<r a=\"1\">\n"
                            "<p i=\"1\" j=\"\" k=\"  \"/>\n"
                            "<!-- one\n two -->\n"
                            "<q>text</q>\n"
                            "<v a=\"1\"> two words </v>\n"
                            "<p i=\"2\">\n"
                            "<s>\n<![CDATA[ x ]]>\n</s>\n"
                            "<!DOCTYPE inner>\n"
                            "<t/>\n"
                            "</p>\n"
                            "</r>\n"
                            "<second b=\"2\"><u/></second>\n";

TEST_F(PendingTest, XmlChildrenAreBuiltOnFirstUseAndWrittenAlike) {
    // Written before anyone asked (straight from what was read), after
    // every node was asked for, and after only part of it: the same lines,
    // those of the writer for this tree.
    // (One blank per level, raw nodes at the margin.)
    const std::string expected = "<?xml version=\"1.0\"?>\n"
                                 "<r a=\"1\">\n"
                                 " <p i=\"1\" k=\"\"/>\n"
                                 "<!-- one\ntwo -->\n"
                                 " <q>text</q>\n"
                                 " <v>two words</v>\n"
                                 " <p i=\"2\">\n"
                                 "  <s>\n"
                                 "<![CDATA[ x ]]>\n"
                                 "  </s>\n"
                                 "<!DOCTYPE inner>\n"
                                 "  <t/>\n"
                                 " </p>\n"
                                 "</r>\n"
                                 "<second b=\"2\">\n"
                                 " <u/>\n"
                                 "</second>\n";
    for (int touched : {0, 1, 2}) {
        auto file = readXml(kNested);
        OxXmlElement const* r = file->getRoot();
        ASSERT_NE(r, nullptr);
        EXPECT_EQ(r->getNbChildElements(), 5u) << touched; // counted, the comment too
        if (touched == 1) { // the dump builds every node, the deepest too
            EXPECT_NE(oxtest::dumpText(*r).find("XML Element: \"t\""), std::string::npos);
        } else if (touched == 2) {
            EXPECT_STREQ(r->getChild(4)->getChild(0)->getChild(0)->getValue(), "<![CDATA[ x ]]>");
        }
        std::string out = dir.file("out" + std::to_string(touched) + ".xml");
        file->open(out.c_str(), OxFile::OxIOOutput);
        ASSERT_EQ(file->writeFile(), OxTrue) << touched;
        EXPECT_EQ(oxtest::readText(out), expected) << touched;
    }

    // Each node built once, with its parent, name, value and attributes.
    auto file = readXml(kNested);
    OxXmlElement* r = file->getRootForUpdate();
    OxXmlElement* p2 = r->getChild(4);
    ASSERT_NE(p2, nullptr);
    EXPECT_EQ(r->getChild(4), p2);
    EXPECT_EQ(p2->getParent(), r);
    EXPECT_STREQ(p2->getAttributeValue("i"), "2");
    EXPECT_EQ(r->getChild(0)->getAttributeValue("j"), nullptr);
    EXPECT_STREQ(r->getChild(0)->getAttributeValue("k"), "");
    OxXmlElement* comment = r->getChild(1);
    EXPECT_EQ(comment->getName(), nullptr);
    EXPECT_EQ(comment->getType(), OxXmlElement::XML_TYPE_COMMENT);
    EXPECT_STREQ(comment->getValue(), "<!-- one\ntwo -->"); // lines are trimmed
    EXPECT_EQ(comment->getParent(), r);
    EXPECT_STREQ(r->getChildByName("q")->getValue(), "text");
    OxXmlElement* v = r->getChild(3); // a value on its line, attributes before it
    EXPECT_STREQ(v->getValue(), "two words");
    EXPECT_STREQ(v->getAttributeValue("a"), "1");
    EXPECT_EQ(v->getNbChildElements(), 0u);
    ASSERT_EQ(p2->getNbChildElements(), 3u);
    EXPECT_EQ(p2->getChild(1)->getType(), OxXmlElement::XML_TYPE_DOCTYPE);
    EXPECT_EQ(p2->getChild(2)->getParent(), p2);
    EXPECT_EQ(r->getChildrenByName("p").getLength(), 2u);

    // Changes of a tree read but not built: in order, the read children in
    // front of the added one.
    auto other = readXml(kNested);
    OxXmlElement* top = other->getRootForUpdate();
    top->addChild(new OxXmlElement("w"));
    ASSERT_EQ(top->getNbChildElements(), 6u);
    EXPECT_STREQ(top->getChild(5)->getName(), "w");
    EXPECT_STREQ(top->getChild(2)->getName(), "q");
    auto deleted = readXml(kNested);
    EXPECT_EQ(deleted->getRootForUpdate()->deleteChild(5), OxFalse);
    EXPECT_EQ(deleted->getRootForUpdate()->deleteChildren("p"), OxTrue);
    EXPECT_EQ(deleted->getRoot()->getNbChildElements(), 3u);
    // Elements whose end tag stands right behind the start tag.
    auto empty = readXml("<?xml version=\"1.0\"?>\n<r>\n<e x=\"1\"></e>\n<f> </f>\n</r>\n");
    empty->open(dir.file("empty.xml").c_str(), OxFile::OxIOOutput);
    ASSERT_EQ(empty->writeFile(), OxTrue);
    EXPECT_EQ(oxtest::readText(dir.file("empty.xml")),
              "<?xml version=\"1.0\"?>\n<r>\n <e x=\"1\"/>\n <f/>\n</r>\n");
    ASSERT_EQ(empty->getRoot()->getNbChildElements(), 2u);
    EXPECT_STREQ(empty->getRoot()->getChild(0)->getAttributeValue("x"), "1");
    EXPECT_EQ(empty->getRoot()->getChild(1)->getValue(), nullptr);

    // Documents destroyed with their nodes never built (comment, CDATA and
    // DOCTYPE objects among them) leave nothing behind (the sanitizers tell).
    readXml(kNested);
}

TEST_F(PendingTest, CsvRecordsKeepTheirFieldsUntilAsked) {
    // White space alone is an empty value, not none; a field behind the
    // header is named by its position; names are the header's of this read.
    auto csv = readCsv("a,b,c\n 1 , ,x y,4\n,,\n,2\n");
    const OxXmlElement* root = csv->getRoot();
    ASSERT_EQ(root->getNbChildElements(), 3u);
    OxXmlElement* first = root->getChild(0);
    EXPECT_EQ(first->getNbAttributes(), 4u);
    EXPECT_EQ(root->getChild(1)->getNbAttributes(), 0u);
    EXPECT_EQ(root->getChild(1)->getAttribute(0), nullptr);
    EXPECT_EQ(root->getChild(2)->getNbAttributes(), 1u);

    // find is the first use of the records it passes.
    unsigned int at = 0;
    EXPECT_EQ(csv->find("b", "2", at), root->getChild(2));
    EXPECT_EQ(at, 2u);
    at = 0;
    EXPECT_EQ(csv->find("b", "", at), first);

    OxXmlAttribute* third = first->getAttribute(2);
    ASSERT_NE(third, nullptr);
    EXPECT_STREQ(third->getName(), "c");
    EXPECT_STREQ(third->getValue(), "x y");
    EXPECT_STREQ(first->getAttributeValue("a"), "1");
    EXPECT_STREQ(first->getAttributeValue("b"), "");
    EXPECT_STREQ(first->getAttributeValue("column3"), "4");
    EXPECT_EQ(first->getAttribute(2), third);

    // Values are edited in place (convertToCsv) and written as they stand;
    // records never touched are written from their pending fields.
    csv->convertToCsv(third, OxFalse);
    EXPECT_EQ(first->getAttributeValue("c"), third->getValue());
    csv->open(dir.file("out.csv").c_str(), OxFile::OxIOOutput);
    ASSERT_EQ(csv->writeFile(), OxTrue);
    EXPECT_EQ(oxtest::readText(dir.file("out.csv")), "a,b,c\n1,,x,y,4\n,,,\n2,,\n");
}

TEST_F(PendingTest, CsvRecordsOfManyBlocksComeBackInOrder) {
    // Short lines, far more than one slab of the store holds: the records
    // are counted and built in order across the blocks they were kept in.
    std::string table = "a,b\n";
    for (int i = 0; i < 30000; i++) {
        table += i % 7 == 3 ? ",\n" : std::to_string(i) + "," + std::to_string(2 * i) + "\n";
    }
    auto csv = readCsv(table);
    const OxXmlElement* root = csv->getRoot();
    ASSERT_EQ(root->getNbChildElements(), 30000u);
    for (unsigned int i : {0u, 3u, 9999u, 17000u, 29999u}) {
        OxXmlElement const* record = root->getChild(i);
        ASSERT_NE(record, nullptr) << i;
        EXPECT_EQ(record->getParent(), root) << i;
        if (i % 7 == 3) {
            EXPECT_EQ(record->getNbAttributes(), 0u) << i;
            continue;
        }
        EXPECT_EQ(record->getNbAttributes(), 2u) << i;
        EXPECT_EQ(std::string(record->getAttributeValue("b")), std::to_string(2 * i)) << i;
    }
}

TEST_F(PendingTest, CsvDumpOfPendingAndBuiltRecordsAgrees) {
    const std::string table = "id;name\n7;gear\n8;\n";
    auto pending = readCsv(table);
    std::string dumped = oxtest::dumpText(*pending->getRoot());

    OxXmlElement byHand("root");
    auto* r1 = new OxXmlElement("record");
    r1->addAttribute(new OxXmlAttribute("id;name", "7;gear"));
    byHand.addChild(r1);
    auto* r2 = new OxXmlElement("record");
    r2->addAttribute(new OxXmlAttribute("id;name", "8;"));
    byHand.addChild(r2);
    EXPECT_EQ(dumped, oxtest::dumpText(byHand)); // "," splits nothing here

    std::string built = oxtest::dumpText(*pending->getRoot()); // now built
    EXPECT_EQ(built, dumped);
    EXPECT_NE(std::strstr(built.c_str(), "XML Attribute: id;name=\"7;gear\""), nullptr);
}

} // namespace
