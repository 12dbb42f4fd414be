// Polar transforms around the image centre: punch, pinch, swirl, cylinder and
// bathroom glass, all through one inverse-mapping engine.
#include <pxfx/deform.h>

#include <cmath>
#include <cstdlib>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kPunch = 0, kPinch = 1, kSwirl = 2, kCylinder = 3;

// The divisor of the cylinder's angle (deliberately not the library's 2 pi).
constexpr double kTurn = 6.2831852;

struct Circle {
    int32_t mode;
    int32_t width, height, cx, cy;
    double radius; // R, compared with r in double precision
    double factor; // swirl factor widened to double
};

struct Coord {
    int64_t x, y;
};

// Source coordinate of the result pixel (x, y) lying at distance r < R from
// the centre, with dx = cx - x, dy = cy - y. Inside the circle the punch,
// pinch and swirl act on the picture mirrored about the centre column:
// with r' = r and theta' = theta they give (2 cx - x, y).
Coord inside_source(const Circle &c, int32_t x, int32_t y, int64_t dx, int64_t dy, double r) {
    if (c.mode >= 4) return {static_cast<int64_t>(x) + (x & 31) - 16, y};
    const double theta = std::atan2(static_cast<double>(dy), static_cast<double>(dx));
    if (c.mode == kCylinder)
        return {trunc_sat<int32_t>(std::fabs(theta * c.width / kTurn)),
                trunc_sat<int32_t>(std::fabs(r * c.height / c.radius))};
    double rr = r * r / c.radius; // punch, and every negative mode
    double th = theta;
    if (c.mode == kPinch) {
        rr = std::sqrt(r * c.radius);
    } else if (c.mode == kSwirl) {
        rr = r;
        th = theta + r / c.factor;
    }
    return {c.cx + static_cast<int64_t>(trunc_sat<int32_t>(rr * std::cos(th))),
            c.cy - static_cast<int64_t>(trunc_sat<int32_t>(rr * std::sin(th)))};
}

template <class S, class D> void circle_transform(const View &src, const View &dst, const Circle &c) {
    // Every pixel outside the circle takes the source's pixel (0, 0).
    const uint32_t outside = S::load(S::crow(src, 0), 0);
    for (int32_t y = 0; y < c.height; ++y) {
        const int64_t dy = c.cy - y;
        const int64_t dy2 = dy * dy;
        const typename D::Row out = D::row(dst, y);
        for (int32_t x = 0; x < c.width; ++x) {
            const int64_t dx = c.cx - x;
            // The squared distance goes through single precision first.
            const double r = std::sqrt(static_cast<double>(static_cast<float>(dx * dx + dy2)));
            if (!(r < c.radius)) {
                D::store(out, x, outside);
                continue;
            }
            const Coord s = inside_source(c, x, y, dx, dy, r);
            D::store(out, x, S::load(S::crow(src, clamp_coord(s.y, c.height)), clamp_coord(s.x, c.width)));
        }
    }
}

} // namespace

extern "C" {

uint32_t CircleTransform(Image *src, Image **dst, int32_t mode, int32_t radius, float factor) {
    if (src == nullptr) return 0;
    return draw_result(src, dst, [&](const View &from, const View &to) {
        Circle c;
        c.mode = mode;
        c.width = from.width;
        c.height = from.height;
        c.cx = c.width / 2;
        c.cy = c.height / 2;
        if (radius == 0) {
            const int64_t half2 = static_cast<int64_t>(c.cx) * c.cx + static_cast<int64_t>(c.cy) * c.cy;
            radius = static_cast<int32_t>(std::sqrt(static_cast<double>(static_cast<float>(half2))));
        }
        c.radius = radius;
        c.factor = factor == 0.0f ? 1.0 : static_cast<double>(factor);
        with_formats(from, to, [&](auto s, auto d) { circle_transform<decltype(s), decltype(d)>(from, to, c); });
    });
}

uint32_t Punch_Transform(Image *src, Image **dst) { return CircleTransform(src, dst, kPunch, 0, 100.0f); }

uint32_t Pinch_Transform(Image *src, Image **dst) { return CircleTransform(src, dst, kPinch, 0, 100.0f); }

uint32_t Swirl_Transform(Image *src, Image **dst) { return CircleTransform(src, dst, kSwirl, 0, 100.0f); }

uint32_t Cylinder_Transform(Image *src, Image **dst) { return CircleTransform(src, dst, kCylinder, 0, 100.0f); }

uint32_t Bathroom_Transform(Image *src, Image **dst) { return CircleTransform(src, dst, 4, 0, 1.0f); }

} // extern "C"
