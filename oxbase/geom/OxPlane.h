// OxPlane.h: a plane given by one of its points and a unit normal.
//
// The plane is the partner of OxLine in the library's intersection and
// projection queries. Its normal is normalised on construction; a zero
// normal stays (0, 0, 0), which is also the state of a default plane, and
// such a plane has no projection. It has no text or file form.
//
//   OxPlane floor(OxVec3d(0, 0, 2), OxVec3d(0, 0, 5));   // normal (0, 0, 1)
//   OxVec3d p(3, 4, 0);
//   std::unique_ptr<OxVec3d> foot(floor.project(p));    // (3, 4, 2)
#ifndef OXBASE_GEOM_OXPLANE_H
#define OXBASE_GEOM_OXPLANE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"
#include "oxbase/geom/OxVec.h"

class OxLine;
class OxRot;

class OXBASE_API OxPlane {
public:
    /// Origin and normal both (0, 0, 0).
    OxPlane();
    /// Copies both and normalises the normal (a zero vector stays zero).
    OxPlane(OxVec3d const& origin, OxVec3d const& normal);
    /// The normal is the third column of `m`, (m[0][2], m[1][2], m[2][2]),
    /// normalised: OxRot() gives (0, 0, 1).
    OxPlane(OxVec3d const& origin, OxRot const& m);
    OxPlane(const OxPlane& other) = default;
    OxPlane& operator=(OxPlane const& other);

    OxVec3d const& getOrigin() const { return origin; }
    OxVec3d const& getNormal() const { return normal; }
    /// The normals compared by OxVec3d's operator== (OxEPSPtPt + OxEPSZero
    /// per coordinate). Normals of opposite sense are not parallel.
    OxBool isParallel(OxPlane const& other) const;
    /// A new vector, which the caller deletes: the foot of the perpendicular
    /// from `p`, p + (normal·(origin − p))·normal, or (0, 0, 0) when the
    /// perpendicular line through `p` is parallel to the plane, which happens
    /// only for a zero normal (|normal·normal| below OxEPSZero). `p` is not
    /// changed.
    OxVec3d* project(OxVec3d& p) const;

private:
    OxVec3d origin;
    OxVec3d normal;
};

#endif
