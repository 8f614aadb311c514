#include "oxbase/geom/OxVec.h"

#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/OxRot.h"
#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxMemory.h"
#include "oxbase/io/OxOutput.h"

#include <cmath>
#include <iomanip>

// The three vector classes are unrelated types with the same coordinate
// access; the helpers below serve all of them by coordinate count.
namespace {
template <int N, class V, class Reader> long long readCoordinates(V& v, Reader& reader) {
    long long total = 0;
    for (int i = 0; i < N; i++) {
        total += reader.read(v[i]); // every coordinate is attempted
    }
    return total;
}

template <int N, class V> long long writeCoordinates(const V& v, OxOutput& output) {
    long long written = 0;
    for (int i = 0; i < N; i++) {
        if (output.write(v[i]) == OxFalse) {
            break;
        }
        written += 8;
    }
    return written;
}

template <int N, class V> std::ostream& printCoordinates(std::ostream& stream, const V& v) {
    stream << std::setprecision(10);
    for (int i = 0; i < N; i++) {
        stream << std::setw(18) << v[i];
    }
    return stream;
}

template <int N, class V> int tolerantEqual(const V& a, const V& b) {
    for (int i = 0; i < N; i++) {
        if (!(OxLimits::OxEPSZero >= std::fabs(a[i] - b[i]) - OxLimits::OxEPSPtPt)) {
            return 0;
        }
    }
    return 1;
}

template <int N, class V> int exactlyDifferent(const V& a, const V& b) {
    for (int i = 0; i < N; i++) {
        if (a[i] != b[i]) {
            return 1;
        }
    }
    return 0;
}

template <int N, class V> bool allZero(const V& v) {
    for (int i = 0; i < N; i++) {
        if (v[i] != 0.0) {
            return false;
        }
    }
    return true;
}

bool passesWeight(double w) {
    return w > OxLimits::OxEPSZero;
}
} // namespace

// ---------------------------------------------------------------------------
// OxVec2d

OxVec2d::OxVec2d(double xValue, double yValue) : x(xValue), y(yValue) {}
OxVec2d::OxVec2d(double const* const values) : x(values[0]), y(values[1]) {}

const OxVec2d& OxVec2d::operator=(const OxVec2d& other) {
    x = other.x;
    y = other.y;
    return *this;
}

OxVec2d& OxVec2d::setValue(double xValue, double yValue) {
    x = xValue;
    y = yValue;
    return *this;
}
OxVec2d& OxVec2d::setValue(double const* const values) {
    return setValue(values[0], values[1]);
}
OxVec2d& OxVec2d::setValue(float const* const values) {
    return setValue(values[0], values[1]);
}

OxVec2d& OxVec2d::setValue(OxVec2d const& g, OxVec2d const& a, OxVec2d const& b, OxVec2d const& c) {
    OxVec2d sum = g.x * a + g.y * b + g.y * c;
    *this = sum;
    return *this;
}

void OxVec2d::getValue(double& outX, double& outY) const {
    outX = x;
    outY = y;
}

OxBool OxVec2d::isZero() const {
    return OxToBool(allZero<2>(*this));
}
OxBool OxVec2d::isIdentity() const {
    return isZero();
}
// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxBool OxVec2d::equals(OxVec2d other, double tolerance) const {
    return OxToBool((*this - other).length() <= tolerance);
}

OxVec2d& OxVec2d::operator+=(const OxVec2d& o) {
    return setValue(x + o.x, y + o.y);
}
OxVec2d& OxVec2d::operator-=(const OxVec2d& o) {
    return setValue(x - o.x, y - o.y);
}
OxVec2d OxVec2d::operator-() const {
    return OxVec2d(-x, -y);
}
void OxVec2d::negate() {
    setValue(-x, -y);
}
OxVec2d& OxVec2d::operator*=(double f) {
    return setValue(x * f, y * f);
}
OxVec2d& OxVec2d::operator/=(double d) {
    return d == 0.0 ? *this : setValue(x / d, y / d);
}
OxVec2d& OxVec2d::operator*=(const OxVec2d& o) {
    return setValue(x * o.x, y * o.y);
}
OxVec2d& OxVec2d::operator*=(const OxRot2d& m) {
    return setValue(x * m[0][0] + y * m[1][0], x * m[0][1] + y * m[1][1]);
}
void OxVec2d::makeIdentity() {
    setValue(0.0, 0.0);
}
double OxVec2d::length() const {
    return std::sqrt(x * x + y * y);
}
double OxVec2d::dot(const OxVec2d& o) const {
    return x * o.x + y * o.y;
}

double OxVec2d::normalize() {
    double len = length();
    if (len == 0.0) {
        setValue(0.0, 0.0);
    } else {
        setValue(x / len, y / len);
    }
    return len;
}

double OxVec2d::dist(OxVec2d const& o) const {
    return std::sqrt(distsq(o));
}
double OxVec2d::distsq(OxVec2d const& o) const {
    return (x - o.x) * (x - o.x) + (y - o.y) * (y - o.y);
}

OxVec2d* OxVec2d::dist(OxVec2d const& a, OxVec2d const& b, double& d, short& side) const {
    d = 0.0;
    double l2 = a.distsq(b);
    if (!(std::fabs(l2) > OxLimits::OxEPSZero)) {
        side = 0;
        return nullptr;
    }
    double t = ((a.x - x) * (a.x - b.x) + (a.y - y) * (a.y - b.y)) / l2;
    if (t < 0.0) {
        d = dist(a);
        side = -1;
        return nullptr;
    }
    if (t > 1.0) {
        d = dist(b);
        side = 1;
        return nullptr;
    }
    auto* foot = new OxVec2d(a + t * (b - a));
    d = dist(*foot);
    side = 0;
    return foot;
}

double OxVec2d::angle(OxVec2d const& a, OxVec2d& b) const {
    OxVec2d legA = a - *this;
    OxVec2d legB = b - *this;
    legA.normalize();
    legB.normalize();
    return std::acos(legA.dot(legB));
}

OxVec2d OxVec2d::getClosestAxis() const {
    return y * y > x * x ? OxVec2d(0.0, 1.0) : OxVec2d(1.0, 0.0);
}

void OxVec2d::rotate(double angleValue) {
    double c = std::cos(angleValue);
    double s = std::sin(angleValue);
    setValue(x * c - y * s, x * s + y * c);
}

long long OxVec2d::readValue(OxInput& input) {
    return readCoordinates<2>(*this, input);
}
long long OxVec2d::readValue(OxMemory& memory) {
    return readCoordinates<2>(*this, memory);
}
long long OxVec2d::writeValue(OxOutput& output) const {
    return writeCoordinates<2>(*this, output);
}

OxVec2d operator+(const OxVec2d& a, const OxVec2d& b) {
    return OxVec2d(a.x + b.x, a.y + b.y);
}
OxVec2d operator-(const OxVec2d& a, const OxVec2d& b) {
    return OxVec2d(a.x - b.x, a.y - b.y);
}
OxVec2d operator*(const OxVec2d& v, double f) {
    return OxVec2d(v.x * f, v.y * f);
}
OxVec2d operator*(double f, const OxVec2d& v) {
    return v * f;
}
OxVec2d operator/(const OxVec2d& v, double d) {
    return d == 0.0 ? OxVec2d() : OxVec2d(v.x / d, v.y / d);
}
int operator==(const OxVec2d& a, const OxVec2d& b) {
    return tolerantEqual<2>(a, b);
}
int operator!=(const OxVec2d& a, const OxVec2d& b) {
    return exactlyDifferent<2>(a, b);
}
std::ostream& operator<<(std::ostream& s, const OxVec2d& v) {
    return printCoordinates<2>(s, v);
}

// ---------------------------------------------------------------------------
// OxVec3d

OxVec3d::OxVec3d(double xValue, double yValue, double zValue) : x(xValue), y(yValue), z(zValue) {}
OxVec3d::OxVec3d(double const* const values) : x(values[0]), y(values[1]), z(values[2]) {}
// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxVec3d::OxVec3d(OxVec3d from, OxVec3d to) : x(to.x - from.x), y(to.y - from.y), z(to.z - from.z) {}

const OxVec3d& OxVec3d::operator=(const OxVec3d& other) {
    x = other.x;
    y = other.y;
    z = other.z;
    return *this;
}

OxVec3d& OxVec3d::setValue(double xValue, double yValue, double zValue) {
    x = xValue;
    y = yValue;
    z = zValue;
    return *this;
}
OxVec3d& OxVec3d::setValue(double const* const v) {
    return setValue(v[0], v[1], v[2]);
}
OxVec3d& OxVec3d::setValue(float const* const v) {
    return setValue(v[0], v[1], v[2]);
}

OxVec3d& OxVec3d::setValue(OxVec3d const& g, OxVec3d const& a, OxVec3d const& b, OxVec3d const& c) {
    OxVec3d sum = g.x * a + g.y * b + g.z * c;
    *this = sum;
    return *this;
}

void OxVec3d::getValue(double& outX, double& outY, double& outZ) const {
    outX = x;
    outY = y;
    outZ = z;
}

OxBool OxVec3d::isZero() const {
    return OxToBool(allZero<3>(*this));
}
OxBool OxVec3d::isIdentity() const {
    return isZero();
}
// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxBool OxVec3d::equals(OxVec3d other, double tolerance) const {
    return OxToBool((*this - other).length() <= tolerance);
}

OxVec3d& OxVec3d::operator+=(const OxVec3d& o) {
    return setValue(x + o.x, y + o.y, z + o.z);
}
OxVec3d& OxVec3d::operator-=(const OxVec3d& o) {
    return setValue(x - o.x, y - o.y, z - o.z);
}
OxVec3d OxVec3d::operator-() const {
    return OxVec3d(-x, -y, -z);
}
void OxVec3d::negate() {
    setValue(-x, -y, -z);
}
OxVec3d& OxVec3d::operator*=(double f) {
    return setValue(x * f, y * f, z * f);
}
OxVec3d& OxVec3d::operator/=(double d) {
    return d == 0.0 ? *this : setValue(x / d, y / d, z / d);
}
OxVec3d& OxVec3d::operator*=(const OxVec3d& o) {
    return setValue(x * o.x, y * o.y, z * o.z);
}
OxVec3d& OxVec3d::operator*=(const OxRot& m) {
    double r[3];
    for (int j = 0; j < 3; j++) {
        r[j] = x * m[0][j] + y * m[1][j] + z * m[2][j];
    }
    return setValue(r[0], r[1], r[2]);
}
void OxVec3d::makeIdentity() {
    setValue(0.0, 0.0, 0.0);
}
double OxVec3d::length() const {
    return std::sqrt(x * x + y * y + z * z);
}
double OxVec3d::dot(const OxVec3d& o) const {
    return x * o.x + y * o.y + z * o.z;
}

double OxVec3d::normalize() {
    double len = length();
    if (len == 0.0) {
        setValue(0.0, 0.0, 0.0);
    } else {
        setValue(x / len, y / len, z / len);
    }
    return len;
}

double OxVec3d::dist(OxVec3d const& o) const {
    return std::sqrt(distsq(o));
}
double OxVec3d::distsq(OxVec3d const& o) const {
    return (x - o.x) * (x - o.x) + (y - o.y) * (y - o.y) + (z - o.z) * (z - o.z);
}

double OxVec3d::angle(OxVec3d const& a, OxVec3d& b) const {
    OxVec3d legA = a - *this;
    OxVec3d legB = b - *this;
    legA.normalize();
    legB.normalize();
    return std::acos(legA.dot(legB));
}

OxVec3d OxVec3d::getClosestAxis() const {
    if (y * y > x * x) {
        return z * z > y * y ? OxVec3d(0, 0, 1) : OxVec3d(0, 1, 0);
    }
    return z * z > x * x ? OxVec3d(0, 0, 1) : OxVec3d(1, 0, 0);
}

OxVec3d OxVec3d::cross(OxVec3d const& other) const {
    OxVec3d a(*this);
    OxVec3d b(other);
    a.normalize();
    b.normalize();
    return OxVec3d(a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x);
}

OxVec3d OxVec3d::combination(double s, double t, OxVec3d& u) const {
    return s * *this + t * u;
}

OxVec3d OxVec3d::combination(double s, double t, OxVec3d& u, OxVec3d& v) const {
    return *this + s * u + t * v;
}

void OxVec3d::getEuclidean(OxVec2d& out) const {
    if (passesWeight(z)) {
        out.setValue(x / z, y / z);
    } else {
        out.setValue(x, y);
    }
}

long long OxVec3d::readValue(OxInput& input) {
    return readCoordinates<3>(*this, input);
}
long long OxVec3d::readValue(OxMemory& memory) {
    return readCoordinates<3>(*this, memory);
}
long long OxVec3d::writeValue(OxOutput& output) const {
    return writeCoordinates<3>(*this, output);
}

OxVec3d operator+(const OxVec3d& a, const OxVec3d& b) {
    return OxVec3d(a.x + b.x, a.y + b.y, a.z + b.z);
}
OxVec3d operator-(const OxVec3d& a, const OxVec3d& b) {
    return OxVec3d(a.x - b.x, a.y - b.y, a.z - b.z);
}
OxVec3d operator*(const OxVec3d& v, double f) {
    return OxVec3d(v.x * f, v.y * f, v.z * f);
}
OxVec3d operator*(double f, const OxVec3d& v) {
    return v * f;
}
OxVec3d operator/(const OxVec3d& v, double d) {
    return d == 0.0 ? OxVec3d() : OxVec3d(v.x / d, v.y / d, v.z / d);
}
int operator==(const OxVec3d& a, const OxVec3d& b) {
    return tolerantEqual<3>(a, b);
}
int operator!=(const OxVec3d& a, const OxVec3d& b) {
    return exactlyDifferent<3>(a, b);
}
std::ostream& operator<<(std::ostream& s, const OxVec3d& v) {
    return printCoordinates<3>(s, v);
}

// ---------------------------------------------------------------------------
// OxVec4d

OxVec4d::OxVec4d(double xValue, double yValue, double zValue, double wValue)
    : x(xValue), y(yValue), z(zValue), w(wValue) {}
OxVec4d::OxVec4d(double const* const v) : x(v[0]), y(v[1]), z(v[2]), w(v[3]) {}
// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxVec4d::OxVec4d(OxVec3d v, double weight) {
    setValue(v, weight);
}

const OxVec4d& OxVec4d::operator=(const OxVec4d& other) {
    x = other.x;
    y = other.y;
    z = other.z;
    w = other.w;
    return *this;
}

OxVec4d& OxVec4d::setValue(double xValue, double yValue, double zValue, double wValue) {
    x = xValue;
    y = yValue;
    z = zValue;
    w = wValue;
    return *this;
}
OxVec4d& OxVec4d::setValue(double const* const v) {
    return setValue(v[0], v[1], v[2], v[3]);
}
OxVec4d& OxVec4d::setValue(float const* const v) {
    return setValue(v[0], v[1], v[2], v[3]);
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxVec4d& OxVec4d::setValue(OxVec3d v, double weight) {
    if (std::fabs(weight) > OxLimits::OxEPSZero) {
        return setValue(weight * v.x, weight * v.y, weight * v.z, weight);
    }
    return setValue(v.x, v.y, v.z, 0.0);
}

void OxVec4d::getValue(double& outX, double& outY, double& outZ, double& outW) const {
    outX = x;
    outY = y;
    outZ = z;
    outW = w;
}

OxBool OxVec4d::isZero() const {
    return OxToBool(x == 0.0 && y == 0.0 && z == 0.0);
}
OxBool OxVec4d::isIdentity() const {
    return OxToBool(allZero<4>(*this));
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxBool OxVec4d::equals(OxVec4d other, double tolerance) const {
    OxVec4d d(x - other.x, y - other.y, z - other.z, w - other.w);
    OxVec3d e;
    d.getEuclidean(e);
    return OxToBool(e.length() <= tolerance);
}

OxVec4d& OxVec4d::operator+=(const OxVec4d& o) {
    return setValue(x + o.x, y + o.y, z + o.z, w + o.w);
}
OxVec4d& OxVec4d::operator-=(const OxVec4d& o) {
    return setValue(x - o.x, y - o.y, z - o.z, w - o.w);
}
OxVec4d& OxVec4d::operator+=(OxVec3d const& v) {
    OxVec3d e;
    getEuclidean(e);
    return setValue((e.x + v.x) * w, (e.y + v.y) * w, (e.z + v.z) * w, w);
}
OxVec4d OxVec4d::operator-() const {
    return OxVec4d(-x, -y, -z, -w);
}
void OxVec4d::negate() {
    setValue(-x, -y, -z, w);
}
OxVec4d& OxVec4d::operator*=(double f) {
    return setValue(x * f, y * f, z * f, w);
}
OxVec4d& OxVec4d::operator/=(double d) {
    return d == 0.0 ? *this : setValue(x / d, y / d, z / d, w / d);
}
OxVec4d& OxVec4d::operator*=(const OxRot& m) {
    OxVec3d e;
    getEuclidean(e);
    e *= m;
    return setValue(e.x * w, e.y * w, e.z * w, w);
}
void OxVec4d::makeIdentity() {
    setValue(0.0, 0.0, 0.0, 0.0);
}

double OxVec4d::length() const {
    OxVec3d e;
    getEuclidean(e);
    return e.length();
}

double OxVec4d::dot(const OxVec4d& o) const {
    return x * o.x + y * o.y + z * o.z + w * o.w;
}

void OxVec4d::normalize() {
    double len = length();
    if (len == 0.0) {
        setValue(0.0, 0.0, 0.0, 1.0);
    } else {
        setValue(x / len, y / len, z / len, w / len);
    }
}

OxVec4d OxVec4d::combination(double s, double t, OxVec4d& u) const {
    return OxVec4d(s * x + t * u.x, s * y + t * u.y, s * z + t * u.z, s * w + t * u.w);
}

void OxVec4d::getEuclidean(OxVec3d& out) const {
    if (passesWeight(w)) {
        out.setValue(x / w, y / w, z / w);
    } else {
        out.setValue(x, y, z);
    }
}

long long OxVec4d::readValue(OxInput& input) {
    return readCoordinates<4>(*this, input);
}
long long OxVec4d::readValue(OxMemory& memory) {
    return readCoordinates<4>(*this, memory);
}
long long OxVec4d::writeValue(OxOutput& output) const {
    return writeCoordinates<4>(*this, output);
}

OxVec4d operator+(const OxVec4d& a, const OxVec4d& b) {
    return OxVec4d(a.x + b.x, a.y + b.y, a.z + b.z, a.w + b.w);
}
OxVec4d operator-(const OxVec4d& a, const OxVec4d& b) {
    return OxVec4d(a.x - b.x, a.y - b.y, a.z - b.z, a.w - b.w);
}
OxVec4d operator*(const OxVec4d& v, double f) {
    return OxVec4d(v.x * f, v.y * f, v.z * f, v.w);
}
OxVec4d operator*(double f, const OxVec4d& v) {
    return v * f;
}
OxVec4d operator/(const OxVec4d& v, double d) {
    return OxVec4d(v.x / d, v.y / d, v.z / d, v.w / d);
}
int operator==(const OxVec4d& a, const OxVec4d& b) {
    return tolerantEqual<4>(a, b);
}
int operator!=(const OxVec4d& a, const OxVec4d& b) {
    return exactlyDifferent<4>(a, b);
}
std::ostream& operator<<(std::ostream& s, const OxVec4d& v) {
    return printCoordinates<4>(s, v);
}
