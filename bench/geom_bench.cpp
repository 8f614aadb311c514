// Throughput of the vector, rotation, bounding-box and line arithmetic, in
// operations per second, so that a regression in the hot value types shows.
#include "oxbase/geom/OxBBox.h"
#include "oxbase/geom/OxLimits.h"
#include "oxbase/geom/OxLine.h"
#include "oxbase/geom/OxPlane.h"
#include "oxbase/geom/OxRot.h"
#include "oxbase/geom/OxVec.h"

#include <benchmark/benchmark.h>

#include <vector>

namespace {
std::vector<OxVec3d> points(size_t count) {
    std::vector<OxVec3d> result;
    result.reserve(count);
    for (size_t i = 0; i < count; i++) {
        result.emplace_back(0.5 * static_cast<double>(i % 97), 1.0 + static_cast<double>(i % 13),
                            -2.0 + 0.25 * static_cast<double>(i % 7));
    }
    return result;
}

void VectorNormalizeCross(benchmark::State& state) {
    std::vector<OxVec3d> data = points(4096);
    for (auto _ : state) {
        OxVec3d sum;
        for (size_t i = 0; i + 1 < data.size(); i++) {
            OxVec3d a = data[i];
            a.normalize();
            sum += a.cross(data[i + 1]);
        }
        benchmark::DoNotOptimize(sum);
    }
    state.SetItemsProcessed(state.iterations() * 4095);
}
BENCHMARK(VectorNormalizeCross);

void VectorTimesRotation(benchmark::State& state) {
    std::vector<OxVec3d> data = points(4096);
    OxRot turn(OxVec3d(1, 2, 3), 0.7);
    for (auto _ : state) {
        for (OxVec3d& v : data) {
            v *= turn;
        }
        benchmark::DoNotOptimize(data.data());
    }
    state.SetItemsProcessed(state.iterations() * 4096);
}
BENCHMARK(VectorTimesRotation);

void HomogeneousPoints(benchmark::State& state) {
    std::vector<OxVec3d> data = points(4096);
    for (auto _ : state) {
        double total = 0.0;
        for (const OxVec3d& v : data) {
            OxVec4d weighted(v, 2.5);
            total += weighted.length();
        }
        benchmark::DoNotOptimize(total);
    }
    state.SetItemsProcessed(state.iterations() * 4096);
}
BENCHMARK(HomogeneousPoints);

void RotationProductAndInverse(benchmark::State& state) {
    OxRot a(0.3, 1.1, -0.7);
    OxRot b(2, 1, 0, 1, 2, 0, 0, 0, 1);
    for (auto _ : state) {
        OxRot p = a * b;
        OxRot inverse;
        benchmark::DoNotOptimize(p.inverse(inverse));
        benchmark::DoNotOptimize(inverse);
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(RotationProductAndInverse);

// The bound of many small boxes, as a translator gathers it over the faces of
// a part: one union per box into a running box.
void BoxUnion(benchmark::State& state) {
    std::vector<OxVec3d> data = points(4096);
    std::vector<OxBBox> boxes;
    boxes.reserve(data.size());
    for (const OxVec3d& p : data) {
        boxes.emplace_back(p.x, p.y, p.z, p.x + 0.5, p.y + 1.0, p.z + 0.25);
    }
    for (auto _ : state) {
        OxBBox bound;
        for (const OxBBox& box : boxes) {
            bound += box;
        }
        benchmark::DoNotOptimize(bound);
    }
    state.SetItemsProcessed(state.iterations() * 4096);
}
BENCHMARK(BoxUnion);

// Finite segments against one oblique plane: crossings, misses beyond the
// ends, and segments that run parallel to it.
void LinePlaneIntersection(benchmark::State& state) {
    std::vector<OxVec3d> data = points(4096);
    std::vector<OxLine> lines;
    lines.reserve(data.size());
    for (size_t i = 0; i < data.size(); i++) {
        lines.emplace_back(data[i], data[(i * 7 + 1) % data.size()], OxLine::FINITE);
    }
    const OxPlane plane(OxVec3d(10, 5, -1), OxVec3d(1, 2, 3));
    for (auto _ : state) {
        OxVec3d point;
        double t = 0.0;
        OxBool found = OxFalse;
        int hits = 0;
        for (OxLine& line : lines) {
            line.intersect(plane, point, t, found);
            hits += found;
        }
        benchmark::DoNotOptimize(hits);
        benchmark::DoNotOptimize(point);
    }
    state.SetItemsProcessed(state.iterations() * 4096);
}
BENCHMARK(LinePlaneIntersection);
} // namespace

int main(int argc, char** argv) {
    OxLimits::initTolerances();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
