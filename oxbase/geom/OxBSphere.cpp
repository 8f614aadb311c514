#include "oxbase/geom/OxBSphere.h"

#include "oxbase/geom/OxVec.h"
#include "oxbase/geom/detail/OxGeomDetail.h"

#include <array>
#include <iomanip>

using namespace oxbase::detail;

// Both spheres are four numbers in file order; the helpers below work on
// them as an array of pointers.
namespace {
template <class T> void setNumbers(const std::array<T*, 4>& to, double x, double y, double z, T r) {
    *to[0] = static_cast<T>(x);
    *to[1] = static_cast<T>(y);
    *to[2] = static_cast<T>(z);
    *to[3] = r;
}

/// Each number after its label and before a line end; `precision` (when
/// positive) is set in front of each line.
template <class T>
std::ostrstream* dumpSphere(std::ostrstream* stream, const std::array<const T*, 4>& numbers,
                            OxBool empty, int precision) {
    if (empty == OxTrue) {
        *stream << "Empty bounding sphere."
                << "\n";
        return stream;
    }
    const char* const labels[4] = {"    x: ", "    y: ", "    z: ", "    r: "};
    for (std::size_t i = 0; i < 4; i++) {
        if (precision > 0) {
            *stream << std::setprecision(precision);
        }
        *stream << labels[i] << *numbers[i] << "\n";
    }
    return stream;
}
} // namespace

// The fields of each class in field order, as pointers.
template <class Self> auto OxBSpheref::fields(Self& self) {
    return std::array{&self.x, &self.y, &self.z, &self.r};
}

template <class Self> auto OxBSphere::fields(Self& self) {
    return std::array{&self.x, &self.y, &self.z, &self.r};
}

// ---------------------------------------------------------------------------
// OxBSpheref

OxBSpheref::OxBSpheref() : x(0.0f), y(0.0f), z(0.0f), r(0.0f), empty(OxTrue) {}

OxBSpheref::OxBSpheref(float cx, float cy, float cz, float radius)
    : x(cx), y(cy), z(cz), r(radius), empty(OxFalse) {}

OxBSpheref::OxBSpheref(OxVec3d const& center, float radius) : OxBSpheref() {
    setValue(center, radius);
}

const OxBSpheref& OxBSpheref::operator=(const OxBSpheref& other) {
    oxbase::detail::copyFields(fields(*this), fields(other));
    empty = other.empty;
    return *this;
}

const OxBSpheref& OxBSpheref::operator=(const OxBSphere& other) {
    oxbase::detail::copyFields(fields(*this), OxBSphere::fields(other));
    empty = other.empty;
    return *this;
}

void OxBSpheref::setValue(float cx, float cy, float cz, float radius) {
    setNumbers(fields(*this), cx, cy, cz, radius);
    empty = OxFalse;
}

void OxBSpheref::setValue(OxVec3d const& center, float radius) {
    setNumbers(fields(*this), center.x, center.y, center.z, radius);
    empty = OxFalse;
}

void OxBSpheref::getValue(float& cx, float& cy, float& cz, float& radius) const {
    cx = x;
    cy = y;
    cz = z;
    radius = r;
}

void OxBSpheref::getValue(OxVec3d& center, float& radius) const {
    center.setValue(x, y, z);
    radius = r;
}

long long OxBSpheref::readValue(OxInput& input, float scale) {
    empty = OxFalse;
    return oxbase::detail::readScaledFields(input, fields(*this), scale);
}

long long OxBSpheref::writeValue(OxOutput& output, float scale) {
    return oxbase::detail::writeFields(output, fields(*this), oxbase::detail::Scaled{scale});
}

std::ostrstream* OxBSpheref::dump(std::ostrstream* stream) const {
    return dumpSphere(stream, fields(*this), empty, 0);
}

// ---------------------------------------------------------------------------
// OxBSphere

OxBSphere::OxBSphere() : x(0.0), y(0.0), z(0.0), r(0.0), empty(OxTrue) {}

OxBSphere::OxBSphere(double cx, double cy, double cz, double radius)
    : x(cx), y(cy), z(cz), r(radius), empty(OxFalse) {}

OxBSphere::OxBSphere(OxVec3d const& center, double radius)
    : x(center.x), y(center.y), z(center.z), r(radius), empty(OxFalse) {}

OxBSphere::OxBSphere(OxBSpheref other) : OxBSphere() {
    *this = other;
}

const OxBSphere& OxBSphere::operator=(const OxBSphere& other) {
    oxbase::detail::copyFields(fields(*this), fields(other));
    empty = other.empty;
    return *this;
}

const OxBSphere& OxBSphere::operator=(const OxBSpheref& other) {
    oxbase::detail::copyFields(fields(*this), OxBSpheref::fields(other));
    empty = other.empty;
    return *this;
}

void OxBSphere::setValue(double cx, double cy, double cz, double radius) {
    setNumbers(fields(*this), cx, cy, cz, radius);
    empty = OxFalse;
}

void OxBSphere::setValue(OxVec3d const& center, double radius) {
    setNumbers(fields(*this), center.x, center.y, center.z, radius);
    empty = OxFalse;
}

void OxBSphere::getValue(double& cx, double& cy, double& cz, double& radius) const {
    cx = x;
    cy = y;
    cz = z;
    radius = r;
}

void OxBSphere::getValue(OxVec3d& center, double& radius) const {
    center.setValue(x, y, z);
    radius = r;
}

long long OxBSphere::readValue(OxInput& input) {
    empty = OxFalse;
    return oxbase::detail::readFields(input, fields(*this));
}

long long OxBSphere::writeValue(OxOutput& output) {
    return oxbase::detail::writeFields(output, fields(*this), oxbase::detail::Unscaled());
}

std::ostrstream* OxBSphere::dump(std::ostrstream* stream) const {
    return dumpSphere(stream, fields(*this), empty, 10);
}
