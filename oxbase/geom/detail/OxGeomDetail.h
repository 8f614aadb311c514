// OxGeomDetail.h: element and field helpers shared by the geometry classes.
//
// Internal to oxbase/geom. The square matrices (OxRot, OxRot2d, OxMatrix)
// share their element loops; the bounding volumes (boxes and spheres) share
// the file form of their fields: every field is read and the results summed,
// writing stops at the first failed write and counts the bytes before it.
//
//   oxbase::detail::setIdentity<4>(m);
//   long long bytes = writeFields(output, fields, Scaled{2.0f});
//   float f = oxbase::detail::narrow(1e300);   // +infinity, by the IEEE rule
#ifndef OXBASE_GEOM_DETAIL_OXGEOMDETAIL_H
#define OXBASE_GEOM_DETAIL_OXGEOMDETAIL_H

#include "oxbase/io/OxInput.h"
#include "oxbase/io/OxOutput.h"

#include <array>
#include <cstddef>
#include <limits>

namespace oxbase {
namespace detail {

template <int N> void setIdentity(double (&m)[N][N]) {
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            m[i][j] = i == j ? 1.0 : 0.0;
        }
    }
}

template <int N> void copyMatrix(double (&to)[N][N], double const (&from)[N][N]) {
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            to[i][j] = from[i][j];
        }
    }
}

/// The whole matrix becomes the diagonal of `diagonal` (N values), 0.0 elsewhere.
template <int N> void scaleMatrix(double (&m)[N][N], const double* diagonal) {
    for (int i = 0; i < N; i++) {
        for (int j = 0; j < N; j++) {
            m[i][j] = i == j ? diagonal[i] : 0.0;
        }
    }
}

// Narrowing to float relies on IEEE single precision, where every finite
// double lies between two adjacent floats (the largest float and infinity
// included), so the conversion is defined for every value: round to nearest,
// beyond the float range to ±infinity, NaN stays NaN.
static_assert(std::numeric_limits<float>::is_iec559, "IEEE single precision is required");
static_assert(std::numeric_limits<double>::is_iec559, "IEEE double precision is required");

/// `value` rounded to the nearest float.
inline float narrow(double value) {
    return static_cast<float>(value);
}

/// Each field converted to the target's precision: exact when widening, the
/// nearest float when narrowing.
template <class To, class From, std::size_t K>
void copyFields(const std::array<To*, K>& to, const std::array<From*, K>& from) {
    for (std::size_t i = 0; i < K; i++) {
        *to[i] = static_cast<To>(*from[i]);
    }
}

/// Reads every field in order with OxInput::read and returns the sum of the
/// results; a failed read leaves its field as the reader left it.
template <class T, std::size_t K>
long long readFields(OxInput& input, const std::array<T*, K>& fields) {
    long long total = 0;
    for (T* field : fields) {
        total += input.read(*field); // every field is attempted
    }
    return total;
}

/// The value a field is written as when no scale applies.
struct Unscaled {
    template <class T> T operator()(T value) const { return value; }
};

/// Writes transform(field) for each field in order with OxOutput::write and
/// stops at the first write that fails. Returns the bytes written before it.
template <class T, std::size_t K, class Transform>
long long writeFields(OxOutput& output, const std::array<T*, K>& fields, Transform transform) {
    long long written = 0;
    for (T* field : fields) {
        if (output.write(transform(*field)) == OxFalse) {
            break;
        }
        written += static_cast<long long>(sizeof(T));
    }
    return written;
}

/// The value a float field is written as under a scale: the product in float.
struct Scaled {
    float scale;
    float operator()(float value) const { return scale * value; }
};

/// readFields, then every field multiplied by `scale` in float, the fields
/// that failed to read too. Returns the sum of the reads' results.
template <std::size_t K>
long long readScaledFields(OxInput& input, const std::array<float*, K>& fields, float scale) {
    const long long total = readFields(input, fields);
    for (float* field : fields) {
        *field *= scale;
    }
    return total;
}

} // namespace detail
} // namespace oxbase

#endif
