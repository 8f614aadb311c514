#include "oxbase/geom/OxRot.h"

#include "oxbase/diag/OxMsg.h"
#include "oxbase/diag/OxMsgNumbers.h"
#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/detail/OxGeomDetail.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <cmath>
#include <iomanip>
#include <utility>

using namespace oxbase::detail;

// OxRot and OxRot2d differ only in their dimension; the helpers below, and
// those of OxGeomDetail.h, serve both through their row arrays.
namespace {

constexpr double kFixedTolerance = 1e-5;

template <int N> bool exactIdentity(double const (&m)[N][N]) {
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            if (m[i][j] != (i == j ? 1.0 : 0.0)) {
                return false;
            }
        }
    }
    return true;
}

template <int N> void transposeMatrix(double (&m)[N][N]) {
    for (int i = 0; i < N; i++) {
        for (int j = i + 1; j < N; j++) {
            std::swap(m[i][j], m[j][i]);
        }
    }
}

template <int N> void swapMatrixRows(double (&m)[N][N], unsigned int a, unsigned int b) {
    if (a == b) {
        return;
    }
    for (int j = 0; j < N; j++) {
        std::swap(m[a][j], m[b][j]);
    }
}

template <int N> void swapMatrixColumns(double (&m)[N][N], unsigned int a, unsigned int b) {
    if (a == b) {
        return;
    }
    for (int i = 0; i < N; i++) {
        std::swap(m[i][a], m[i][b]);
    }
}

template <int N>
void multiply(double (&out)[N][N], double const (&a)[N][N], double const (&b)[N][N]) {
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            double sum = 0.0;
            for (int k = 0; k < N; k++) {
                sum += a[i][k] * b[k][j];
            }
            out[i][j] = sum;
        }
    }
}

template <int N> int withinTolerance(double const (&a)[N][N], double const (&b)[N][N]) {
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            if (!(std::fabs(a[i][j] - b[i][j]) <= kFixedTolerance)) {
                return 0;
            }
        }
    }
    return 1;
}

template <int N> long long readMatrix(double (&m)[N][N], OxInput& input) {
    long long total = 0;
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            total += input.read(m[i][j]);
        }
    }
    return total;
}

template <int N> long long writeMatrix(double const (&m)[N][N], OxOutput& output) {
    long long written = 0;
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            if (output.write(m[i][j]) == OxFalse) {
                return written;
            }
            written += 8;
        }
    }
    return written;
}

template <int N>
std::ostream& printMatrix(std::ostream& stream, double const (&m)[N][N], bool lastLineEnd) {
    stream << "\n"
           << "Note: If the matrix is invertable, then the row vectors form an axis system."
           << "\n"
           << "[ ";
    stream.setf(std::ios::right);
    for (int i = 0; i < N; i++) {
        if (i > 0) {
            stream << "  ";
        }
        stream << std::setprecision(8);
        for (int j = 0; j < N; j++) {
            if (j > 0) {
                stream << ", ";
            }
            stream << std::setw(12) << m[i][j];
        }
        if (i < N - 1 || lastLineEnd) {
            stream << "\n";
        }
    }
    stream.unsetf(std::ios::right);
    stream << " ]"
           << "\n";
    return stream;
}
} // namespace

// ---------------------------------------------------------------------------
// OxRot

OxRot::OxRot() {
    setIdentity<3>(m);
}
OxRot::OxRot(double const (&values)[3][3]) {
    copyMatrix<3>(m, values);
}
OxRot::OxRot(double m00, double m01, double m02, double m10, double m11, double m12, double m20,
             double m21, double m22) {
    setValue(m00, m01, m02, m10, m11, m12, m20, m21, m22);
}

const OxRot& OxRot::operator=(const OxRot& other) {
    if (this != &other) {
        copyMatrix<3>(m, other.m);
    }
    return *this;
}

OxRot::OxRot(OxVec3d axis, double angle) {
    axis.normalize();
    double x = axis.x, y = axis.y, z = axis.z;
    double c = std::cos(angle), s = std::sin(angle), t = 1.0 - c;
    setValue((1 - x * x) * c + x * x, t * x * y - s * z, t * x * z + s * y, //
             t * x * y + s * z, (1 - y * y) * c + y * y, t * y * z - s * x, //
             t * x * z - s * y, t * y * z + s * x, (1 - z * z) * c + z * z);
}

OxRot::OxRot(double a, double b, double c) {
    double ca = std::cos(a), sa = std::sin(a);
    double cb = std::cos(b), sb = std::sin(b);
    double cc = std::cos(c), sc = std::sin(c);
    setValue(cc * ca * cb - sb * sc, sc * ca * cb + sb * cc, -cb * sa, //
             -cb * sc - cc * ca * sb, cb * cc - sc * ca * sb, sb * sa, //
             cc * sa, sc * sa, ca);
}

OxRot::OxRot(OxVec3d const& u, OxVec3d const& v) {
    if (std::fabs(u.dot(v) - 1.0) <= kFixedTolerance) {
        setScale(0.0);
        return;
    }
    OxVec3d row0(u), row1(v);
    row0.normalize();
    row1.normalize();
    OxVec3d row2 = row0.cross(row1);
    setRow(0, row0);
    setRow(1, row1);
    setRow(2, row2);
}

OxRot OxRot::identity() {
    return OxRot();
}
void OxRot::makeIdentity() {
    setIdentity<3>(m);
}

void OxRot::setValue(double m00, double m01, double m02, double m10, double m11, double m12,
                     double m20, double m21, double m22) {
    const double rows[3][3] = {{m00, m01, m02}, {m10, m11, m12}, {m20, m21, m22}};
    copyMatrix<3>(m, rows);
}
void OxRot::setValue(double const (*values)[3][3]) {
    copyMatrix<3>(m, *values);
}
void OxRot::setValue(double const (*const rows)[3]) {
    for (int i = 0; i < 3; i++) {
        for (int j = 0; j < 3; j++) {
            m[i][j] = rows[i][j];
        }
    }
}
void OxRot::getValue(double (&values)[3][3]) const {
    copyMatrix<3>(values, m);
}

void OxRot::getValue(OxVec3d& c0, OxVec3d& c1, OxVec3d& c2) const {
    getColumn(0, c0);
    getColumn(1, c1);
    getColumn(2, c2);
}
void OxRot::getRow(unsigned int i, OxVec3d& row) const {
    row.setValue(m[i][0], m[i][1], m[i][2]);
}
void OxRot::getColumn(unsigned int j, OxVec3d& column) const {
    column.setValue(m[0][j], m[1][j], m[2][j]);
}
void OxRot::setRow(unsigned int i, OxVec3d& row) {
    m[i][0] = row.x;
    m[i][1] = row.y;
    m[i][2] = row.z;
}
void OxRot::setColumn(unsigned int j, OxVec3d& column) {
    m[0][j] = column.x;
    m[1][j] = column.y;
    m[2][j] = column.z;
}

void OxRot::setScale(double s) {
    const double diagonal[3] = {s, s, s};
    scaleMatrix<3>(m, diagonal);
}
void OxRot::setScale(OxVec3d const& v) {
    const double diagonal[3] = {v.x, v.y, v.z};
    scaleMatrix<3>(m, diagonal);
}
void OxRot::swapRows(unsigned int a, unsigned int b) {
    swapMatrixRows<3>(m, a, b);
}
void OxRot::swapColumns(unsigned int a, unsigned int b) {
    swapMatrixColumns<3>(m, a, b);
}
void OxRot::transpose() {
    transposeMatrix<3>(m);
}
OxBool OxRot::isIdentity() const {
    return OxToBool(exactIdentity<3>(m));
}

OxBool OxRot::isOrthoNormal() {
    OxVec3d c[3];
    getValue(c[0], c[1], c[2]);
    for (OxVec3d& column : c) {
        column.normalize();
    }
    return OxToBool(c[1].dot(c[0]) <= kFixedTolerance && c[2].dot(c[0]) <= kFixedTolerance &&
                    c[2].dot(c[1]) <= kFixedTolerance);
}

OxErrorCode OxRot::invert() {
    if (isOrthoNormal() == OxTrue) {
        transpose();
        return OxErrorNone;
    }
    OxRot work(*this);
    makeIdentity();
    for (int i = 0; i < 3; i++) {
        int pivot = i;
        for (int r = i + 1; r < 3; r++) {
            if (std::fabs(work.m[r][i]) > std::fabs(work.m[pivot][i])) {
                pivot = r;
            }
        }
        if (pivot != i) {
            work.swapRows(static_cast<unsigned int>(pivot), static_cast<unsigned int>(i));
            swapRows(static_cast<unsigned int>(pivot), static_cast<unsigned int>(i));
        }
        double divisor = work.m[i][i];
        if (divisor == 0.0) {
            OxMsg::Log(OxMsgMatrixSingular);
            return OxErrorError;
        }
        for (int j = 0; j < 3; j++) {
            work.m[i][j] /= divisor;
            m[i][j] /= divisor;
        }
        for (int k = 0; k < 3; k++) {
            if (k == i) {
                continue;
            }
            double f = work.m[k][i];
            for (int j = 0; j < 3; j++) {
                work.m[k][j] -= f * work.m[i][j];
                m[k][j] -= f * m[i][j];
            }
        }
    }
    return OxErrorNone;
}

OxErrorCode OxRot::inverse(OxRot& result) const {
    if (&result != this) {
        result = *this;
    }
    return result.invert();
}

void OxRot::getAngles(double& a, double& b, double& c) const {
    const double pi = std::acos(-1.0);
    double d = 2.0 * std::sin(std::acos(m[0][0] + m[1][1] + m[2][2] - 1.0) / 2.0);
    if (std::fabs(d) > OxLimits::OxEPSZero) {
        a = (m[1][2] - m[2][1]) / d;
        b = (m[2][0] - m[0][2]) / d;
        c = (m[0][1] - m[1][0]) / d;
    } else {
        a = b = c = 0.0; // also for an undefined arc cosine (NaN fails the test)
    }
    for (double* angle : {&a, &b, &c}) {
        if (*angle <= OxLimits::OxEPSZero - pi) {
            *angle += pi / 2.0;
        }
    }
}

long long OxRot::readValue(OxInput& input) {
    return readMatrix<3>(m, input);
}
long long OxRot::writeValue(OxOutput& output) const {
    return writeMatrix<3>(m, output);
}

OxRot operator*(const OxRot& a, const OxRot& b) {
    OxRot product;
    multiply<3>(product.m, a.m, b.m);
    return product;
}
int operator==(const OxRot& a, const OxRot& b) {
    return withinTolerance<3>(a.m, b.m);
}
int operator!=(const OxRot& a, const OxRot& b) {
    return withinTolerance<3>(a.m, b.m) ? 0 : 1;
}
std::ostream& operator<<(std::ostream& s, const OxRot& r) {
    return printMatrix<3>(s, r.m, false);
}

// ---------------------------------------------------------------------------
// OxRot2d

OxRot2d::OxRot2d() {
    setIdentity<2>(m);
}
OxRot2d::OxRot2d(double const (&values)[2][2]) {
    copyMatrix<2>(m, values);
}
OxRot2d::OxRot2d(double m00, double m01, double m10, double m11) {
    setValue(m00, m01, m10, m11);
}

const OxRot2d& OxRot2d::operator=(const OxRot2d& other) {
    if (this != &other) {
        copyMatrix<2>(m, other.m);
    }
    return *this;
}

OxRot2d OxRot2d::identity() {
    return OxRot2d();
}
void OxRot2d::makeIdentity() {
    setIdentity<2>(m);
}
void OxRot2d::setValue(double m00, double m01, double m10, double m11) {
    const double rows[2][2] = {{m00, m01}, {m10, m11}};
    copyMatrix<2>(m, rows);
}
void OxRot2d::setValue(double const (*values)[2][2]) {
    copyMatrix<2>(m, *values);
}
void OxRot2d::setValue(double const (*const rows)[2]) {
    setValue(rows[0][0], rows[0][1], rows[1][0], rows[1][1]);
}
void OxRot2d::getValue(double (&values)[2][2]) const {
    copyMatrix<2>(values, m);
}
void OxRot2d::getValue(OxVec2d& c0, OxVec2d& c1) const {
    getColumn(0, c0);
    getColumn(1, c1);
}
void OxRot2d::getRow(unsigned int i, OxVec2d& row) const {
    row.setValue(m[i][0], m[i][1]);
}
void OxRot2d::getColumn(unsigned int j, OxVec2d& column) const {
    column.setValue(m[0][j], m[1][j]);
}
void OxRot2d::setRow(unsigned int i, OxVec2d& row) {
    m[i][0] = row.x;
    m[i][1] = row.y;
}
void OxRot2d::setColumn(unsigned int j, OxVec2d& column) {
    m[0][j] = column.x;
    m[1][j] = column.y;
}
void OxRot2d::setScale(double s) {
    const double diagonal[2] = {s, s};
    scaleMatrix<2>(m, diagonal);
}
void OxRot2d::setScale(OxVec2d const& v) {
    const double diagonal[2] = {v.x, v.y};
    scaleMatrix<2>(m, diagonal);
}
void OxRot2d::swapRows(unsigned int a, unsigned int b) {
    swapMatrixRows<2>(m, a, b);
}
void OxRot2d::swapColumns(unsigned int a, unsigned int b) {
    swapMatrixColumns<2>(m, a, b);
}
void OxRot2d::transpose() {
    transposeMatrix<2>(m);
}
OxBool OxRot2d::isIdentity() const {
    return OxToBool(exactIdentity<2>(m));
}

OxBool OxRot2d::isOrthoNormal() const {
    OxVec2d c0, c1;
    getValue(c0, c1);
    c0.normalize();
    c1.normalize();
    return OxToBool(c1.dot(c0) <= kFixedTolerance);
}

double OxRot2d::getAngle() const {
    if (isOrthoNormal() != OxTrue) {
        return 0.0;
    }
    if (std::fabs(m[1][0]) > std::fabs(m[1][1])) {
        return std::asin(m[1][0]);
    }
    return std::acos(m[1][1]);
}

long long OxRot2d::readValue(OxInput& input) {
    return readMatrix<2>(m, input);
}
long long OxRot2d::writeValue(OxOutput& output) const {
    return writeMatrix<2>(m, output);
}

OxRot2d operator*(const OxRot2d& a, const OxRot2d& b) {
    OxRot2d product;
    multiply<2>(product.m, a.m, b.m);
    return product;
}
int operator==(const OxRot2d& a, const OxRot2d& b) {
    return withinTolerance<2>(a.m, b.m);
}
int operator!=(const OxRot2d& a, const OxRot2d& b) {
    return withinTolerance<2>(a.m, b.m) ? 0 : 1;
}
std::ostream& operator<<(std::ostream& s, const OxRot2d& r) {
    return printMatrix<2>(s, r.m, true);
}
