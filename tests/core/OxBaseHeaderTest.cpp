// The umbrella header stands on its own and reaches every subsystem.
#include "oxbase/OxBase.h"

#include <gtest/gtest.h>

TEST(OxBaseHeader, EverySubsystemIsReachable) {
    OxGList<unsigned int> list;
    EXPECT_EQ(list.append(3u), 0u);
    OxRangeList ranges("1-3,5", "integer");
    EXPECT_EQ(ranges.isValid(), OxTrue);
    EXPECT_EQ(ranges.isInRange(2), OxTrue);
    EXPECT_EQ(OX_IDENTITY_3X3_MATRIX.isIdentity(), OxTrue);
    EXPECT_EQ(OxMatrix().det4(), 1.0);
    EXPECT_EQ((OxBBox() + OxBBox(0, 0, 0, 1, 1, 1)).isEmpty(), OxFalse);
    EXPECT_EQ(OxBSphere().isEmpty(), OxTrue);
    EXPECT_EQ(OxLine().isInfinite(), OxTrue);
    OxXmlElement element("part");
    EXPECT_EQ(element.isNamed("part"), OxTrue);
    OxCounters counters;
    counters.add("parts");
    EXPECT_EQ(counters.exists("parts"), OxTrue);
    OxGList<OxFlavorEntry*> table;
    OxFlavor flavors(table);
    EXPECT_EQ(flavors.addFlavor("none"), OxFalse);
    OxHeapInfo picture;
    EXPECT_EQ(picture.getCount(), 0u);
    char* text = OxString::toString(2.5);
    EXPECT_STREQ(text, "2.5");
    delete[] text;
}
