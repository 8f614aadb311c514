// OxVec.h: points and directions in two, three and four dimensions.
//
// OxVec2d is a point of the plane or of a surface's parameter space (U, V);
// OxVec3d a point or direction in space, or a homogeneous plane point
// (h·U, h·V, h); OxVec4d a homogeneous point in space stored weighted,
// (w·X, w·Y, w·Z, w). Vectors are rows: they multiply matrices from the left.
// Each operation has its own tolerance and weight rule, stated at its
// declaration. `==` accepts a difference of about OxEPSPtPt + OxEPSZero per
// coordinate while `!=` compares exactly, so the two are not each other's
// negation. Nothing here allocates, except the segment form of
// OxVec2d::dist, whose result the caller owns.
//
//   OxVec4d p(OxVec3d(1, 2, 3), 2.0);   // stored (2, 4, 6, 2)
//   OxVec3d e;  p.getEuclidean(e);      // (1, 2, 3)
//   double len = OxVec3d(3, 4, 0).normalize();   // 5, vector now (0.6, 0.8, 0)
#ifndef OXBASE_GEOM_OXVEC_H
#define OXBASE_GEOM_OXVEC_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

#include <ostream>

class OxInput;
class OxOutput;
class OxMemory;
class OxRot;
class OxRot2d;

class OXBASE_API OxVec2d {
public:
    double x = 0.0;
    double y = 0.0;

    OxVec2d() = default;
    OxVec2d(double x, double y);
    explicit OxVec2d(double const* const values);
    OxVec2d(const OxVec2d& other) = default;
    const OxVec2d& operator=(const OxVec2d& other);
    virtual ~OxVec2d() = default;

    OxVec2d& setValue(double x, double y);
    OxVec2d& setValue(double const* const values);
    OxVec2d& setValue(float const* const values);
    /// g.x·a + g.y·b + g.y·c: the second weight serves both b and c. Formed
    /// before it is assigned, so *this may be an argument.
    OxVec2d& setValue(OxVec2d const& g, OxVec2d const& a, OxVec2d const& b, OxVec2d const& c);

    double getX() const { return x; }
    double getY() const { return y; }
    double getU() const { return x; }
    double getV() const { return y; }
    void setX(double value) { x = value; }
    void setY(double value) { y = value; }
    void setU(double value) { x = value; }
    void setV(double value) { y = value; }
    double const* getValue() const { return &x; }
    void getValue(double& outX, double& outY) const;
    /// 0 is x; any other index is y.
    double& operator[](int index) { return index == 0 ? x : y; }
    double const& operator[](int index) const { return index == 0 ? x : y; }

    /// Every coordinate exactly 0.0.
    OxBool isZero() const;
    OxBool isIdentity() const;
    /// Length of *this − other at most `tolerance`.
    OxBool equals(OxVec2d other, double tolerance) const;

    OxVec2d& operator+=(const OxVec2d& other);
    OxVec2d& operator-=(const OxVec2d& other);
    OxVec2d operator-() const;
    void negate();
    OxVec2d& operator*=(double factor);
    /// Divisor exactly 0.0: the vector stays as it is.
    OxVec2d& operator/=(double divisor);
    /// Coordinate by coordinate product.
    OxVec2d& operator*=(const OxVec2d& other);
    /// Row vector times matrix: (x·m00 + y·m10, x·m01 + y·m11).
    OxVec2d& operator*=(const OxRot2d& m);
    void makeIdentity();
    double length() const;
    double dot(const OxVec2d& other) const;
    /// Divides by the length (a zero vector stays zero); returns the length before.
    double normalize();
    double dist(OxVec2d const& other) const;
    double distsq(OxVec2d const& other) const;
    /// Distance from this point to the segment a–b. Beyond an end: `side` −1
    /// (before a) or 1 (beyond b), `d` the distance to that end, null. Within:
    /// `side` 0, a new vector at the foot of the perpendicular, which the
    /// caller deletes. A segment of length up to OxEPSZero: null, side 0, d 0.
    OxVec2d* dist(OxVec2d const& a, OxVec2d const& b, double& d, short& side) const;
    /// Angle at this vertex between the legs to a and b, 0 to π.
    double angle(OxVec2d const& a, OxVec2d& b) const;
    /// (1, 0) or (0, 1), along the larger absolute coordinate; x wins ties.
    OxVec2d getClosestAxis() const;
    /// Turns the vector about the origin by `angle` radians, counter-clockwise.
    void rotate(double angle);

    long long readValue(OxInput& input);
    long long readValue(OxMemory& memory);
    long long writeValue(OxOutput& output) const;
};

class OXBASE_API OxVec3d {
public:
    double x = 0.0;
    double y = 0.0;
    double z = 0.0;

    OxVec3d() = default;
    OxVec3d(double x, double y, double z);
    explicit OxVec3d(double const* const values);
    /// The difference `to` − `from`.
    OxVec3d(OxVec3d from, OxVec3d to);
    OxVec3d(const OxVec3d& other) = default;
    const OxVec3d& operator=(const OxVec3d& other);
    virtual ~OxVec3d() = default;

    OxVec3d& setValue(double x, double y, double z);
    OxVec3d& setValue(double const* const values);
    OxVec3d& setValue(float const* const values);
    /// g.x·a + g.y·b + g.z·c, formed before it is assigned.
    OxVec3d& setValue(OxVec3d const& g, OxVec3d const& a, OxVec3d const& b, OxVec3d const& c);

    double getX() const { return x; }
    double getY() const { return y; }
    double getZ() const { return z; }
    double getU() const { return x; }
    double getV() const { return y; }
    double getH() const { return z; }
    void setX(double value) { x = value; }
    void setY(double value) { y = value; }
    void setZ(double value) { z = value; }
    void setU(double value) { x = value; }
    void setV(double value) { y = value; }
    void setH(double value) { z = value; }
    double const* getValue() const { return &x; }
    void getValue(double& outX, double& outY, double& outZ) const;
    /// 0 is x, 1 is y; any other index is z.
    double& operator[](int index) { return index == 0 ? x : (index == 1 ? y : z); }
    double const& operator[](int index) const { return index == 0 ? x : (index == 1 ? y : z); }

    OxBool isZero() const;
    OxBool isIdentity() const;
    OxBool equals(OxVec3d other, double tolerance) const;

    OxVec3d& operator+=(const OxVec3d& other);
    OxVec3d& operator-=(const OxVec3d& other);
    OxVec3d operator-() const;
    void negate();
    OxVec3d& operator*=(double factor);
    OxVec3d& operator/=(double divisor);
    OxVec3d& operator*=(const OxVec3d& other);
    /// Row vector times matrix: component j is x·m[0][j] + y·m[1][j] + z·m[2][j].
    OxVec3d& operator*=(const OxRot& m);
    void makeIdentity();
    double length() const;
    double dot(const OxVec3d& other) const;
    double normalize();
    double dist(OxVec3d const& other) const;
    double distsq(OxVec3d const& other) const;
    double angle(OxVec3d const& a, OxVec3d& b) const;
    /// Unit vector along the largest absolute coordinate; earlier axes win ties.
    OxVec3d getClosestAxis() const;
    /// Right-handed product of normalised copies: its length is the sine of
    /// the angle between the operands.
    OxVec3d cross(OxVec3d const& other) const;
    /// s·*this + t·u.
    OxVec3d combination(double s, double t, OxVec3d& u) const;
    /// *this + s·u + t·v.
    OxVec3d combination(double s, double t, OxVec3d& u, OxVec3d& v) const;
    /// (x/z, y/z) when z > OxEPSZero, else (x, y).
    void getEuclidean(OxVec2d& out) const;

    long long readValue(OxInput& input);
    long long readValue(OxMemory& memory);
    long long writeValue(OxOutput& output) const;
};

class OXBASE_API OxVec4d {
public:
    double x = 0.0;
    double y = 0.0;
    double z = 0.0;
    double w = 1.0;

    OxVec4d() = default;
    OxVec4d(double x, double y, double z, double w);
    explicit OxVec4d(double const* const values);
    /// Weighted form: (w·v, w) when |w| > OxEPSZero, else (v, 0.0).
    OxVec4d(OxVec3d v, double w);
    OxVec4d(const OxVec4d& other) = default;
    const OxVec4d& operator=(const OxVec4d& other);
    virtual ~OxVec4d() = default;

    OxVec4d& setValue(double x, double y, double z, double w);
    OxVec4d& setValue(double const* const values);
    OxVec4d& setValue(float const* const values);
    OxVec4d& setValue(OxVec3d v, double w);

    double getX() const { return x; }
    double getY() const { return y; }
    double getZ() const { return z; }
    double getW() const { return w; }
    void setX(double value) { x = value; }
    void setY(double value) { y = value; }
    void setZ(double value) { z = value; }
    void setW(double value) { w = value; }
    double const* getValue() const { return &x; }
    void getValue(double& outX, double& outY, double& outZ, double& outW) const;
    /// 0 is x, 1 is y, 2 is z; any other index is w.
    double& operator[](int index) {
        return index == 0 ? x : (index == 1 ? y : (index == 2 ? z : w));
    }
    double const& operator[](int index) const {
        return index == 0 ? x : (index == 1 ? y : (index == 2 ? z : w));
    }

    /// x, y, z exactly 0.0; w is not looked at.
    OxBool isZero() const;
    /// All four exactly 0.0.
    OxBool isIdentity() const;
    /// The difference of all four; x, y, z divided by its w when that passes
    /// the weight test; OxTrue when their length is at most `tolerance`.
    OxBool equals(OxVec4d other, double tolerance) const;

    OxVec4d& operator+=(const OxVec4d& other);
    OxVec4d& operator-=(const OxVec4d& other);
    /// Euclidean sum: (X + v.x, Y + v.y, Z + v.z) times w; w stays.
    OxVec4d& operator+=(OxVec3d const& v);
    OxVec4d operator-() const;
    /// x, y, z negated; w unchanged.
    void negate();
    /// x, y, z scaled; w unchanged.
    OxVec4d& operator*=(double factor);
    /// All four divided; divisor exactly 0.0 leaves the vector as it is.
    OxVec4d& operator/=(double divisor);
    /// The Euclidean point times m, each result times w (w stays, unconditionally).
    OxVec4d& operator*=(const OxRot& m);
    void makeIdentity();
    /// Length of the Euclidean point.
    double length() const;
    double dot(const OxVec4d& other) const;
    /// Divides all four by the Euclidean length; a zero point becomes (0, 0, 0, 1).
    void normalize();
    /// s·*this + t·u over all four coordinates.
    OxVec4d combination(double s, double t, OxVec4d& u) const;
    /// (x/w, y/w, z/w) when w > OxEPSZero, else (x, y, z).
    void getEuclidean(OxVec3d& out) const;

    long long readValue(OxInput& input);
    long long readValue(OxMemory& memory);
    long long writeValue(OxOutput& output) const;
};

OXBASE_API OxVec2d operator+(const OxVec2d& a, const OxVec2d& b);
OXBASE_API OxVec2d operator-(const OxVec2d& a, const OxVec2d& b);
OXBASE_API OxVec2d operator*(const OxVec2d& v, double factor);
OXBASE_API OxVec2d operator*(double factor, const OxVec2d& v);
/// A divisor of exactly 0.0 gives the zero vector.
OXBASE_API OxVec2d operator/(const OxVec2d& v, double divisor);
/// Per coordinate: OxEPSZero >= |a − b| − OxEPSPtPt.
OXBASE_API int operator==(const OxVec2d& a, const OxVec2d& b);
/// Any coordinate different, compared exactly.
OXBASE_API int operator!=(const OxVec2d& a, const OxVec2d& b);
/// Each coordinate at precision 10 and width 18, no separator, no line end.
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxVec2d& v);

OXBASE_API OxVec3d operator+(const OxVec3d& a, const OxVec3d& b);
OXBASE_API OxVec3d operator-(const OxVec3d& a, const OxVec3d& b);
OXBASE_API OxVec3d operator*(const OxVec3d& v, double factor);
OXBASE_API OxVec3d operator*(double factor, const OxVec3d& v);
OXBASE_API OxVec3d operator/(const OxVec3d& v, double divisor);
OXBASE_API int operator==(const OxVec3d& a, const OxVec3d& b);
OXBASE_API int operator!=(const OxVec3d& a, const OxVec3d& b);
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxVec3d& v);

/// All four, w included.
OXBASE_API OxVec4d operator+(const OxVec4d& a, const OxVec4d& b);
OXBASE_API OxVec4d operator-(const OxVec4d& a, const OxVec4d& b);
/// x, y, z scaled; w copied.
OXBASE_API OxVec4d operator*(const OxVec4d& v, double factor);
OXBASE_API OxVec4d operator*(double factor, const OxVec4d& v);
/// All four divided, with no test of the divisor.
OXBASE_API OxVec4d operator/(const OxVec4d& v, double divisor);
OXBASE_API int operator==(const OxVec4d& a, const OxVec4d& b);
OXBASE_API int operator!=(const OxVec4d& a, const OxVec4d& b);
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxVec4d& v);

#endif
