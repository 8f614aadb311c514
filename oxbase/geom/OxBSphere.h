// OxBSphere.h: bounding spheres in double and float precision.
//
// A sphere is a centre (x, y, z), a radius r and an explicit empty flag. It
// is a container: no union, no enclosing-sphere computation, no comparison;
// the caller computes the sphere and stores it here. Unlike the boxes of
// OxBBox.h an empty sphere has no marker values, only the flag (a default
// sphere holds zeros), and the radius is not tested for sign. The file form
// is x, y, z, r big-endian, without the flag; the float sphere reads and
// writes with a scale.
//
//   OxBSphere s;                              // empty, all zero
//   s.setValue(OxVec3d(1, 2, 3), 4.0);        // no longer empty
//   s.writeValue(output);                     // 32 bytes
#ifndef OXBASE_GEOM_OXBSPHERE_H
#define OXBASE_GEOM_OXBSPHERE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"

class OxInput;
class OxOutput;
class OxVec3d;
class OxBSphere;

/// A bounding sphere in float precision.
class OXBASE_API OxBSpheref {
public:
    /// Empty: all four 0.0.
    OxBSpheref();
    /// Not empty.
    OxBSpheref(float x, float y, float z, float r);
    /// Not empty; the centre rounded to the nearest floats.
    OxBSpheref(OxVec3d const& center, float r);
    OxBSpheref(const OxBSpheref& other) = default;
    const OxBSpheref& operator=(const OxBSpheref& other);
    /// Each number rounded to the nearest float (beyond the float range
    /// ±infinity), the flag copied.
    const OxBSpheref& operator=(const OxBSphere& other);

    OxBool isEmpty() const { return empty; }
    void setValue(float x, float y, float z, float r);
    /// The centre rounded to the nearest floats; not empty.
    void setValue(OxVec3d const& center, float r);
    /// The stored numbers, also of an empty sphere.
    void getValue(float& x, float& y, float& z, float& r) const;
    /// The centre widened to double, and the radius.
    void getValue(OxVec3d& center, float& r) const;

    /// Reads x, y, z, r, multiplies all four by `scale` (in float) and marks
    /// the sphere not empty. Returns the sum of the reads' results; every
    /// number is attempted.
    long long readValue(OxInput& input, float scale);
    /// Writes scale × each number (in float); the sphere is not changed.
    /// Stops at the first failed write: 4 bytes per number written before
    /// it, 16 in full. An empty sphere writes what it holds.
    long long writeValue(OxOutput& output, float scale);
    /// "    x: " ... "    r: " lines in the stream's current format, or
    /// "Empty bounding sphere.\n". Returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    friend class OxBSphere;
    /// x, y, z, r as pointers, in file order.
    template <class Self> static auto fields(Self& self);

    float x, y, z, r;
    OxBool empty;
};

/// A bounding sphere in double precision.
class OXBASE_API OxBSphere {
public:
    /// Empty: all four 0.0.
    OxBSphere();
    /// Not empty.
    OxBSphere(double x, double y, double z, double r);
    OxBSphere(OxVec3d const& center, double r);
    OxBSphere(const OxBSphere& other) = default;
    /// Widened exactly, flag copied.
    OxBSphere(OxBSpheref other);
    const OxBSphere& operator=(const OxBSphere& other);
    const OxBSphere& operator=(const OxBSpheref& other);

    OxBool isEmpty() const { return empty; }
    void setValue(double x, double y, double z, double r);
    void setValue(OxVec3d const& center, double r);
    void getValue(double& x, double& y, double& z, double& r) const;
    void getValue(OxVec3d& center, double& r) const;

    /// Reads x, y, z, r and marks the sphere not empty; returns the sum of
    /// the reads' results, every number attempted.
    long long readValue(OxInput& input);
    /// Stops at the first failed write: 8 bytes per number written before
    /// it, 32 in full.
    long long writeValue(OxOutput& output);
    /// "    x: " ... "    r: " lines, each after setprecision(10), which stays
    /// in force on the stream; or "Empty bounding sphere.\n". Returns `stream`.
    std::ostrstream* dump(std::ostrstream* stream) const;

private:
    friend class OxBSpheref;
    template <class Self> static auto fields(Self& self);

    double x, y, z, r;
    OxBool empty;
};

#endif
