#include "oxbase/doc/OxXmlAttribute.h"
#include "oxbase/core/OxString.h"
#include "oxbase/diag/OxPrt.h"
#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxRot.h"
#include "oxbase/geom/OxVec.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace {
std::string valueOf(const OxXmlAttribute& attribute) {
    return attribute.getValue() != nullptr ? attribute.getValue() : "<null>";
}

std::string numberText(double value) {
    std::unique_ptr<char[]> text(OxXmlAttribute::toString(value));
    return text ? text.get() : "<null>";
}

std::string written(const OxXmlAttribute& attribute, OxBool expected) {
    OxPrt prt;
    EXPECT_EQ(attribute.write(prt.getStr()), expected);
    std::unique_ptr<char[]> text(prt.flushToString());
    return text ? text.get() : "";
}
} // namespace

TEST(OxXmlAttributeTest, NumberTexts) {
    EXPECT_EQ(numberText(1.5), "1.5");
    EXPECT_EQ(numberText(2.0), "2.0");
    EXPECT_EQ(numberText(0.0), "0.0");
    EXPECT_EQ(numberText(-0.25), "-0.25");
    EXPECT_EQ(numberText(0.000000001), "0.000000001");
    EXPECT_EQ(numberText(0.0000000004), "0.0");
    EXPECT_EQ(numberText(-1e-12), "0.0"); // tiny values lose their sign
    EXPECT_EQ(numberText(123456.125), "123456.125");

    // The float form keeps all nine digits; the double form cuts the zeros
    // but does not round tiny values to zero.
    EXPECT_EQ(valueOf(OxXmlAttribute("f", 1.5f)), "1.500000000");
    EXPECT_EQ(valueOf(OxXmlAttribute("f", 0.5f)), "0.500000000");
    EXPECT_EQ(valueOf(OxXmlAttribute("d", 0.5)), "0.5");
    EXPECT_EQ(valueOf(OxXmlAttribute("d", -1e-12)), "-0.0");
    EXPECT_EQ(valueOf(OxXmlAttribute("d", 7.0)), "7.0");
    // Format flags of one value never reach the next.
    EXPECT_EQ(valueOf(OxXmlAttribute("i", -42)), "-42");
    EXPECT_EQ(valueOf(OxXmlAttribute("u", 4000000000u)), "4000000000");
    EXPECT_EQ(valueOf(OxXmlAttribute("c", 'x')), "x");
    EXPECT_EQ(valueOf(OxXmlAttribute("c", static_cast<unsigned char>('y'))), "y");
    EXPECT_EQ(valueOf(OxXmlAttribute("c", ' ')), ""); // trimmed to an empty value
}

TEST(OxXmlAttributeTest, ListForms) {
    OxGList<unsigned int> eleven;
    std::string elevenText;
    for (unsigned int i = 1; i <= 11; i++) {
        eleven.append(i);
        elevenText += (i > 1 ? " " : "") + std::to_string(i);
    }
    EXPECT_EQ(valueOf(OxXmlAttribute("indices", eleven)), elevenText);
    eleven.append(12);
    EXPECT_EQ(valueOf(OxXmlAttribute("indices", eleven)), elevenText + "\n 12");

    // 23 values: two full lines and one more.
    OxGList<double> doubles;
    for (int i = 0; i < 23; i++) {
        doubles.append(i + 0.5);
    }
    std::string expected;
    for (int i = 0; i < 23; i++) {
        std::string number = std::to_string(i) + ".5";
        expected += (i == 0 ? "" : (i % 11 == 0 ? "\n " : " ")) + number;
    }
    EXPECT_EQ(valueOf(OxXmlAttribute("v", doubles)), expected);

    double values[3] = {1.0, -2.5, 1e-12};
    EXPECT_EQ(valueOf(OxXmlAttribute("v", 3, values)), "1.0 -2.5 0.0");
    int ints[2] = {3, -4};
    EXPECT_EQ(valueOf(OxXmlAttribute("v", 2, ints)), "3.0 -4.0");
    OxGList<unsigned int> three;
    three.append(3);
    EXPECT_EQ(valueOf(OxXmlAttribute("v", three)), "3");

    EXPECT_EQ(OxXmlAttribute("v", OxGList<double>()).getValue(), nullptr);
    EXPECT_EQ(OxXmlAttribute("v", 0, values).getValue(), nullptr);
    EXPECT_EQ(OxXmlAttribute("v", 3, static_cast<double*>(nullptr)).getValue(), nullptr);
    EXPECT_EQ(OxXmlAttribute("v", 3, static_cast<int*>(nullptr)).getValue(), nullptr);
}

TEST(OxXmlAttributeTest, GeometryForms) {
    EXPECT_EQ(valueOf(OxXmlAttribute("vec2d", OxVec2d(1.0, -0.5))), "1.0 -0.5");
    EXPECT_EQ(valueOf(OxXmlAttribute("vec3d", OxVec3d(1.0, 2.5, -3.0))), "1.0 2.5 -3.0");
    EXPECT_EQ(valueOf(OxXmlAttribute("vec4d", OxVec4d(0.0, 1.0, 2.0, 0.125))), "0.0 1.0 2.0 0.125");
    EXPECT_EQ(valueOf(OxXmlAttribute("color", OxColor(0.5, 0.25, 1.0))), "0.5 0.25 1.0");
    OxRot rotation;
    EXPECT_EQ(valueOf(OxXmlAttribute("matrix", rotation)), "1.0 0.0 0.0 0.0 1.0 0.0 0.0 0.0 1.0");
}

TEST(OxXmlAttributeTest, TrimmingSettingAndWriting) {
    OxXmlAttribute trimmed(" a ", "\tb\n");
    EXPECT_STREQ(trimmed.getName(), "a");
    EXPECT_STREQ(trimmed.getValue(), "b");
    EXPECT_EQ(trimmed.getType(), OxXmlAttribute::OX_XML_ATTRIBUTE_TEXT);

    OxXmlAttribute blanks("a", "   ");
    EXPECT_STREQ(blanks.getValue(), "");
    EXPECT_EQ(written(blanks, OxTrue), " a=\"\"");

    OxXmlAttribute empty("a", "");
    EXPECT_EQ(empty.getValue(), nullptr);
    EXPECT_EQ(written(empty, OxTrue), "");
    EXPECT_EQ(written(OxXmlAttribute("a", static_cast<const char*>(nullptr)), OxTrue), "");
    EXPECT_EQ(OxXmlAttribute("a", static_cast<const OxString*>(nullptr)).getValue(), nullptr);
    OxString text("  s  ");
    EXPECT_STREQ(OxXmlAttribute("a", &text).getValue(), "s");

    OxXmlAttribute nameless(static_cast<const char*>(nullptr), "v");
    EXPECT_EQ(written(nameless, OxFalse), "");
    OxXmlAttribute emptyName("", "v");
    EXPECT_EQ(emptyName.getName(), nullptr);

    // Nothing is escaped.
    EXPECT_EQ(written(OxXmlAttribute("q", "say \"x\" & <y>"), OxTrue), " q=\"say \"x\" & <y>\"");

    OxXmlAttribute changing("a", "1");
    changing.setValue(" \t ");
    EXPECT_STREQ(changing.getValue(), "");
    changing.setValue("");
    EXPECT_EQ(changing.getValue(), nullptr);
    changing.setValue(" 2 3 ");
    EXPECT_STREQ(changing.getValue(), "2 3");
    changing.getValueForUpdate()[1] = ',';
    EXPECT_STREQ(changing.getValue(), "2,3");
}

TEST(OxXmlAttributeTest, Dump) {
    OxPrt prt;
    OxPrt::setIndent(0);
    OxXmlAttribute("a", "b").dump(prt.getStr());
    OxXmlAttribute("n").dump(prt.getStr());
    OxXmlAttribute(static_cast<const char*>(nullptr), "v").dump(prt.getStr());
    OxPrt::setIndent(3);
    OxXmlAttribute("c", "d").dump(prt.getStr());
    OxPrt::setIndent(0);
    std::unique_ptr<char[]> text(prt.flushToString());
    EXPECT_STREQ(text.get(), " XML Attribute: a=\"b\"\n"
                             " XML Attribute: n<unknown>\n"
                             "    XML Attribute: c=\"d\"\n");
}
