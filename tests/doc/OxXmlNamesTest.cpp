#include "oxbase/doc/detail/OxXmlNames.h"
#include "oxbase/doc/OxXmlElement.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using namespace oxbase::detail;

TEST(OxXmlNamesTest, EqualNamesShareOneTrimmedText) {
    std::size_t before = OxXmlNames::count();
    EXPECT_EQ(OxXmlNames::acquire(nullptr), nullptr);
    EXPECT_EQ(OxXmlNames::acquire(""), nullptr);

    char const* a = OxXmlNames::acquire("  vec3d\t");
    char const* b = OxXmlNames::acquire("vec3d");
    char const* blank = OxXmlNames::acquire(" \t ");
    EXPECT_STREQ(a, "vec3d");
    EXPECT_EQ(a, b);
    ASSERT_NE(blank, nullptr);
    EXPECT_STREQ(blank, "");
    EXPECT_EQ(OxXmlNames::count(), before + 2);

    OxXmlNames::release(a);
    EXPECT_EQ(OxXmlNames::count(), before + 2); // b still uses it
    EXPECT_STREQ(b, "vec3d");
    OxXmlNames::release(b);
    OxXmlNames::release(blank);
    OxXmlNames::release(nullptr);
    EXPECT_EQ(OxXmlNames::count(), before);
}

// Many names, released in a scattered order: every name still in use is
// found again at its place (growth and removal keep the probe chains whole).
TEST(OxXmlNamesTest, ScatteredReleasesKeepTheOthersFindable) {
    std::size_t before = OxXmlNames::count();
    std::vector<char const*> names;
    for (int i = 0; i < 3000; i++) {
        names.push_back(OxXmlNames::acquire(("name" + std::to_string(i)).c_str()));
    }
    EXPECT_EQ(OxXmlNames::count(), before + 3000);
    for (int i = 0; i < 3000; i++) {
        if (i % 3 != 0) {
            OxXmlNames::release(names[i]);
        }
    }
    EXPECT_EQ(OxXmlNames::count(), before + 1000);
    for (int i = 0; i < 3000; i += 3) {
        char const* again = OxXmlNames::acquire(("name" + std::to_string(i)).c_str());
        EXPECT_EQ(again, names[i]) << i;
        EXPECT_STREQ(again, ("name" + std::to_string(i)).c_str());
        OxXmlNames::release(again);
        OxXmlNames::release(names[i]);
    }
    EXPECT_EQ(OxXmlNames::count(), before);
}

// Elements and attributes share their names but rename on their own.
TEST(OxXmlNamesTest, RenamingOneNodeLeavesTheOthers) {
    OxXmlElement first("point");
    OxXmlElement second(" point ");
    EXPECT_EQ(first.getName(), second.getName());
    first.setName("vertex");
    EXPECT_STREQ(first.getName(), "vertex");
    EXPECT_STREQ(second.getName(), "point");
    first.setName(first.getName()); // the old name is released after the new one is taken
    EXPECT_STREQ(first.getName(), "vertex");
    first.setName(nullptr);
    EXPECT_EQ(first.getName(), nullptr);

    auto* attribute = new OxXmlAttribute("point", 1);
    second.addAttribute(attribute);
    EXPECT_EQ(attribute->getName(), second.getName());

    // A derived node of another size lives on the heap, child of a pooled one.
    struct Tagged : OxXmlElement {
        using OxXmlElement::OxXmlElement;
        long tag = 7;
    };
    second.addChild(new Tagged("point"));
    EXPECT_EQ(second.getChild(0)->getName(), second.getName());
}
