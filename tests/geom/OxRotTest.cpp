#include "oxbase/geom/OxRot.h"
#include "oxbase/diag/OxMsg.h"
#include "oxbase/geom/OxLimits.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"
#include "support/OxTestSupport.h"

#include <gtest/gtest.h>

#include <cmath>
#include <sstream>
#include <string>
#include <vector>

namespace {
const double kPi = std::acos(-1.0);

/// An independent 3 × 3 product for checking.
void product(const double a[3][3], const double b[3][3], double out[3][3]) {
    for (int i = 0; i < 3; i++) {
        for (int j = 0; j < 3; j++) {
            out[i][j] = a[i][0] * b[0][j] + a[i][1] * b[1][j] + a[i][2] * b[2][j];
        }
    }
}

void collect(const char* text, void* userData) {
    static_cast<std::vector<std::string>*>(userData)->push_back(text);
}
} // namespace

TEST(OxRot, ConstructorsAgainstIndependentProducts) {
    OxLimits::initTolerances();
    OxRot turn(OxVec3d(0, 0, 2), kPi / 2);
    OxVec3d v(1, 0, 0);
    v *= turn;
    EXPECT_NEAR(v.x, 0.0, 1e-15);
    EXPECT_NEAR(v.y, -1.0, 1e-15);
    EXPECT_NEAR(v.z, 0.0, 1e-15);

    const double a = 0.3, b = 1.1, c = -0.7;
    auto zRot = [](double t, double out[3][3]) {
        const double rows[3][3] = {
            {std::cos(t), std::sin(t), 0}, {-std::sin(t), std::cos(t), 0}, {0, 0, 1}};
        std::copy(&rows[0][0], &rows[0][0] + 9, &out[0][0]);
    };
    double zb[3][3], zc[3][3], tmp[3][3], expected[3][3];
    zRot(b, zb);
    zRot(c, zc);
    const double ya[3][3] = {
        {std::cos(a), 0, -std::sin(a)}, {0, 1, 0}, {std::sin(a), 0, std::cos(a)}};
    product(zb, ya, tmp);
    product(tmp, zc, expected);
    OxRot angles(a, b, c);
    for (int i = 0; i < 3; i++) {
        for (int j = 0; j < 3; j++) {
            EXPECT_NEAR(angles.m[i][j], expected[i][j], 1e-14) << i << "," << j;
        }
    }

    OxRot same(OxVec3d(1, 0, 0), OxVec3d(1, 0, 0));
    OxRot zero;
    zero.setScale(0.0);
    EXPECT_EQ(same == zero, 1);
    OxRot axes(OxVec3d(2, 0, 0), OxVec3d(0, 3, 0));
    EXPECT_EQ(axes.isIdentity(), OxTrue);
    OxVec3d c0, c1, c2;
    OxRot rows(1, 2, 3, 4, 5, 6, 7, 8, 9);
    rows.getValue(c0, c1, c2); // columns, though rows were given
    EXPECT_EQ(c0.y, 4.0);
    EXPECT_EQ(c2.x, 3.0);
    rows.swapRows(1, 1);
    EXPECT_EQ(rows.m[1][0], 4.0);
    rows.swapColumns(0, 2);
    EXPECT_EQ(rows.m[0][0], 3.0);
    rows.transpose();
    EXPECT_EQ(rows.m[0][1], 6.0);

    OxRot nearly;
    nearly.m[1][1] = 1.0 + 1e-9;
    EXPECT_EQ(nearly.isIdentity(), OxFalse);
    EXPECT_EQ(nearly == OX_IDENTITY_3X3_MATRIX, 1);
    EXPECT_EQ(OX_IDENTITY_3X3_MATRIX.isIdentity(), OxTrue);
}

TEST(OxRot, InversionAndSingularMatrix) {
    oxtest::TempDir dir;
    oxtest::writeFile(dir.file("geom.msg"), "169,E,0singular\n");
    OxMsg msg(dir.file("geom.msg").c_str(), nullptr, nullptr, nullptr);
    std::vector<std::string> texts;
    OxMsg::setMsgCallback(collect);
    OxMsg::setMsgCallbackUserData(&texts);

    OxRot identity;
    EXPECT_EQ(identity.invert(), OxErrorNone);
    EXPECT_EQ(identity.isIdentity(), OxTrue);

    OxRot m(2, 1, 0, 1, 2, 0, 0, 0, 1);
    EXPECT_EQ(m.isOrthoNormal(), OxFalse);
    OxRot inverse;
    EXPECT_EQ(m.inverse(inverse), OxErrorNone);
    double back[3][3];
    product(m.m, inverse.m, back);
    for (int i = 0; i < 3; i++) {
        for (int j = 0; j < 3; j++) {
            EXPECT_NEAR(back[i][j], i == j ? 1.0 : 0.0, 1e-15);
        }
    }
    EXPECT_NEAR(inverse.m[0][0], 2.0 / 3.0, 1e-15);
    EXPECT_NEAR(inverse.m[0][1], -1.0 / 3.0, 1e-15);

    testing::internal::CaptureStderr();
    OxMsg::resetErrorCode();
    OxRot singular(1, 2, 3, 2, 4, 6, 1, 0, 1);
    EXPECT_EQ(singular.invert(), OxErrorError);
    testing::internal::GetCapturedStderr();
    EXPECT_EQ(texts, std::vector<std::string>{"singular"});
    EXPECT_EQ(OxMsg::getErrorCode(), OxErrorError);

    OxRot2d quarter(0, -1, 1, 0);
    EXPECT_DOUBLE_EQ(quarter.getAngle(), kPi / 2);
    EXPECT_EQ(OxRot2d(1, 1, 1, 1).getAngle(), 0.0);
    OxVec2d p(1, 0);
    p *= quarter;
    EXPECT_EQ(p.y, -1.0);
}

TEST(OxRot, TextAndFileForms) {
    std::ostringstream text;
    text << OxRot(1, 0, 0, 0, 0.5, 0, 0, 0, 1);
    EXPECT_EQ(text.str(),
              "\nNote: If the matrix is invertable, then the row vectors form an axis system.\n"
              "[            1,            0,            0\n"
              "             0,          0.5,            0\n"
              "             0,            0,            1 ]\n");
    std::ostringstream text2;
    text2 << OxRot2d(1, 2, 3, 4);
    EXPECT_EQ(text2.str(),
              "\nNote: If the matrix is invertable, then the row vectors form an axis system.\n"
              "[            1,            2\n"
              "             3,            4\n"
              " ]\n");

    oxtest::TempDir dir;
    std::string path = dir.file("rot.bin");
    OxRot source(1, 2, 3, 4, 5, 6, 7, 8, 9.5);
    {
        OxOutput out(path.c_str(), OxFile::FILE_MODE_BINARY);
        EXPECT_EQ(source.writeValue(out), 72);
        EXPECT_EQ(OxRot2d(1, 2, 3, 4).writeValue(out), 32);
    }
    std::string bytes = oxtest::readFile(path);
    ASSERT_EQ(bytes.size(), 104u);
    EXPECT_EQ(static_cast<unsigned char>(bytes[8]), 0x40); // 2.0 = 0x4000000000000000
    OxInput in(path.c_str(), OxFile::FILE_MODE_BINARY);
    OxRot back;
    OxRot2d back2;
    EXPECT_EQ(back.readValue(in), 72);
    EXPECT_EQ(back2.readValue(in), 32);
    EXPECT_EQ(back.m[2][2], 9.5);
    EXPECT_EQ(back2.m[1][0], 3.0);
}
