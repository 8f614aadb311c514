// OxLine.h: a straight line through two points, bounded by them or infinite.
//
// A line keeps its first point, the unit direction towards the second and
// their distance. It has two kinds of parameter: the distance s along the
// unit direction (what eval takes; the second point is at s = length), and
// the relative parameter t = s / length (0 at the first point, 1 at the
// second), which the intersections hand out and on which the bounds of a
// FINITE line are tested. The thresholds are OxLimits::OxEPSZero, so the
// tolerances must have been initialised for them to mean anything.
//
//   OxLine a(OxVec3d(0, 0, 0), OxVec3d(2, 0, 0), OxLine::FINITE);
//   OxVec3d point;  double t1, t2;  OxBool found;
//   if (a.intersect(b, point, t1, t2, found) && found) { ... }   // closest approach
#ifndef OXBASE_GEOM_OXLINE_H
#define OXBASE_GEOM_OXLINE_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxTypes.h"
#include "oxbase/geom/OxVec.h"

#include <ostream>

class OxPlane;

// Windows headers define INFINITE as a macro; the enumerator keeps its name
// whatever was included before this header.
#pragma push_macro("INFINITE")
#undef INFINITE

class OXBASE_API OxLine {
public:
    enum TYPE { FINITE = 0, INFINITE = 1 };

    /// Position (0, 0, 0), direction (1, 0, 0), length 0.0, INFINITE.
    OxLine();
    /// The line from p1 to p2: position p1, length their distance, direction
    /// (p2 − p1) normalised, which is (0, 0, 0) when the points coincide.
    OxLine(OxVec3d const& p1, OxVec3d const& p2, OxLine::TYPE type);
    OxLine(const OxLine& other) = default;
    OxLine& operator=(OxLine const& other);

    void setValue(OxVec3d const& p1, OxVec3d const& p2, OxLine::TYPE type);
    OxVec3d const& getPosition() const { return position; }
    OxVec3d const& getDirection() const { return direction; }
    double getLength() const { return length; }
    OxBool isInfinite() const { return OxToBool(type == INFINITE); }
    /// position + s·direction, s being the distance along the line.
    OxVec3d eval(double s) const;
    /// The dot product of the two spans p2 − p1: the directions' dot product
    /// times both lengths.
    double dot(OxLine const& other) const;

    /// Closest approach of this line and `other`; the lines need not meet.
    /// OxFalse, with `found` OxFalse, when either length is below OxEPSZero
    /// (or NaN): the question cannot be asked. Otherwise OxTrue, and `found`
    /// tells whether there is an answer: OxFalse for parallel lines (the
    /// determinant of the closest-approach system below OxEPSZero, or NaN)
    /// and when a FINITE line's relative parameter of its closest point lies
    /// outside 0 to 1 (the bounds are inside; NaN is outside). With `found`
    /// OxTrue, `point` is the midpoint of the two closest points and t1, t2
    /// are their relative parameters on this line and on `other`. `point`,
    /// t1 and t2 are written only when `found` becomes OxTrue. Skew lines are
    /// found however far apart they pass.
    OxBool intersect(OxLine const& other, OxVec3d& point, double& t1, double& t2, OxBool& found);
    /// Intersection with `plane`; always OxTrue. `found` is OxFalse when the
    /// line runs parallel to the plane (|normal·direction| below OxEPSZero,
    /// or NaN), with `point` and `t` untouched. Otherwise `t` receives the
    /// relative parameter of the crossing; a FINITE line crossing outside 0
    /// to 1 gives `found` OxFalse with `t` filled in and `point` untouched;
    /// else `point` is the crossing and `found` OxTrue. A line of length 0
    /// gives a non-finite t (±infinity or NaN, never a trap).
    OxBool intersect(OxPlane const& plane, OxVec3d& point, double& t, OxBool& found);
    /// The foot of the perpendicular from `p`: the intersection with the
    /// plane through `p` whose normal is the line's direction, with all the
    /// outputs and the result of that intersect. A FINITE line whose foot
    /// lies beyond an end gives `found` OxFalse with `t` filled in.
    OxBool project(OxVec3d p, OxVec3d& point, double& t, OxBool& found);

private:
    OxVec3d position;
    OxVec3d direction;
    double length;
    TYPE type;
};

#pragma pop_macro("INFINITE")

/// At precision 10: "Position: " right-aligned in a field of 18, the position,
/// ", Direction : " and the direction, each vector in the form of OxVec3d's
/// operator<<. No line end.
OXBASE_API std::ostream& operator<<(std::ostream& stream, const OxLine& line);

#endif
