#include "oxbase/doc/OxXmlElement.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxVec.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace {
/// An element with one attribute `name`="value".
std::unique_ptr<OxXmlElement> withAttribute(const char* name, const char* value) {
    auto element = std::make_unique<OxXmlElement>("e");
    element->addAttribute(new OxXmlAttribute(name, value));
    return element;
}

std::unique_ptr<OxXmlElement> threeChildren() {
    auto parent = std::make_unique<OxXmlElement>("p");
    const char* names[3] = {"a", "b", "a"};
    for (const char* name : names) {
        OxXmlElement* child = new OxXmlElement(name);
        parent->addChild(child);
        child->setParent(parent.get());
    }
    return parent;
}
} // namespace

TEST(OxXmlElementTest, DeletingChildren) {
    OxXmlElement lonely("x");
    EXPECT_EQ(lonely.deleteChild(0), OxTrue); // no children at all
    EXPECT_EQ(lonely.deleteChildren("x"), OxTrue);

    auto parent = threeChildren();
    EXPECT_EQ(parent->deleteChild(3), OxFalse);
    EXPECT_EQ(parent->deleteChild(1), OxTrue);
    EXPECT_EQ(parent->getNbChildElements(), 3u);
    EXPECT_EQ(parent->getChild(1), nullptr);
    EXPECT_EQ(parent->deleteChild(1), OxTrue); // a null slot
    EXPECT_EQ(parent->getChild(3), nullptr);
    EXPECT_EQ(parent->deleteChildren(nullptr), OxTrue);
    EXPECT_EQ(parent->getNbChildElements(), 3u);

    // A name without a match still closes up the null slot.
    EXPECT_EQ(parent->deleteChildren("zzz"), OxTrue);
    ASSERT_EQ(parent->getNbChildElements(), 2u);
    EXPECT_TRUE(parent->getChild(0)->isNamed("a"));
    EXPECT_TRUE(parent->getChild(1)->isNamed("a"));
    EXPECT_EQ(parent->deleteChildren("a"), OxTrue);
    EXPECT_EQ(parent->getNbChildElements(), 0u);
}

TEST(OxXmlElementTest, LookupsByName) {
    auto parent = threeChildren();
    parent->reserveAttributes(0); // room only: nothing to read yet
    EXPECT_EQ(parent->getNbAttributes(), 0u);
    EXPECT_EQ(parent->getAttribute(0), nullptr);
    parent->addChild(nullptr); // null slots are skipped everywhere
    parent->addAttribute(nullptr);
    parent->addAttribute(new OxXmlAttribute(static_cast<const char*>(nullptr), "x"));
    parent->addAttribute(new OxXmlAttribute("Flag", "yes"));
    parent->reserveAttributes(9);
    parent->addAttribute(new OxXmlAttribute("flag", " yes "));
    parent->addAttribute(new OxXmlAttribute("flag", "no"));
    parent->addAttribute(new OxXmlAttribute("other", "Yes"));

    EXPECT_EQ(parent->getNbAttributes(), 6u);
    EXPECT_EQ(parent->getAttribute(0), nullptr);
    EXPECT_EQ(parent->getAttribute(6), nullptr);
    EXPECT_STREQ(parent->getAttributeValue("flag"), "yes"); // the first match, trimmed
    EXPECT_EQ(parent->getAttributeByName(nullptr), nullptr);
    EXPECT_EQ(parent->getAttributeValue("FLAG"), nullptr);
    EXPECT_EQ(parent->isYes("flag"), OxTrue);
    EXPECT_EQ(parent->isYes("Flag"), OxTrue);
    EXPECT_EQ(parent->isYes("other"), OxFalse);
    EXPECT_EQ(parent->isYes("missing"), OxFalse);
    EXPECT_EQ(parent->isYes(nullptr), OxFalse);

    EXPECT_EQ(parent->getChildByName("b"), parent->getChild(1));
    EXPECT_EQ(parent->getChildByName("c"), nullptr);
    OxGList<OxXmlElement const*> as = parent->getChildrenByName("a");
    ASSERT_EQ(as.getLength(), 2u);
    EXPECT_EQ(as[0], parent->getChild(0));
    EXPECT_EQ(as[1], parent->getChild(2));
    EXPECT_EQ(parent->getChildrenByName("c").getLength(), 0u);
    EXPECT_EQ(parent->getChildrenByName(nullptr).getLength(), 0u);
    EXPECT_EQ(parent->getChild(1)->getParent(), parent.get());

    OxXmlElement nameless(OxXmlElement::XML_TYPE_COMMENT, nullptr);
    EXPECT_EQ(nameless.isNamed(nullptr), OxFalse);
    EXPECT_EQ(nameless.getType(), OxXmlElement::XML_TYPE_COMMENT);
    EXPECT_EQ(OxXmlElement("x").getType(), OxXmlElement::XML_TYPE_ELEMENT);

    OxXmlElement element(" n ");
    EXPECT_STREQ(element.getName(), "n");
    element.setValue(" v ");
    EXPECT_STREQ(element.getValue(), "v");
    element.setValue("");
    EXPECT_EQ(element.getValue(), nullptr);
    element.setXsiType("t");
    EXPECT_STREQ(element.getXsiType(), "t");
    element.setName(nullptr);
    EXPECT_EQ(element.getName(), nullptr);
}

TEST(OxXmlElementTest, PointsAndColours) {
    OxVec3d p(9.0, 9.0, 9.0);
    EXPECT_EQ(OxXmlElement("e").getPoint(p), OxTrue); // missing: untouched
    EXPECT_EQ(p[0], 9.0);
    EXPECT_EQ(withAttribute("vec3d", "1 2")->getPoint(p), OxFalse);
    EXPECT_EQ(p[0], 9.0);
    EXPECT_EQ(withAttribute("vec3d", "1,2,3")->getPoint(p), OxFalse);
    EXPECT_EQ(withAttribute("vec3d", "1 2 3 4")->getPoint(p), OxTrue);
    EXPECT_EQ((std::vector<double>{p[0], p[1], p[2]}), (std::vector<double>{1, 2, 3}));
    EXPECT_EQ(withAttribute("vec3d", "1\t2  x3")->getPoint(p), OxTrue); // no number counts 0
    EXPECT_EQ(p[2], 0.0);
    EXPECT_EQ(withAttribute("vec3d", "   ")->getPoint(p), OxFalse); // empty value: no copy
    EXPECT_EQ(withAttribute("at", "1 2 3")->getPoint(nullptr, p), OxFalse);

    OxVec2d q;
    EXPECT_EQ(withAttribute("vec2d", "0.5 -1.5e1")->getPoint(q), OxTrue);
    EXPECT_EQ((std::vector<double>{q[0], q[1]}), (std::vector<double>{0.5, -15.0}));
    OxVec4d r;
    EXPECT_EQ(withAttribute("vec4d", "1 2 3")->getPoint(r), OxFalse);
    EXPECT_EQ(withAttribute("w", "1 2 3 4")->getPoint("w", r), OxTrue);
    EXPECT_EQ(r[3], 4.0);

    OxColor color(0.0, 0.0, 0.0);
    EXPECT_EQ(withAttribute("color", "0.5 0.25 1 7")->getColor(color), OxTrue);
    double red = 0, green = 0, blue = 0;
    color.getColor(red, green, blue);
    EXPECT_EQ((std::vector<double>{red, green, blue}), (std::vector<double>{0.5, 0.25, 1.0}));
}
TEST(OxXmlElementTest, IndexLists) {
    // The list form with its line end, and the int array form.
    auto element = std::make_unique<OxXmlElement>("e");
    int numbers[13];
    for (int i = 0; i < 13; i++) {
        numbers[i] = 100 + i;
    }
    element->addAttribute(new OxXmlAttribute("indices", 13, numbers));
    OxGList<unsigned int> indices;
    indices.append(7);
    EXPECT_EQ(element->getIndices(&indices), OxTrue);
    ASSERT_EQ(indices.getLength(), 14u);
    EXPECT_EQ(indices[0], 7u);
    for (unsigned int i = 0; i < 13; i++) {
        EXPECT_EQ(indices[i + 1], 100 + i);
    }
    EXPECT_EQ(element->getIndices(nullptr), OxTrue);
    EXPECT_EQ(withAttribute("indices", "")->getIndices(&indices), OxTrue); // no value
    EXPECT_EQ(withAttribute("indices", " \t ")->getIndices(&indices), OxFalse);
    EXPECT_EQ(indices.getLength(), 14u);
}

TEST(OxXmlElementTest, DumpText) {
    OxXmlElement root("r");
    root.setXsiType("T");
    root.addAttribute(new OxXmlAttribute("id", 7));
    root.addAttribute(nullptr);
    OxXmlElement* child = new OxXmlElement("c");
    child->setValue("x");
    root.addChild(nullptr);
    root.addChild(child);
    OxXmlElement* comment = new OxXmlElement(OxXmlElement::XML_TYPE_COMMENT, nullptr);
    comment->setValue("<!-- n -->");
    child->addChild(comment);

    OxPrt prt;
    OxPrt::setIndent(0);
    root.dump(prt.getStr());
    OxXmlElement(static_cast<const char*>(nullptr)).dump(prt.getStr()); // nothing at all
    std::unique_ptr<char[]> text(prt.flushToString());
    EXPECT_STREQ(text.get(), " XML Element: \"r\"\n"
                             " xsi:type : T\n"
                             "   attribute[0]:\n"
                             "   XML Attribute: id=\"7\"\n"
                             "   child[1]:\n"
                             "   XML Element: \"c\"=\"x\"\n"
                             "     child[0]:\n"
                             "<!-- n -->\n");
    EXPECT_EQ(OxPrt::getIndent(), 0);
}

namespace {
/// An element that counts its destructions.
class Counted : public OxXmlElement {
public:
    explicit Counted(const char* name) : OxXmlElement(name) { alive++; }
    ~Counted() override { alive--; }
    Counted(const Counted&) = delete;
    Counted& operator=(const Counted&) = delete;
    static int alive;
};
int Counted::alive = 0;
} // namespace

TEST(OxXmlElementTree, EveryElementOfAWideDeepTreeIsDestroyedOnce) {
    // 70 levels (beyond what the destructor keeps on its own stack), each
    // with a leaf, a null slot and a subtree; some levels of mixed kinds.
    {
        auto root = std::make_unique<OxXmlElement>("root");
        OxXmlElement* level = root.get();
        for (int depth = 0; depth < 70; depth++) {
            OxXmlElement* leaf = depth % 3 == 0 ? new Counted("leaf") : new OxXmlElement("leaf");
            level->addChild(leaf);
            level->addChild(new Counted("gone"));
            level->deleteChild(level->getNbChildElements() - 1);
            OxXmlElement* next = new Counted("level");
            level->addChild(next);
            next->setParent(level);
            next->addChild(new Counted("side"));
            level = next;
        }
        EXPECT_EQ(Counted::alive, 24 + 70 + 70);
    }
    EXPECT_EQ(Counted::alive, 0);
}
