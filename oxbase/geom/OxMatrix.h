// OxMatrix.h: a 4 × 4 matrix of doubles for homogeneous transformations.
//
// The matrix is stored row by row (m[i][j] is row i, column j). It stores,
// sets, prints and computes determinants; it has no product, comparison,
// inversion or file form: callers work on the elements through operator[].
// setTranslate puts the translation in the last column (the column-vector
// convention), although the library's vectors are rows elsewhere.
//
//   OxMatrix scale;  scale.setScale(2.0);    // diag(2, 2, 2, 1)
//   double volume = scale.det3();             // 8
//   std::cout << scale;                       // four rows at precision 8
#ifndef OXBASE_GEOM_OXMATRIX_H
#define OXBASE_GEOM_OXMATRIX_H

#include "oxbase/platform/OxExport.h"

#include <ostream>

class OxVec3d;

class OXBASE_API OxMatrix {
public:
    double m[4][4];

    /// The identity.
    OxMatrix();
    explicit OxMatrix(double const (&values)[4][4]);
    /// Sixteen elements, row by row.
    OxMatrix(double m00, double m01, double m02, double m03, double m10, double m11, double m12,
             double m13, double m20, double m21, double m22, double m23, double m30, double m31,
             double m32, double m33);
    OxMatrix(const OxMatrix& other) = default;
    const OxMatrix& operator=(const OxMatrix& other);

    static OxMatrix identity();
    void makeIdentity();
    void setValue(double const (&values)[4][4]);
    void getValue(double (&values)[4][4]) const;
    /// The whole array; it stays the matrix's.
    double const (*getValue() const)[4][4] { return &m; }
    /// Row i. Only the two low bits of the index count (an index outside 0
    /// to 3 is taken modulo 4), so no index reaches outside the matrix; the
    /// column index into the row is the caller's to keep from 0 to 3.
    double* operator[](int i) { return m[i & 3]; }
    double const* operator[](int i) const { return m[i & 3]; }

    /// The whole matrix becomes diag(s, s, s, 1).
    void setScale(double s);
    /// The whole matrix becomes diag(v.x, v.y, v.z, 1).
    void setScale(OxVec3d const& v);
    /// The whole matrix becomes a pure translation: the identity diagonal,
    /// (v.x, v.y, v.z) in m[0][3], m[1][3], m[2][3] (the last column), and
    /// 0.0 everywhere else.
    void setTranslate(OxVec3d const& v);

    /// Determinant of the upper left 3 × 3 block.
    double det3() const;
    /// Determinant of the 3 × 3 minor of rows r1, r2, r3 and columns c1, c2,
    /// c3, expanded along row r1. Repeated indices give 0. Indices are taken
    /// modulo 4 like those of operator[].
    double det3(int r1, int r2, int r3, int c1, int c2, int c3) const;
    /// Determinant of the whole matrix, expanded along row 0. A singular
    /// matrix gives 0; there is no failure.
    double det4() const;
};

/// "\n[ \n", then each row as four elements of width 12 at precision 8, each
/// followed by ", ", and "\n"; then "]" with no line end. The `right` flag is
/// set for the rows and cleared after them; the precision stays at 8.
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxMatrix& matrix);

#endif
