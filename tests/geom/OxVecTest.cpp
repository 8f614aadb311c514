#include "oxbase/geom/OxVec.h"
#include "oxbase/geom/OxLimits.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"
#include "oxbase/io/OxOutput.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <sstream>
#include <vector>

namespace {
const double kPi = std::acos(-1.0);

void expectVec(const OxVec4d& v, double x, double y, double z, double w) {
    EXPECT_DOUBLE_EQ(v.x, x);
    EXPECT_DOUBLE_EQ(v.y, y);
    EXPECT_DOUBLE_EQ(v.z, z);
    EXPECT_DOUBLE_EQ(v.w, w);
}
} // namespace

TEST(OxVec, ToleranceRulesOfComparison) {
    OxLimits::setEPSZero(0.0);
    OxLimits::setPtPtTol(0.0);
    EXPECT_EQ(OxVec3d(1, 2, 3) == OxVec3d(1, 2, 3 + 1e-12), 0); // exact without tolerances

    OxLimits::initTolerances();
    OxVec3d a(1, 2, 3), b(1, 2, 3 + 5e-6);
    EXPECT_EQ(a == b, 1); // within OxEPSPtPt + OxEPSZero ...
    EXPECT_EQ(a != b, 1); // ... yet different when compared exactly
    EXPECT_EQ(OxVec3d(1, 2, 3) == OxVec3d(1, 2, 3 + 2e-5), 0);
    EXPECT_EQ(OxVec2d(1, 2).equals(OxVec2d(1, 2.5), 0.5), OxTrue);
    EXPECT_EQ(OxVec2d(1, 2).equals(OxVec2d(1, 2.5), 0.49), OxFalse);
    // The 4-d difference is made Euclidean by its own weight when that passes.
    EXPECT_EQ(OxVec4d(2, 2, 2, 2).equals(OxVec4d(0, 0, 0, 1), 1.0), OxFalse);
    EXPECT_EQ(OxVec4d(2, 2, 2, 3).equals(OxVec4d(1, 1, 1, 1), 0.87), OxTrue); // (1,1,1)/2
}

TEST(OxVec, WeightedFormsAndHomogeneousOperations) {
    OxLimits::initTolerances();
    OxVec4d p(OxVec3d(1, 2, 3), 2.0);
    expectVec(p, 2, 4, 6, 2);
    OxVec3d e;
    p.getEuclidean(e);
    EXPECT_EQ(e.x, 1.0);
    EXPECT_EQ(e.z, 3.0);
    EXPECT_DOUBLE_EQ(p.length(), std::sqrt(14.0));
    expectVec(OxVec4d(OxVec3d(1, 2, 3), 1e-9), 1, 2, 3, 0);
    expectVec(OxVec4d(OxVec3d(1, 2, 3), -2.0), -2, -4, -6, -2); // |w| for construction
    OxVec4d negativeWeight(2, 4, 6, -2);
    negativeWeight.getEuclidean(e); // the weight test is signed: no division
    EXPECT_EQ(e.x, 2.0);

    expectVec(p * 0.5, 1, 2, 3, 2);
    expectVec(p / 2.0, 1, 2, 3, 1);
    OxVec4d n(1, 2, 3, 4);
    n.negate();
    expectVec(n, -1, -2, -3, 4);
    expectVec(-OxVec4d(1, 2, 3, 4), -1, -2, -3, -4);
    OxVec4d id;
    EXPECT_EQ(id.isZero(), OxTrue);
    EXPECT_EQ(id.isIdentity(), OxFalse);
    id.makeIdentity();
    EXPECT_EQ(id.isIdentity(), OxTrue);

    OxVec4d q(3, 4, 0, 1);
    q.normalize();
    expectVec(q, 0.6, 0.8, 0, 0.2);
    OxVec4d sum(2, 4, 6, 2);
    sum += OxVec3d(1, 1, 1); // Euclidean (2, 3, 4), weighted again by 2
    expectVec(sum, 4, 6, 8, 2);

    OxVec2d uv;
    OxVec3d(2, 4, 2).getEuclidean(uv);
    EXPECT_EQ(uv.x, 1.0);
    EXPECT_EQ(uv.y, 2.0);
}

TEST(OxVec, ArithmeticNormalisingAndAxes) {
    OxLimits::initTolerances();
    OxVec3d v(1, 2, 3);
    OxVec3d zero = v / 0.0;
    EXPECT_EQ(zero.isZero(), OxTrue);
    v /= 0.0;
    EXPECT_EQ(v.z, 3.0);
    EXPECT_EQ(v[7], 3.0);
    EXPECT_EQ(OxVec2d(4, 5)[3], 5.0);

    OxVec2d planar(3, 4);
    EXPECT_EQ(planar.normalize(), 5.0);
    EXPECT_DOUBLE_EQ(planar.x, 0.6);
    EXPECT_DOUBLE_EQ(planar.y, 0.8);
    OxVec3d none;
    EXPECT_EQ(none.normalize(), 0.0);

    EXPECT_EQ(OxVec3d(1, -1, 0).getClosestAxis().x, 1.0);
    EXPECT_EQ(OxVec3d(0, -2, 1).getClosestAxis().y, 1.0);
    EXPECT_EQ(OxVec3d(1, -2, -3).getClosestAxis().z, 1.0);
    EXPECT_EQ(OxVec3d().getClosestAxis().x, 1.0);
    EXPECT_EQ(OxVec2d(-3, 1).getClosestAxis().x, 1.0);

    // The cross product of normalised copies: its length is the sine.
    OxVec3d c = OxVec3d(5, 0, 0).cross(OxVec3d(3, 3, 0));
    EXPECT_DOUBLE_EQ(c.z, std::sin(kPi / 4));
    EXPECT_EQ(c.x, 0.0);

    OxVec3d g(1, 2, 3), a(1, 0, 0), b(0, 1, 0), d(0, 0, 1);
    g.setValue(g, a, b, d); // *this among the arguments
    EXPECT_EQ(g.x, 1.0);
    EXPECT_EQ(g.z, 3.0);
    OxVec2d g2(1, 2), a2(1, 0), b2(0, 1), c2(1, 1);
    g2.setValue(g2, a2, b2, c2); // 1·a + 2·b + 2·c
    EXPECT_EQ(g2.x, 3.0);
    EXPECT_EQ(g2.y, 4.0);
    OxVec3d u(1, 1, 1), w(0, 0, 2);
    EXPECT_EQ(OxVec3d(1, 0, 0).combination(2.0, 3.0, u).x, 5.0);
    EXPECT_EQ(OxVec3d(1, 0, 0).combination(2.0, 3.0, u, w).z, 8.0);

    OxVec2d r(1, 0);
    r.rotate(kPi / 2); // about the origin, counter-clockwise
    EXPECT_NEAR(r.x, 0.0, 1e-15);
    EXPECT_NEAR(r.y, 1.0, 1e-15);
}

TEST(OxVec, SegmentDistanceAndAngle) {
    OxLimits::initTolerances();
    double d = -1.0;
    short side = 9;
    std::unique_ptr<OxVec2d> foot(OxVec2d(0, 1).dist(OxVec2d(-1, 0), OxVec2d(1, 0), d, side));
    ASSERT_NE(foot, nullptr);
    EXPECT_EQ(foot->x, 0.0);
    EXPECT_EQ(foot->y, 0.0);
    EXPECT_EQ(d, 1.0);
    EXPECT_EQ(side, 0);
    EXPECT_EQ(OxVec2d(3, 4).dist(OxVec2d(-1, 0), OxVec2d(0, 0), d, side), nullptr);
    EXPECT_EQ(side, 1);
    EXPECT_EQ(d, 5.0);
    EXPECT_EQ(OxVec2d(-4, 3).dist(OxVec2d(0, 0), OxVec2d(1, 0), d, side), nullptr);
    EXPECT_EQ(side, -1);
    EXPECT_EQ(d, 5.0);
    EXPECT_EQ(OxVec2d(5, 5).dist(OxVec2d(1, 1), OxVec2d(1, 1), d, side), nullptr);
    EXPECT_EQ(side, 0);
    EXPECT_EQ(d, 0.0);

    OxVec2d origin, legB(0, 0);
    EXPECT_DOUBLE_EQ(origin.angle(OxVec2d(1, 0), legB), kPi / 2);
    OxVec3d vertex(1, 1, 1), toB(1, 1, 5);
    EXPECT_DOUBLE_EQ(vertex.angle(OxVec3d(4, 1, 1), toB), kPi / 2);
}

TEST(OxVec, FileAndTextForms) {
    oxtest::TempDir dir;
    std::string path = dir.file("vec.bin");
    {
        OxOutput out(path.c_str(), OxFile::FILE_MODE_BINARY);
        EXPECT_EQ(OxVec2d(1.0, -2.0).writeValue(out), 16);
        EXPECT_EQ(OxVec3d(0.5, 0, 1).writeValue(out), 24);
        EXPECT_EQ(OxVec4d(1, 2, 3, 4).writeValue(out), 32);
    }
    std::string bytes = oxtest::readFile(path);
    ASSERT_EQ(bytes.size(), 72u);
    // -2.0 is 0xC000000000000000 and 0.5 is 0x3FE0000000000000, big-endian.
    EXPECT_EQ(static_cast<unsigned char>(bytes[8]), 0xC0);
    EXPECT_EQ(static_cast<unsigned char>(bytes[16]), 0x3F);
    EXPECT_EQ(static_cast<unsigned char>(bytes[17]), 0xE0);

    OxInput in(path.c_str(), OxFile::FILE_MODE_BINARY);
    OxVec2d a;
    OxVec3d b;
    OxVec4d c;
    EXPECT_EQ(a.readValue(in) + b.readValue(in) + c.readValue(in), 72);
    EXPECT_EQ(a.y, -2.0);
    EXPECT_EQ(b.x, 0.5);
    EXPECT_EQ(c.w, 4.0);

    std::vector<unsigned char> buffer(bytes.begin(), bytes.end());
    OxMemory memory(buffer.data(), static_cast<unsigned int>(buffer.size()));
    OxVec2d ma;
    OxVec3d mb;
    OxVec4d mc;
    EXPECT_EQ(ma.readValue(memory) + mb.readValue(memory), 40);
    EXPECT_EQ(mb.z, 1.0);

    std::ostringstream text;
    text << OxVec3d(1, 2.5, -3) << "|" << OxVec2d(1.0 / 3.0, 0);
    EXPECT_EQ(text.str(), "                 1               2.5                -3|"
                          "      0.3333333333                 0");
}
