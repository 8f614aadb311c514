#include "oxbase/geom/OxLine.h"

#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/OxPlane.h"

#include <cmath>
#include <iomanip>
#include <limits>

namespace {
/// numerator / denominator with the IEEE result, also for a zero
/// denominator (±infinity, or NaN for 0/0 and NaN/0), without dividing by
/// zero.
double quotient(double numerator, double denominator) {
    if (denominator != 0.0) {
        return numerator / denominator;
    }
    if (numerator == 0.0 || std::isnan(numerator)) {
        return std::numeric_limits<double>::quiet_NaN();
    }
    const double infinity = std::numeric_limits<double>::infinity();
    return std::signbit(numerator) == std::signbit(denominator) ? infinity : -infinity;
}

/// |value| at least OxEPSZero; NaN is not.
bool clearOfZero(double value) {
    return std::fabs(value) >= OxLimits::OxEPSZero;
}

/// A relative parameter within the bounds 0 to 1, the bounds included; NaN is not.
bool withinBounds(double t) {
    return t >= 0.0 && t <= 1.0;
}
} // namespace

OxLine::OxLine() : direction(1.0, 0.0, 0.0), length(0.0), type(INFINITE) {}

OxLine::OxLine(OxVec3d const& p1, OxVec3d const& p2, OxLine::TYPE lineType)
    : length(0.0), type(lineType) {
    setValue(p1, p2, lineType);
}

OxLine& OxLine::operator=(OxLine const& other) {
    position = other.position;
    direction = other.direction;
    length = other.length;
    type = other.type;
    return *this;
}

void OxLine::setValue(OxVec3d const& p1, OxVec3d const& p2, OxLine::TYPE lineType) {
    position = p1;
    direction = p2 - p1;
    length = direction.normalize(); // the distance of the points
    type = lineType;
}

OxVec3d OxLine::eval(double s) const {
    return position + s * direction;
}

double OxLine::dot(OxLine const& other) const {
    return direction.dot(other.direction) * length * other.length;
}

OxBool OxLine::intersect(OxLine const& other, OxVec3d& point, double& t1, double& t2,
                         OxBool& found) {
    found = OxFalse;
    if (!(length >= OxLimits::OxEPSZero) || !(other.length >= OxLimits::OxEPSZero)) {
        return OxFalse;
    }
    const OxVec3d w = other.position - position;
    const double a = direction.dot(direction);
    const double b = direction.dot(other.direction);
    const double c = other.direction.dot(other.direction);
    const double d = w.dot(direction);
    const double e = w.dot(other.direction);
    const double den = a * c - b * b;
    if (!clearOfZero(den)) {
        return OxTrue; // parallel
    }
    const double s1 = quotient(d * c - e * b, den);
    const double s2 = quotient(d * b - e * a, den);
    const double u1 = quotient(s1, length);
    const double u2 = quotient(s2, other.length);
    if ((type == FINITE && !withinBounds(u1)) || (other.type == FINITE && !withinBounds(u2))) {
        return OxTrue;
    }
    point = 0.5 * eval(s1) + 0.5 * other.eval(s2);
    t1 = u1;
    t2 = u2;
    found = OxTrue;
    return OxTrue;
}

OxBool OxLine::intersect(OxPlane const& plane, OxVec3d& point, double& t, OxBool& found) {
    found = OxFalse;
    const double den = plane.getNormal().dot(direction);
    if (!clearOfZero(den)) {
        return OxTrue; // parallel to the plane
    }
    const double s = quotient(plane.getNormal().dot(plane.getOrigin() - position), den);
    t = quotient(s, length);
    if (type == FINITE && !withinBounds(t)) {
        return OxTrue;
    }
    point = eval(s);
    found = OxTrue;
    return OxTrue;
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the public signature
OxBool OxLine::project(OxVec3d p, OxVec3d& point, double& t, OxBool& found) {
    const OxPlane across(p, direction);
    return intersect(across, point, t, found);
}

std::ostream& operator<<(std::ostream& stream, const OxLine& line) {
    stream << std::setprecision(10) << std::setw(18) << "Position: " << line.getPosition()
           << ", Direction : " << line.getDirection();
    return stream;
}
