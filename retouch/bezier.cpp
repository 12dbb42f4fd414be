// Cubic Bezier curves of four control points, for drawing brush paths.
#include <pxfx/retouch.h>

#include <cstdint>

#include "core/internal/math.hpp"

namespace {

// One coordinate: power-basis coefficients in single precision, the first two
// formed in double.
int32_t coordinate(int32_t p0, int32_t p1, int32_t p2, int32_t p3, float t) {
    const float c = static_cast<float>(3.0 * (static_cast<double>(p1) - p0));
    const float b = static_cast<float>(3.0 * (static_cast<double>(p2) - p1) - c);
    const float a = static_cast<float>(static_cast<int64_t>(p3) - p0) - c - b;
    const float t2 = t * t;
    const float t3 = t2 * t;
    return pxfx::trunc_sat<int32_t>(a * t3 + b * t2 + c * t + static_cast<float>(p0));
}

} // namespace

extern "C" {

PXPoint PointOnCubicBezier(PXPoint *result, const PXPoint controls[4], float t) {
    PXPoint p{0, 0};
    if (controls != nullptr) {
        p.x = coordinate(controls[0].x, controls[1].x, controls[2].x, controls[3].x, t);
        p.y = coordinate(controls[0].y, controls[1].y, controls[2].y, controls[3].y, t);
    }
    if (result != nullptr) *result = p;
    return p;
}

void ComputeBezier(const PXPoint controls[4], int32_t n, PXPoint *result) {
    if (controls == nullptr || result == nullptr || n <= 0) return;
    if (n == 1) {
        result[0] = controls[0];
        return;
    }
    const float dt = static_cast<float>(1.0 / (n - 1));
    for (int32_t i = 0; i < n; ++i)
        PointOnCubicBezier(&result[i], controls, static_cast<float>(i) * dt);
}

} // extern "C"
