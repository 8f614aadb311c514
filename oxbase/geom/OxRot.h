// OxRot.h: 3 × 3 and 2 × 2 matrices of doubles, stored row by row.
//
// Despite the name they hold any matrix: rows that form an axis system, a
// scaling, or the general case that `invert` solves by Gauss-Jordan
// elimination. Vectors are rows and multiply from the left (v·M), so the
// axis-and-angle matrix turns a vector by −angle about the axis.
// OX_IDENTITY_3X3_MATRIX is the identity, built when the library is loaded.
//
//   OxRot turn(OxVec3d(0, 0, 1), M_PI / 2);
//   OxVec3d v(1, 0, 0);  v *= turn;          // (0, -1, 0)
//   if (turn.invert() != OxErrorNone) ...    // message 169 when singular
#ifndef OXBASE_GEOM_OXROT_H
#define OXBASE_GEOM_OXROT_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"
#include "oxbase/geom/OxVec.h"

#include <ostream>

class OxInput;
class OxOutput;

class OXBASE_API OxRot {
public:
    double m[3][3];

    /// The identity.
    OxRot();
    explicit OxRot(double const (&values)[3][3]);
    OxRot(double m00, double m01, double m02, double m10, double m11, double m12, double m20,
          double m21, double m22);
    OxRot(const OxRot& other) = default;
    const OxRot& operator=(const OxRot& other);
    /// Right-handed rotation of a column vector by `angle` about the
    /// normalised `axis` (a zero axis stays zero).
    OxRot(OxVec3d axis, double angle);
    /// The product Z(b)·Y(a)·Z(c) of three angles in radians.
    OxRot(double a, double b, double c);
    /// An axis system in the rows: u and v normalised, then their cross
    /// product. All zero when u·v is within 1e-5 of 1.
    OxRot(OxVec3d const& u, OxVec3d const& v);
    virtual ~OxRot() = default;

    static OxRot identity();
    void makeIdentity();
    void setValue(double m00, double m01, double m02, double m10, double m11, double m12,
                  double m20, double m21, double m22);
    void setValue(double const (*values)[3][3]);
    void setValue(double const (*const rows)[3]);
    double const (&getValue() const)[3][3] { return m; }
    void getValue(double (&values)[3][3]) const;
    /// The three columns.
    void getValue(OxVec3d& c0, OxVec3d& c1, OxVec3d& c2) const;
    void getRow(unsigned int i, OxVec3d& row) const;
    void getColumn(unsigned int j, OxVec3d& column) const;
    void setRow(unsigned int i, OxVec3d& row);
    void setColumn(unsigned int j, OxVec3d& column);
    /// Row i; indices are not checked.
    double* operator[](int i) { return m[i]; }
    double const* operator[](int i) const { return m[i]; }
    void setScale(double s);
    void setScale(OxVec3d const& v);
    void swapRows(unsigned int a, unsigned int b);
    void swapColumns(unsigned int a, unsigned int b);
    void transpose();
    /// Each element exactly 1.0 or 0.0.
    OxBool isIdentity() const;
    /// Pairwise dot products of the normalised columns all at most 1e-5.
    OxBool isOrthoNormal();
    /// In place: the transpose for an orthonormal matrix, else Gauss-Jordan
    /// elimination with row pivoting. A zero pivot logs message 169 and
    /// returns OxErrorError, leaving the state of the elimination.
    OxErrorCode invert();
    /// Copies *this into `result` and inverts it there.
    OxErrorCode inverse(OxRot& result) const;
    /// Kept as the historical arithmetic; not the inverse of OxRot(a, b, c).
    void getAngles(double& a, double& b, double& c) const;

    long long readValue(OxInput& input);
    long long writeValue(OxOutput& output) const;
};

class OXBASE_API OxRot2d {
public:
    double m[2][2];

    OxRot2d();
    explicit OxRot2d(double const (&values)[2][2]);
    OxRot2d(double m00, double m01, double m10, double m11);
    OxRot2d(const OxRot2d& other) = default;
    const OxRot2d& operator=(const OxRot2d& other);
    virtual ~OxRot2d() = default;

    static OxRot2d identity();
    void makeIdentity();
    void setValue(double m00, double m01, double m10, double m11);
    void setValue(double const (*values)[2][2]);
    void setValue(double const (*const rows)[2]);
    double const (&getValue() const)[2][2] { return m; }
    void getValue(double (&values)[2][2]) const;
    void getValue(OxVec2d& c0, OxVec2d& c1) const;
    void getRow(unsigned int i, OxVec2d& row) const;
    void getColumn(unsigned int j, OxVec2d& column) const;
    void setRow(unsigned int i, OxVec2d& row);
    void setColumn(unsigned int j, OxVec2d& column);
    double* operator[](int i) { return m[i]; }
    double const* operator[](int i) const { return m[i]; }
    void setScale(double s);
    void setScale(OxVec2d const& v);
    void swapRows(unsigned int a, unsigned int b);
    void swapColumns(unsigned int a, unsigned int b);
    void transpose();
    OxBool isIdentity() const;
    OxBool isOrthoNormal() const;
    /// 0.0 unless orthonormal; else asin(m[1][0]) when |m[1][0]| > |m[1][1]|,
    /// otherwise acos(m[1][1]).
    double getAngle() const;

    long long readValue(OxInput& input);
    long long writeValue(OxOutput& output) const;
};

/// The matrix product a·b.
OXBASE_API OxRot operator*(const OxRot& a, const OxRot& b);
OXBASE_API OxRot2d operator*(const OxRot2d& a, const OxRot2d& b);
/// Each element within the fixed 1e-5.
OXBASE_API int operator==(const OxRot& a, const OxRot& b);
OXBASE_API int operator!=(const OxRot& a, const OxRot& b);
OXBASE_API int operator==(const OxRot2d& a, const OxRot2d& b);
OXBASE_API int operator!=(const OxRot2d& a, const OxRot2d& b);
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxRot& rot);
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxRot2d& rot);

/// The identity matrix, set up when the library is loaded.
extern OXBASE_API const OxRot OX_IDENTITY_3X3_MATRIX;

#endif
