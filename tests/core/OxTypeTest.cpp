#include "oxbase/core/OxType.h"

#include <gtest/gtest.h>

#include <memory>

TEST(OxTypeTest, StoresBothNumbersAndDumpsNothing) {
    OxType none;
    EXPECT_EQ(none.getCADID(), 0);
    EXPECT_EQ(none.getType(), 0u);

    std::unique_ptr<OxType> tag(new OxType(static_cast<OxType::OxCADID>(-5), -1));
    EXPECT_EQ(tag->getCADID(), -5);
    EXPECT_EQ(tag->getType(), 0xffffffffu);

    std::ostrstream stream;
    stream << "kept";
    EXPECT_EQ(tag->dump(&stream), &stream);
    EXPECT_EQ(stream.pcount(), 4);
}
