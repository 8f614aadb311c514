#include "oxbase/geom/OxMatrix.h"

#include "oxbase/geom/OxVec.h"
#include "oxbase/geom/detail/OxGeomDetail.h"

#include <iomanip>

using namespace oxbase::detail;

OxMatrix::OxMatrix() {
    oxbase::detail::setIdentity<4>(m);
}

OxMatrix::OxMatrix(double const (&values)[4][4]) {
    oxbase::detail::copyMatrix<4>(m, values);
}

OxMatrix::OxMatrix(double m00, double m01, double m02, double m03, double m10, double m11,
                   double m12, double m13, double m20, double m21, double m22, double m23,
                   double m30, double m31, double m32, double m33)
    : m{{m00, m01, m02, m03}, {m10, m11, m12, m13}, {m20, m21, m22, m23}, {m30, m31, m32, m33}} {}

const OxMatrix& OxMatrix::operator=(const OxMatrix& other) {
    if (this != &other) {
        oxbase::detail::copyMatrix<4>(m, other.m);
    }
    return *this;
}

OxMatrix OxMatrix::identity() {
    return OxMatrix();
}

void OxMatrix::makeIdentity() {
    oxbase::detail::setIdentity<4>(m);
}

void OxMatrix::setValue(double const (&values)[4][4]) {
    oxbase::detail::copyMatrix<4>(m, values);
}

void OxMatrix::getValue(double (&values)[4][4]) const {
    oxbase::detail::copyMatrix<4>(values, m);
}

void OxMatrix::setScale(double s) {
    const double diagonal[4] = {s, s, s, 1.0};
    oxbase::detail::scaleMatrix<4>(m, diagonal);
}

void OxMatrix::setScale(OxVec3d const& v) {
    const double diagonal[4] = {v.x, v.y, v.z, 1.0};
    oxbase::detail::scaleMatrix<4>(m, diagonal);
}

void OxMatrix::setTranslate(OxVec3d const& v) {
    oxbase::detail::setIdentity<4>(m);
    m[0][3] = v.x;
    m[1][3] = v.y;
    m[2][3] = v.z;
}

double OxMatrix::det3() const {
    return det3(0, 1, 2, 0, 1, 2);
}

double OxMatrix::det3(int r1, int r2, int r3, int c1, int c2, int c3) const {
    const double* a = (*this)[r1];
    const double* b = (*this)[r2];
    const double* c = (*this)[r3];
    c1 &= 3;
    c2 &= 3;
    c3 &= 3;
    return a[c1] * (b[c2] * c[c3] - b[c3] * c[c2]) - a[c2] * (b[c1] * c[c3] - c[c1] * b[c3]) +
           a[c3] * (b[c1] * c[c2] - c[c1] * b[c2]);
}

double OxMatrix::det4() const {
    return m[0][0] * det3(1, 2, 3, 1, 2, 3) - m[0][1] * det3(1, 2, 3, 0, 2, 3) +
           m[0][2] * det3(1, 2, 3, 0, 1, 3) - m[0][3] * det3(1, 2, 3, 0, 1, 2);
}

std::ostream& operator<<(std::ostream& stream, const OxMatrix& matrix) {
    stream << "\n"
           << "[ "
           << "\n";
    stream.setf(std::ios::right);
    for (const auto& row : matrix.m) {
        stream << std::setprecision(8);
        for (double element : row) {
            stream << std::setw(12) << element << ", ";
        }
        stream << "\n";
    }
    stream.unsetf(std::ios::right);
    stream << "]";
    return stream;
}
