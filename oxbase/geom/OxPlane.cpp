#include "oxbase/geom/OxPlane.h"

#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/OxRot.h"

#include <cmath>

OxPlane::OxPlane() = default;

OxPlane::OxPlane(OxVec3d const& planeOrigin, OxVec3d const& planeNormal)
    : origin(planeOrigin), normal(planeNormal) {
    normal.normalize();
}

OxPlane::OxPlane(OxVec3d const& planeOrigin, OxRot const& m)
    : origin(planeOrigin), normal(m[0][2], m[1][2], m[2][2]) {
    normal.normalize();
}

OxPlane& OxPlane::operator=(OxPlane const& other) {
    origin = other.origin;
    normal = other.normal;
    return *this;
}

OxBool OxPlane::isParallel(OxPlane const& other) const {
    return OxToBool(normal == other.normal);
}

OxVec3d* OxPlane::project(OxVec3d& p) const {
    auto* foot = new OxVec3d();
    // The perpendicular through p runs along the normal itself (it is unit
    // already), so it is parallel to the plane exactly when normal·normal is
    // below the zero tolerance. The foot is formed from p directly rather than
    // through a second point p + normal, which would lose the direction for
    // coordinates far larger than 1.
    if (std::fabs(normal.dot(normal)) >= OxLimits::OxEPSZero) {
        *foot = p + normal.dot(origin - p) * normal;
    }
    return foot;
}
