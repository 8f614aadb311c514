#include "oxbase/geom/OxColor.h"
#include "oxbase/geom/OxLimits.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cstring>
#include <sstream>

TEST(OxLimits, ZeroUntilInitialisedThenStoredSquares) {
    // Nothing initialises the tolerances by itself.
    EXPECT_EQ(OxLimits::OxEPSZero, 0.0);
    EXPECT_EQ(OxLimits::OxDimMod, 0.0);
    std::ostrstream before;
    OxLimits::dumpTolerances(&before);
    EXPECT_NE(oxtest::streamText(before).find("Zero tolerance = 0\n"), std::string::npos);

    OxLimits::initTolerances();
    EXPECT_EQ(OxLimits::OxEPSZero, 1e-7);
    EXPECT_EQ(OxLimits::OxEPSZeroSqr, 9.999999999999998e-15);
    EXPECT_EQ(OxLimits::OxEPSPtPtSqr, 1.0000000000000002e-10);
    EXPECT_EQ(OxLimits::OxEPSUVPtPtSqr, 1.0000000000000001e-20);
    EXPECT_EQ(OxLimits::OxEPSWeight, 1e-10);
    EXPECT_EQ(OxLimits::OxEPSKnot, 1e-10);
    EXPECT_EQ(OxLimits::OxEPSLinear, 0.001);

    OxLimits::setPtPtTol(2e-5);
    EXPECT_EQ(OxLimits::OxEPSZero, 1e-7);
    EXPECT_EQ(OxLimits::OxEPSUVPtPt, 1e-10);
    EXPECT_EQ(OxLimits::OxEPSPtPtSqr, 2e-5 * 2e-5);
    OxLimits::setEPSZero(-2.0);
    EXPECT_EQ(OxLimits::OxEPSZero, -2.0);
    EXPECT_EQ(OxLimits::OxEPSZeroSqr, 4.0);

    OxLimits::initTolerances();
    std::ostrstream report;
    OxLimits::dumpTolerances(&report);
    EXPECT_EQ(oxtest::streamText(report),
              "\n-------- Tolerances used during data translation --------\n"
              "                                   Zero tolerance = 1e-07\n"
              "       Weight tolerance for NURBS curves/surfaces = 1e-10\n"
              "Knot interval tolerance for NURBS curves/surfaces = 1e-10\n"
              "                      Point coincidence tolerance = 1e-05\n"
              "    Surface Parameter Point coincidence tolerance = 1e-10\n"
              "                        Identical curve tolerance = 0.001\n"
              "                          Maximum model dimension = 100000\n"
              "---- End of Tolerances used during data translation -----\n\n");
}

TEST(OxColor, ChannelFormsAndComparison) {
    OxColor unset;
    EXPECT_EQ(unset.isSet(), OxFalse);
    EXPECT_EQ(unset.getColor(), 0xFFFFFFu);

    OxColor packed(0xFF8001u);
    EXPECT_EQ(packed.isSet(), OxTrue);
    EXPECT_EQ(packed.getRed(), 1.0);
    EXPECT_EQ(packed.getGreen(), 128 / 255.0);
    EXPECT_EQ(packed.getBlue(), 1 / 255.0);
    EXPECT_EQ(packed.getColor(), 0xFF8001u);
    EXPECT_EQ(OxColor(0x12FF8001u).getColor(), 0xFF8001u);

    OxColor c;
    for (unsigned int v = 0; v < 256; v++) {
        c.setColor(v, 255u - v, v);
        ASSERT_EQ(c.getRedAsInt(), v);
        ASSERT_EQ(c.getGreenAsInt(), 255u - v);
        ASSERT_EQ(c.getColor(), (v << 16) | ((255u - v) << 8) | v);
    }
    c.setColor(300u, 0u, 0u);
    EXPECT_EQ(c.getRed(), 1.0);
    c.setColor(2.0, 0.5, -1.0);
    EXPECT_EQ(c.getRed(), 1.0);
    EXPECT_EQ(c.getBlue(), -1.0);
    EXPECT_EQ(c.getGreenAsInt(), 127u); // truncated, not rounded

    OxLimits::setEPSZero(0.0);
    EXPECT_EQ(OxColor(1.0, 1.0, 1.0) == OxColor(), 1); // the flag is not compared
    EXPECT_EQ(OxColor(1.0, 1.0, 1.0) != OxColor(), 0);
    OxLimits::setEPSZero(1e-7);
    EXPECT_EQ(OxColor(0.5, 0.5, 0.5) == OxColor(0.5, 0.5, 0.5 + 5e-8), 1);
    EXPECT_EQ(OxColor(0.5, 0.5, 0.5) != OxColor(0.5, 0.5, 0.5 + 2e-7), 1);
}

TEST(OxColor, TextFileAndDumpForms) {
    std::ostringstream text;
    text << OxColor(1.0, 0.5, 0.25) << "|" << OxColor();
    EXPECT_EQ(text.str(), "(1,0.5,0.25)|    Color is not set.\n");

    std::ostrstream dump;
    OxColor(1.0, 0.5, 0.25).dump(&dump);
    OxColor().dump(&dump);
    EXPECT_EQ(oxtest::streamText(dump),
              "    red: 1\n    green: 0.5\n    blue: 0.25\n    Color is not set.\n");

    oxtest::TempDir dir;
    std::string path = dir.file("color.bin");
    {
        OxOutput out(path.c_str(), OxFile::FILE_MODE_BINARY);
        OxColor color(1.0, 0.5, 0.25);
        EXPECT_EQ(color.writeValue(out), 24);
    }
    const unsigned char expected[24] = {0x3F, 0xF0, 0, 0, 0,    0,    0, 0, 0x3F, 0xE0, 0, 0,
                                        0,    0,    0, 0, 0x3F, 0xD0, 0, 0, 0,    0,    0, 0};
    std::string bytes = oxtest::readFile(path);
    ASSERT_EQ(bytes.size(), 24u);
    EXPECT_EQ(std::memcmp(bytes.data(), expected, 24), 0);

    OxInput in(path.c_str(), OxFile::FILE_MODE_BINARY);
    OxColor back;
    EXPECT_EQ(back.readValue(in), 24);
    EXPECT_EQ(back.isSet(), OxFalse); // reading leaves the flag alone
    EXPECT_EQ(back.getGreen(), 0.5);
    EXPECT_EQ(back.getBlue(), 0.25);
}
