// OxBBox.h: axis-aligned bounding boxes in space and rectangles in (U, V).
//
// OxBBox (double) and OxBBoxf (float) bound in space, OxBRect in the
// parameter plane of a surface. Each carries an explicit empty flag beside
// its extents; an empty object holds markers (the largest value of its type
// in every lower field, the most negative in every upper one), so that a
// union, which works on the extents alone, is not disturbed by an empty
// operand. The order of lower against upper values is never tested: a box
// holds what it is given. The file form is the extents in field order,
// big-endian, without the flag; the float box reads and writes with a scale.
//
//   OxBBox box;                              // empty
//   box += OxBBox(1, 2, 3, 4, 5, 6);         // (1, 2, 3) to (4, 5, 6)
//   double cx, cy, cz;  box.getCenter(cx, cy, cz);   // (2.5, 3.5, 4.5)
#ifndef OXBASE_GEOM_OXBBOX_H
#define OXBASE_GEOM_OXBBOX_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

class OxInput;
class OxOutput;
class OxVec3d;
class OxBBox;

/// A bounding box in float precision.
class OXBASE_API OxBBoxf {
public:
    /// Empty: flag set, 3.4028234663852886e+38 in the lower fields and its
    /// negative in the upper ones.
    OxBBoxf();
    /// Not empty.
    OxBBoxf(float xmin, float ymin, float zmin, float xmax, float ymax, float zmax);
    OxBBoxf(const OxBBoxf& other) = default;
    const OxBBoxf& operator=(const OxBBoxf& other);
    /// Each field rounded to the nearest float (a double beyond the float range
    /// becomes ±infinity), the flag copied: an empty box keeps its flag, not
    /// the markers of this class.
    const OxBBoxf& operator=(const OxBBox& other);

    OxBool isEmpty() const { return empty; }
    /// Stores the extents; the box is no longer empty.
    void setValue(float xmin, float ymin, float zmin, float xmax, float ymax, float zmax);
    /// Lower field c − h, upper field h + c per axis, computed in double and
    /// rounded to float; not empty. The vectors are not changed.
    void setValue(OxVec3d& center, OxVec3d& halfSize);
    /// The stored fields, the markers of an empty box included.
    void getValue(float& xmin, float& ymin, float& zmin, float& xmax, float& ymax,
                  float& zmax) const;
    /// (max − min)·0.5 + min per axis: the difference in float, the rest in
    /// double, rounded to float. (0, 0, 0) for an empty box.
    void getCenter(float& x, float& y, float& z) const;
    /// The half extent (max − min)·0.5 per axis in the same precisions as
    /// getCenter; (−1, −1, −1) for an empty box.
    void getSize(float& x, float& y, float& z) const;

    /// The union with `other`, field by field (flags ignored); the result is
    /// not empty. `b += b` returns at once and changes nothing.
    OxBBoxf& operator+=(const OxBBoxf& other);

    /// Reads the six floats, multiplies each by `scale` (in float) and marks
    /// the box not empty, whatever the reads returned. Returns the sum of the
    /// reads' results; every field is attempted.
    long long readValue(OxInput& input, float scale);
    /// Writes scale × field (in float) for each field; the box is not
    /// changed. Stops at the first failed write: returns 4 bytes per field
    /// written before it, 24 in full.
    long long writeValue(OxOutput& output, float scale);
    /// The extents table, or "Empty bounding box.\n". Returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    friend class OxBBox;
    friend int operator==(const OxBBoxf& a, const OxBBoxf& b);
    /// The six fields in field order, as pointers.
    template <class Self> static auto fields(Self& self);

    float xmin, ymin, zmin, xmax, ymax, zmax;
    OxBool empty;
};

/// A bounding box in double precision.
class OXBASE_API OxBBox {
public:
    /// Empty: flag set, the largest double in the lower fields and the most
    /// negative double in the upper ones.
    OxBBox();
    /// Not empty.
    OxBBox(double xmin, double ymin, double zmin, double xmax, double ymax, double zmax);
    OxBBox(const OxBBox& other) = default;
    /// Widened exactly, flag copied: an empty float box gives an empty box
    /// that holds the float markers as doubles.
    OxBBox(OxBBoxf other);
    const OxBBox& operator=(const OxBBox& other);
    const OxBBox& operator=(const OxBBoxf& other);

    OxBool isEmpty() const { return empty; }
    void setValue(double xmin, double ymin, double zmin, double xmax, double ymax, double zmax);
    /// Lower field c − h, upper field h + c per axis; not empty. The vectors
    /// are not changed.
    void setValue(OxVec3d& center, OxVec3d& halfSize);
    void getValue(double& xmin, double& ymin, double& zmin, double& xmax, double& ymax,
                  double& zmax) const;
    /// (max − min)·0.5 + min per axis; (0, 0, 0) for an empty box.
    void getCenter(double& x, double& y, double& z) const;
    /// The half extent (max − min)·0.5 per axis; (−1, −1, −1) for an empty box.
    void getSize(double& x, double& y, double& z) const;

    /// The union with `other`, as for OxBBoxf.
    OxBBox& operator+=(const OxBBox& other);

    /// Reads the six doubles and marks the box not empty; returns the sum of
    /// the reads' results, every field attempted.
    long long readValue(OxInput& input);
    /// Stops at the first failed write: 8 bytes per field written before it,
    /// 48 in full.
    long long writeValue(OxOutput& output);
    /// The extents table, or "Empty bounding box.\n". Returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    friend class OxBBoxf;
    friend int operator==(const OxBBox& a, const OxBBox& b);
    template <class Self> static auto fields(Self& self);

    double xmin, ymin, zmin, xmax, ymax, zmax;
    OxBool empty;
};

/// A bounding rectangle in the (U, V) parameter plane, in double precision.
class OXBASE_API OxBRect {
public:
    /// Empty: flag set, the largest double in umin, vmin and the most
    /// negative double in umax, vmax.
    OxBRect();
    /// Not empty.
    OxBRect(double umin, double vmin, double umax, double vmax);
    OxBRect(const OxBRect& other) = default;
    const OxBRect& operator=(const OxBRect& other);

    OxBool isEmpty() const { return empty; }
    void setValue(double umin, double vmin, double umax, double vmax);
    void getValue(double& umin, double& vmin, double& umax, double& vmax) const;

    /// The union with `other`, as for OxBBoxf.
    OxBRect& operator+=(const OxBRect& other);

    /// Reads the four doubles and marks the rectangle not empty; returns the
    /// sum of the reads' results, every field attempted.
    long long readValue(OxInput& input);
    /// Stops at the first failed write: 8 bytes per field written before it,
    /// 32 in full.
    long long writeValue(OxOutput& output);
    /// The extents table, or "Empty bounding rectangle.\n". Returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    template <class Self> static auto fields(Self& self);

    double umin, vmin, umax, vmax;
    OxBool empty;
};

/// The union of a and b, a new object that is not empty: every lower field
/// the smaller of the two, every upper field the larger (a NaN field yields
/// to a number). The flags are not looked at.
OXBASE_API OxBBox operator+(const OxBBox& a, const OxBBox& b);
OXBASE_API OxBBoxf operator+(const OxBBoxf& a, const OxBBoxf& b);
OXBASE_API OxBRect operator+(const OxBRect& a, const OxBRect& b);

/// 1 when every field differs by at most the fixed 1e-5 (not OxEPSPtPt); the
/// flags are not compared. In OxBBoxf the difference is taken in float.
OXBASE_API int operator==(const OxBBox& a, const OxBBox& b);
OXBASE_API int operator!=(const OxBBox& a, const OxBBox& b);
OXBASE_API int operator==(const OxBBoxf& a, const OxBBoxf& b);
OXBASE_API int operator!=(const OxBBoxf& a, const OxBBoxf& b);

#endif
