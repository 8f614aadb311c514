#include "oxbase/geom/OxBBox.h"

#include "oxbase/geom/OxVec.h"
#include "oxbase/geom/detail/OxGeomDetail.h"

#include <array>
#include <cmath>
#include <cstddef>
#include <iomanip>
#include <limits>

using namespace oxbase::detail;

// The three classes differ in precision and in their number of axes; the
// helpers below work on the fields as an array of pointers in field order,
// the lower fields in the first half and the upper ones in the second.
namespace {
constexpr double kFixedTolerance = 1e-5;

template <class T, std::size_t K> void setEmptyMarkers(const std::array<T*, K>& fields) {
    for (std::size_t i = 0; i < K; i++) {
        *fields[i] = i < K / 2 ? std::numeric_limits<T>::max() : std::numeric_limits<T>::lowest();
    }
}

template <class T, std::size_t K>
void setFields(const std::array<T*, K>& fields, const std::array<T, K>& values) {
    for (std::size_t i = 0; i < K; i++) {
        *fields[i] = values[i];
    }
}

template <class T, std::size_t K>
void getFields(const std::array<const T*, K>& fields, const std::array<T*, K>& values) {
    for (std::size_t i = 0; i < K; i++) {
        *values[i] = *fields[i];
    }
}

/// The smaller (Lower) or larger of two values; a number wins over NaN, as
/// with fmin and fmax, but inline, so that a long union stays in registers.
template <bool Lower, class T> T pick(T mine, T other) {
    const bool otherWins = Lower ? other < mine : other > mine;
    return otherWins || std::isnan(mine) ? other : mine;
}

/// Lower fields take the smaller value, upper fields the larger.
template <class T, std::size_t K>
void unite(const std::array<T*, K>& self, const std::array<const T*, K>& other) {
    for (std::size_t i = 0; i < K / 2; i++) {
        *self[i] = pick<true>(*self[i], *other[i]);
    }
    for (std::size_t i = K / 2; i < K; i++) {
        *self[i] = pick<false>(*self[i], *other[i]);
    }
}

template <class T, std::size_t K>
int fieldsWithin(const std::array<const T*, K>& a, const std::array<const T*, K>& b) {
    for (std::size_t i = 0; i < K; i++) {
        const T difference = *a[i] - *b[i]; // in the box's precision
        if (!(std::fabs(difference) <= kFixedTolerance)) {
            return 0;
        }
    }
    return 1;
}

// Centre and half size of one axis: the difference in the box's precision,
// the product and the sum in double, the result back in the box's precision.
template <class T> T axisCentre(T lower, T upper) {
    const T difference = upper - lower;
    return static_cast<T>(static_cast<double>(difference) * 0.5 + lower);
}

template <class T> T axisHalfSize(T lower, T upper) {
    const T difference = upper - lower;
    return static_cast<T>(static_cast<double>(difference) * 0.5);
}

template <class T, class Measure>
void measureAxes(const std::array<const T*, 6>& fields, OxBool empty, T emptyValue, Measure measure,
                 T& x, T& y, T& z) {
    if (empty == OxTrue) {
        x = y = z = emptyValue;
        return;
    }
    x = measure(*fields[0], *fields[3]);
    y = measure(*fields[1], *fields[4]);
    z = measure(*fields[2], *fields[5]);
}

template <class T>
void setFromCentre(const std::array<T*, 6>& fields, const OxVec3d& center,
                   const OxVec3d& halfSize) {
    for (int i = 0; i < 3; i++) {
        *fields[i] = static_cast<T>(center[i] - halfSize[i]);
        *fields[i + 3] = static_cast<T>(halfSize[i] + center[i]);
    }
}

/// The table of a box: a heading and one line per axis, the columns
/// `columnWidth` wide; the numbers in the stream's current format.
template <class T>
std::ostrstream* dumpBox(std::ostrstream* stream, const std::array<const T*, 6>& fields,
                         OxBool empty, int headWidth, int columnWidth) {
    if (empty == OxTrue) {
        *stream << "Empty bounding box."
                << "\n";
        return stream;
    }
    *stream << std::setw(headWidth) << " "
            << "min" << std::setw(columnWidth) << "max"
            << "\n";
    const char* const labels[3] = {"X ", "Y ", "Z "};
    for (int i = 0; i < 3; i++) {
        *stream << labels[i] << std::setw(columnWidth) << *fields[i] << std::setw(columnWidth)
                << *fields[i + 3] << "\n";
    }
    return stream;
}
} // namespace

// The fields of each class in field order, as pointers.
template <class Self> auto OxBBoxf::fields(Self& self) {
    return std::array{&self.xmin, &self.ymin, &self.zmin, &self.xmax, &self.ymax, &self.zmax};
}

template <class Self> auto OxBBox::fields(Self& self) {
    return std::array{&self.xmin, &self.ymin, &self.zmin, &self.xmax, &self.ymax, &self.zmax};
}

template <class Self> auto OxBRect::fields(Self& self) {
    return std::array{&self.umin, &self.vmin, &self.umax, &self.vmax};
}

// ---------------------------------------------------------------------------
// OxBBoxf

OxBBoxf::OxBBoxf() : empty(OxTrue) {
    setEmptyMarkers(fields(*this));
}

OxBBoxf::OxBBoxf(float xLow, float yLow, float zLow, float xHigh, float yHigh, float zHigh)
    : empty(OxFalse) {
    setValue(xLow, yLow, zLow, xHigh, yHigh, zHigh);
}

const OxBBoxf& OxBBoxf::operator=(const OxBBoxf& other) {
    copyFields(fields(*this), fields(other));
    empty = other.empty;
    return *this;
}

const OxBBoxf& OxBBoxf::operator=(const OxBBox& other) {
    copyFields(fields(*this), OxBBox::fields(other));
    empty = other.empty;
    return *this;
}

void OxBBoxf::setValue(float xLow, float yLow, float zLow, float xHigh, float yHigh, float zHigh) {
    setFields(fields(*this), {xLow, yLow, zLow, xHigh, yHigh, zHigh});
    empty = OxFalse;
}

void OxBBoxf::setValue(OxVec3d& center, OxVec3d& halfSize) {
    setFromCentre(fields(*this), center, halfSize);
    empty = OxFalse;
}

void OxBBoxf::getValue(float& xLow, float& yLow, float& zLow, float& xHigh, float& yHigh,
                       float& zHigh) const {
    getFields(fields(*this), {&xLow, &yLow, &zLow, &xHigh, &yHigh, &zHigh});
}

void OxBBoxf::getCenter(float& x, float& y, float& z) const {
    measureAxes(fields(*this), empty, 0.0f, axisCentre<float>, x, y, z);
}

void OxBBoxf::getSize(float& x, float& y, float& z) const {
    measureAxes(fields(*this), empty, -1.0f, axisHalfSize<float>, x, y, z);
}

OxBBoxf& OxBBoxf::operator+=(const OxBBoxf& other) {
    if (this != &other) {
        unite(fields(*this), fields(other));
        empty = OxFalse;
    }
    return *this;
}

long long OxBBoxf::readValue(OxInput& input, float scale) {
    empty = OxFalse;
    return oxbase::detail::readScaledFields(input, fields(*this), scale);
}

long long OxBBoxf::writeValue(OxOutput& output, float scale) {
    return oxbase::detail::writeFields(output, fields(*this), oxbase::detail::Scaled{scale});
}

std::ostrstream* OxBBoxf::dump(std::ostrstream* stream) const {
    return dumpBox(stream, fields(*this), empty, 12, 13);
}

OxBBoxf operator+(const OxBBoxf& a, const OxBBoxf& b) {
    OxBBoxf sum(a);
    sum += b;
    return sum;
}

int operator==(const OxBBoxf& a, const OxBBoxf& b) {
    return fieldsWithin(OxBBoxf::fields(a), OxBBoxf::fields(b));
}

int operator!=(const OxBBoxf& a, const OxBBoxf& b) {
    return a == b ? 0 : 1;
}

// ---------------------------------------------------------------------------
// OxBBox

OxBBox::OxBBox() : empty(OxTrue) {
    setEmptyMarkers(fields(*this));
}

OxBBox::OxBBox(double xLow, double yLow, double zLow, double xHigh, double yHigh, double zHigh)
    : empty(OxFalse) {
    setValue(xLow, yLow, zLow, xHigh, yHigh, zHigh);
}

OxBBox::OxBBox(OxBBoxf other) : empty(other.empty) {
    copyFields(fields(*this), OxBBoxf::fields(other));
}

const OxBBox& OxBBox::operator=(const OxBBox& other) {
    copyFields(fields(*this), fields(other));
    empty = other.empty;
    return *this;
}

const OxBBox& OxBBox::operator=(const OxBBoxf& other) {
    copyFields(fields(*this), OxBBoxf::fields(other));
    empty = other.empty;
    return *this;
}

void OxBBox::setValue(double xLow, double yLow, double zLow, double xHigh, double yHigh,
                      double zHigh) {
    setFields(fields(*this), {xLow, yLow, zLow, xHigh, yHigh, zHigh});
    empty = OxFalse;
}

void OxBBox::setValue(OxVec3d& center, OxVec3d& halfSize) {
    setFromCentre(fields(*this), center, halfSize);
    empty = OxFalse;
}

void OxBBox::getValue(double& xLow, double& yLow, double& zLow, double& xHigh, double& yHigh,
                      double& zHigh) const {
    getFields(fields(*this), {&xLow, &yLow, &zLow, &xHigh, &yHigh, &zHigh});
}

void OxBBox::getCenter(double& x, double& y, double& z) const {
    measureAxes(fields(*this), empty, 0.0, axisCentre<double>, x, y, z);
}

void OxBBox::getSize(double& x, double& y, double& z) const {
    measureAxes(fields(*this), empty, -1.0, axisHalfSize<double>, x, y, z);
}

OxBBox& OxBBox::operator+=(const OxBBox& other) {
    if (this != &other) {
        unite(fields(*this), fields(other));
        empty = OxFalse;
    }
    return *this;
}

long long OxBBox::readValue(OxInput& input) {
    empty = OxFalse;
    return oxbase::detail::readFields(input, fields(*this));
}

long long OxBBox::writeValue(OxOutput& output) {
    return oxbase::detail::writeFields(output, fields(*this), oxbase::detail::Unscaled());
}

std::ostrstream* OxBBox::dump(std::ostrstream* stream) const {
    return dumpBox(stream, fields(*this), empty, 14, 17);
}

OxBBox operator+(const OxBBox& a, const OxBBox& b) {
    OxBBox sum(a);
    sum += b;
    return sum;
}

int operator==(const OxBBox& a, const OxBBox& b) {
    return fieldsWithin(OxBBox::fields(a), OxBBox::fields(b));
}

int operator!=(const OxBBox& a, const OxBBox& b) {
    return a == b ? 0 : 1;
}

// ---------------------------------------------------------------------------
// OxBRect

OxBRect::OxBRect() : empty(OxTrue) {
    setEmptyMarkers(fields(*this));
}

OxBRect::OxBRect(double uLow, double vLow, double uHigh, double vHigh) : empty(OxFalse) {
    setValue(uLow, vLow, uHigh, vHigh);
}

const OxBRect& OxBRect::operator=(const OxBRect& other) {
    copyFields(fields(*this), fields(other));
    empty = other.empty;
    return *this;
}

void OxBRect::setValue(double uLow, double vLow, double uHigh, double vHigh) {
    setFields(fields(*this), {uLow, vLow, uHigh, vHigh});
    empty = OxFalse;
}

void OxBRect::getValue(double& uLow, double& vLow, double& uHigh, double& vHigh) const {
    getFields(fields(*this), {&uLow, &vLow, &uHigh, &vHigh});
}

OxBRect& OxBRect::operator+=(const OxBRect& other) {
    if (this != &other) {
        unite(fields(*this), fields(other));
        empty = OxFalse;
    }
    return *this;
}

long long OxBRect::readValue(OxInput& input) {
    empty = OxFalse;
    return oxbase::detail::readFields(input, fields(*this));
}

long long OxBRect::writeValue(OxOutput& output) {
    return oxbase::detail::writeFields(output, fields(*this), oxbase::detail::Unscaled());
}

std::ostrstream* OxBRect::dump(std::ostrstream* stream) const {
    if (empty == OxTrue) {
        *stream << "Empty bounding rectangle."
                << "\n";
        return stream;
    }
    *stream << std::setw(12) << " "
            << "min " << std::setw(13) << "max"
            << "\n";
    *stream << "U " << std::setw(13) << umin << " " << std::setw(13) << umax << "\n";
    *stream << "V " << std::setw(13) << vmin << " " << std::setw(13) << vmax << "\n";
    return stream;
}

OxBRect operator+(const OxBRect& a, const OxBRect& b) {
    OxBRect sum(a);
    sum += b;
    return sum;
}
