#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/OxLine.h"
#include "oxbase/geom/OxMatrix.h"
#include "oxbase/geom/OxPlane.h"
#include "oxbase/geom/OxRot.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <limits>
#include <memory>
#include <sstream>
#include <string>

namespace {
const double kNaN = std::numeric_limits<double>::quiet_NaN();
const double kInf = std::numeric_limits<double>::infinity();

/// The Leibniz sum over all 24 permutations, a formula independent of the
/// cofactor expansion.
double leibniz(const double (&m)[4][4]) {
    int p[4] = {0, 1, 2, 3};
    double sum = 0.0;
    do {
        int inversions = 0;
        for (int i = 0; i < 4; i++) {
            for (int j = i + 1; j < 4; j++) {
                inversions += p[i] > p[j] ? 1 : 0;
            }
        }
        double term = (inversions % 2 == 0) ? 1.0 : -1.0;
        for (int i = 0; i < 4; i++) {
            term *= m[i][p[i]];
        }
        sum += term;
    } while (std::next_permutation(p, p + 4));
    return sum;
}

std::string format(const char* pattern, double value) {
    char text[64];
    std::snprintf(text, sizeof text, pattern, value);
    return text;
}

/// A vector as OxVec3d's operator<< writes it: width 18, precision 10.
std::string vectorText(double x, double y, double z) {
    return format("%18.10g", x) + format("%18.10g", y) + format("%18.10g", z);
}

void expectVec(const OxVec3d& v, double x, double y, double z) {
    EXPECT_DOUBLE_EQ(v.x, x);
    EXPECT_DOUBLE_EQ(v.y, y);
    EXPECT_DOUBLE_EQ(v.z, z);
}

/// The outputs of an intersection or projection as one text, to 15 digits:
/// "result found (x, y, z) t". The outputs are taken by reference, so that
/// they are read after the call that fills them, which is also an argument.
std::string outcome(OxBool result, const OxBool& found, const OxVec3d& p, const double& t) {
    return std::to_string(result) + " " + std::to_string(found) + " (" + format("%.15g", p.x) +
           ", " + format("%.15g", p.y) + ", " + format("%.15g", p.z) + ") " + format("%.15g", t);
}
} // namespace

TEST(OxMatrix, DeterminantsAndSetters) {
    EXPECT_EQ(OxMatrix().det4(), 1.0);
    EXPECT_EQ(OxMatrix::identity().det3(), 1.0);
    EXPECT_EQ(OxMatrix().det3(1, 2, 3, 1, 2, 3), 1.0);
    EXPECT_EQ(OxMatrix().det3(1, 1, 3, 1, 2, 3), 0.0); // a repeated row

    const double rows[4][4] = {{1, 2, 3, 4}, {5, 6, 7, 8}, {2, 6, 4, 8}, {3, 1, 1, 2}};
    OxMatrix worked(rows);
    EXPECT_EQ(worked.det4(), 72.0);
    EXPECT_EQ(leibniz(rows), 72.0);
    const double mixed[4][4] = {{0.5, -2, 3.25, 1}, {7, 0.125, -1, 2}, {1, 1, 9, -3}, {4, 2, 0, 6}};
    EXPECT_NEAR(OxMatrix(mixed).det4(), leibniz(mixed), 1e-9);
    // Rows 1-3, columns 0, 1, 3 of `worked`, by the rule of Sarrus.
    const double sarrus = 5 * 6 * 2 + 6 * 8 * 3 + 8 * 2 * 1 - 8 * 6 * 3 - 5 * 8 * 1 - 6 * 2 * 2;
    EXPECT_EQ(worked.det3(1, 2, 3, 0, 1, 3), sarrus);
    // An index outside 0 to 3 counts by its two low bits.
    EXPECT_EQ(worked.det3(5, 6, 7, 4, 5, 7), sarrus);
    EXPECT_EQ(worked[6], worked[2]);

    OxMatrix scaled(rows);
    scaled.setScale(2.0);
    EXPECT_EQ(scaled.det4(), 8.0);
    EXPECT_EQ(scaled.det3(), 8.0);
    EXPECT_EQ(scaled[3][3], 1.0);
    scaled.setScale(1.0); // the whole matrix is overwritten
    EXPECT_EQ(scaled[0][1], 0.0);
    EXPECT_EQ(scaled[3][0], 0.0);
    scaled.setScale(OxVec3d(2, 3, 4));
    EXPECT_EQ(scaled.det4(), 24.0);

    OxMatrix moved(rows);
    moved.setTranslate(OxVec3d(7, 8, 9));
    double out[4][4];
    moved.getValue(out);
    const double translation[4][4] = {{1, 0, 0, 7}, {0, 1, 0, 8}, {0, 0, 1, 9}, {0, 0, 0, 1}};
    EXPECT_TRUE(std::equal(&out[0][0], &out[0][0] + 16, &translation[0][0]));
    EXPECT_EQ((*worked.getValue())[2][1], 6.0);
    moved = worked;
    EXPECT_EQ(moved.det4(), 72.0);
    moved.makeIdentity();
    EXPECT_EQ(moved.det4(), 1.0);
    EXPECT_EQ(OxMatrix(1, 2, 3, 4, 5, 6, 7, 8, 2, 6, 4, 8, 3, 1, 1, 2).det4(), 72.0);

    moved[1][2] = kNaN; // no failure, the arithmetic carries it
    EXPECT_TRUE(std::isnan(moved.det4()));
}

TEST(OxMatrix, TextForm) {
    OxMatrix matrix;
    matrix.setTranslate(OxVec3d(1.0 / 3.0, -2.5, 1e9));
    std::ostringstream stream;
    stream << matrix;
    std::string expected = "\n[ \n";
    for (const auto& row : matrix.m) {
        for (double element : row) {
            expected += format("%12.8g", element) + ", ";
        }
        expected += "\n";
    }
    expected += "]";
    EXPECT_EQ(stream.str(), expected);
    EXPECT_EQ(stream.precision(), 8);
    EXPECT_EQ(stream.flags() & std::ios::right, std::ios::fmtflags());
}

TEST(OxLine, ParametersAndClosestApproach) {
    OxLimits::initTolerances();
    OxLine a(OxVec3d(0, 0, 0), OxVec3d(2, 0, 0), OxLine::FINITE);
    EXPECT_EQ(a.getLength(), 2.0);
    expectVec(a.getDirection(), 1, 0, 0);
    expectVec(a.eval(1.0), 1, 0, 0);
    expectVec(a.eval(2.0), 2, 0, 0);
    EXPECT_EQ(a.isInfinite(), OxFalse);
    OxLine longer(OxVec3d(1, 1, 1), OxVec3d(4, 1, 1), OxLine::INFINITE);
    EXPECT_DOUBLE_EQ(a.dot(longer), 6.0);

    OxLine point(OxVec3d(0, 0, 0), OxVec3d(0, 0, 0), OxLine::FINITE);
    expectVec(point.getDirection(), 0, 0, 0);
    EXPECT_EQ(point.getLength(), 0.0);

    OxVec3d p(-7, -7, -7);
    double t1 = -9.0, t2 = -9.0;
    OxBool found = OxTrue;
    OxLine unit;
    EXPECT_EQ(unit.isInfinite(), OxTrue);
    // A length of 0 cannot be asked.
    EXPECT_EQ(outcome(unit.intersect(a, p, t1, t2, found), found, p, t1), "0 0 (-7, -7, -7) -9");

    OxLine cross(OxVec3d(1, -1, 0), OxVec3d(1, 1, 0), OxLine::FINITE);
    EXPECT_EQ(outcome(a.intersect(cross, p, t1, t2, found), found, p, t1), "1 1 (1, 0, 0) 0.5");
    EXPECT_DOUBLE_EQ(t2, 0.5);
    // Skew lines: halfway between the closest points.
    OxLine skew(OxVec3d(1, -1, 1), OxVec3d(1, 1, 1), OxLine::FINITE);
    EXPECT_EQ(outcome(a.intersect(skew, p, t1, t2, found), found, p, t1), "1 1 (1, 0, 0.5) 0.5");

    OxLine beyond(OxVec3d(3, -1, 0), OxVec3d(3, 1, 0), OxLine::FINITE);
    p.setValue(-7, -7, -7);
    EXPECT_EQ(a.intersect(beyond, p, t1, t2, found), OxTrue);
    EXPECT_EQ(found, OxFalse);
    expectVec(p, -7, -7, -7); // untouched
    OxLine open(OxVec3d(0, 0, 0), OxVec3d(2, 0, 0), OxLine::INFINITE);
    EXPECT_EQ(outcome(open.intersect(beyond, p, t1, t2, found), found, p, t1), "1 1 (3, 0, 0) 1.5");

    // Parallel lines, and lines of degenerate coordinates: outputs untouched.
    const OxLine degenerate[] = {
        OxLine(OxVec3d(0, 5, 0), OxVec3d(9, 5, 0), OxLine::INFINITE),
        OxLine(OxVec3d(0, 0, 0), OxVec3d(kInf, 1, 0), OxLine::INFINITE),
        OxLine(OxVec3d(kNaN, 0, 0), OxVec3d(1, 1, 0), OxLine::INFINITE),
    };
    const OxBool expected[] = {OxTrue, OxTrue, OxFalse}; // a NaN length cannot be asked
    for (int i = 0; i < 3; i++) {
        p.setValue(-7, -7, -7);
        t1 = t2 = -9.0;
        found = OxTrue;
        EXPECT_EQ(outcome(open.intersect(degenerate[i], p, t1, t2, found), found, p, t1),
                  std::to_string(expected[i]) + " 0 (-7, -7, -7) -9");
        EXPECT_EQ(t2, -9.0);
    }

    // With the tolerances still at 0.0 a zero-length line is asked, and the
    // divisions by zero give NaN rather than a trap.
    OxLimits::setEPSZero(0.0);
    OxLine stillPoint(OxVec3d(1, 1, 1), OxVec3d(1, 1, 1), OxLine::INFINITE);
    EXPECT_EQ(stillPoint.intersect(open, p, t1, t2, found), OxTrue);
    EXPECT_TRUE(std::isnan(t1));
    OxLimits::initTolerances();
}

TEST(OxLine, PlaneIntersectionAndProjection) {
    OxLimits::initTolerances();
    const OxPlane ground(OxVec3d(0, 0, 0), OxVec3d(0, 0, 1));
    OxVec3d p(-7, -7, -7);
    double t = -9.0;
    OxBool found = OxFalse;
    OxLine through(OxVec3d(0, 0, -1), OxVec3d(0, 0, 3), OxLine::FINITE);
    EXPECT_EQ(outcome(through.intersect(ground, p, t, found), found, p, t), "1 1 (0, 0, 0) 0.25");
    // Beyond the end of a finite line: t is filled in, p is not.
    OxLine above(OxVec3d(0, 0, 1), OxVec3d(0, 0, 2), OxLine::FINITE);
    p.setValue(-7, -7, -7);
    EXPECT_EQ(outcome(above.intersect(ground, p, t, found), found, p, t), "1 0 (-7, -7, -7) -1");
    OxLine aboveOpen(OxVec3d(0, 0, 1), OxVec3d(0, 0, 2), OxLine::INFINITE);
    EXPECT_EQ(outcome(aboveOpen.intersect(ground, p, t, found), found, p, t), "1 1 (0, 0, 0) -1");

    // Parallel: a line in the plane, a zero direction, a NaN coordinate.
    const OxLine parallel[] = {
        OxLine(OxVec3d(0, 0, 0), OxVec3d(1, 1, 0), OxLine::INFINITE),
        OxLine(OxVec3d(2, 2, 2), OxVec3d(2, 2, 2), OxLine::INFINITE),
        OxLine(OxVec3d(0, 0, 1), OxVec3d(0, 0, kNaN), OxLine::INFINITE),
    };
    for (OxLine line : parallel) {
        p.setValue(-7, -7, -7);
        t = -9.0;
        found = OxTrue;
        EXPECT_EQ(outcome(line.intersect(ground, p, t, found), found, p, t), "1 0 (-7, -7, -7) -9");
    }
    // A default line has a direction but no length: a non-finite t.
    OxLine unit;
    const OxPlane side(OxVec3d(1, 0, 0), OxVec3d(1, 0, 0));
    double unitT = 0.0; // infinite: compared as a number, whatever printf spells
    EXPECT_EQ(outcome(unit.intersect(side, p, unitT, found), found, p, t), "1 1 (1, 0, 0) -9");
    EXPECT_EQ(unitT, kInf);

    OxLine axis(OxVec3d(0, 0, 0), OxVec3d(4, 0, 0), OxLine::FINITE);
    EXPECT_EQ(outcome(axis.project(OxVec3d(1, 5, 0), p, t, found), found, p, t),
              "1 1 (1, 0, 0) 0.25");
    EXPECT_EQ(outcome(axis.project(OxVec3d(5, 1, 0), p, t, found), found, p, t),
              "1 0 (1, 0, 0) 1.25");

    std::ostringstream text;
    text << OxLine(OxVec3d(1.0 / 3.0, -2, 0.5), OxVec3d(1.0 / 3.0, -2, 4.5), OxLine::FINITE);
    EXPECT_EQ(text.str(), "        Position: " + vectorText(1.0 / 3.0, -2, 0.5) +
                              ", Direction : " + vectorText(0, 0, 1));
}

TEST(OxPlane, NormalsParallelismAndProjection) {
    OxLimits::initTolerances();
    OxVec3d p(3, 4, 0);
    std::unique_ptr<OxVec3d> foot(OxPlane(OxVec3d(0, 0, 2), OxVec3d(0, 0, 5)).project(p));
    expectVec(*foot, 3, 4, 2);
    expectVec(p, 3, 4, 0);
    // The foot on an oblique plane, worked by hand: n = (1, 1, 0)/√2 and
    // (p − o)·n = (2 + 4)/√2, so the foot is p − 3·(1, 1, 0).
    foot.reset(OxPlane(OxVec3d(1, 0, 0), OxVec3d(2, 2, 0)).project(p));
    EXPECT_NEAR(foot->x, 0.0, 1e-12);
    EXPECT_NEAR(foot->y, 1.0, 1e-12);
    EXPECT_EQ(foot->z, 0.0);
    // Far from the origin the foot keeps its precision.
    OxVec3d far(1e17, 0, 5);
    foot.reset(OxPlane(OxVec3d(0, 0, 0), OxVec3d(0, 0, 1)).project(far));
    expectVec(*foot, 1e17, 0, 0);
    foot.reset(OxPlane().project(p)); // a zero normal has no foot
    expectVec(*foot, 0, 0, 0);

    expectVec(OxPlane(OxVec3d(1, 2, 3), OxRot()).getNormal(), 0, 0, 1);
    OxPlane up(OxVec3d(0, 0, 0), OxVec3d(0, 0, 1));
    EXPECT_EQ(up.isParallel(OxPlane(OxVec3d(5, 5, 5), OxVec3d(0, 0, 7))), OxTrue);
    EXPECT_EQ(up.isParallel(OxPlane(OxVec3d(0, 0, 0), OxVec3d(0, 0, -1))), OxFalse);
    EXPECT_EQ(up.isParallel(OxPlane(OxVec3d(0, 0, 0), OxVec3d(0, 1, 1))), OxFalse);
    OxPlane copy;
    copy = up;
    expectVec(copy.getNormal(), 0, 0, 1);
    OxPlane unknown(OxVec3d(), OxVec3d(kNaN, 0, 0));
    EXPECT_TRUE(std::isnan(unknown.getNormal().x));
    EXPECT_TRUE(std::isnan(unknown.getNormal().z));
    foot.reset(unknown.project(p)); // no foot either
    expectVec(*foot, 0, 0, 0);
}
