// Contrast boost around the mean green of an eye ellipse, full in the inner
// part of the ellipse and fading toward its rim.
#include <pxfx/retouch.h>

#include <algorithm>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

namespace {

uint32_t abs_diff(int64_t a, int64_t b) { return static_cast<uint32_t>(a > b ? a - b : b - a); }

struct Area {
    int32_t x0, x1, y0, y1; // end bounds exclusive
    int64_t a, cy, f1, f2;
    int64_t sum(int32_t x, int32_t y) const {
        const int32_t dy = static_cast<int32_t>(abs_diff(y, cy));
        return static_cast<int64_t>(distance2d(static_cast<int32_t>(abs_diff(x, f1)), dy)) +
               distance2d(static_cast<int32_t>(abs_diff(x, f2)), dy);
    }
};

template <class F> int64_t green_sum(const View &img, const Area &q) {
    int64_t s = 0;
    for (int32_t y = q.y0; y < q.y1; ++y) {
        const typename F::CRow in = F::crow(img, y);
        for (int32_t x = q.x0; x < q.x1; ++x)
            s += green_of(F::load(in, x));
    }
    return s;
}

template <class F> void boost(const View &img, const Area &q, const uint8_t table[256]) {
    for (int32_t y = q.y0; y < q.y1; ++y) {
        const typename F::CRow in = F::crow(img, y);
        const typename F::Row out = F::row(img, y);
        for (int32_t x = q.x0; x < q.x1; ++x) {
            const int64_t e = q.sum(x, y);
            if (e > 2 * q.a) continue;
            const uint32_t c = F::load(in, x);
            uint32_t ch[3] = {blue_of(c), green_of(c), red_of(c)};
            if (e > q.a) {
                const float w = static_cast<float>(2 * q.a - e) / static_cast<float>(q.a);
                for (uint32_t &v : ch)
                    v = static_cast<uint32_t>(
                        static_cast<float>(v) +
                        static_cast<float>(static_cast<int32_t>(table[v]) - static_cast<int32_t>(v)) * w);
            } else {
                for (uint32_t &v : ch)
                    v = table[v];
            }
            F::store(out, x, pack(ch[0], ch[1], ch[2], alpha_of(c)));
        }
    }
}

} // namespace

extern "C" {

void alg_Img_EyesMoreContrast_ellipse(Image *img, int32_t cx, int32_t cy, int32_t a, int32_t contrast) {
    const std::optional<View> v = view_of(img);
    if (!v) return;
    const int64_t half = a / 2;
    const int64_t y0 = std::max<int64_t>(cy - half, 0);
    const int64_t y1 = std::min<int64_t>(cy + (static_cast<int64_t>(a) + 1) / 2, v->height - 1);
    const int64_t x0 = std::max<int64_t>(static_cast<int64_t>(cx) - a, 0);
    const int64_t x1 = std::min<int64_t>(static_cast<int64_t>(cx) + a, v->width - 1);
    if (y1 <= y0 || x1 <= x0) return;
    const uint32_t ua = static_cast<uint32_t>(a), uh = static_cast<uint32_t>(half);
    const int64_t f = isqrt_round(ua * ua - uh * uh);
    const Area q{static_cast<int32_t>(x0),
                 static_cast<int32_t>(x1),
                 static_cast<int32_t>(y0),
                 static_cast<int32_t>(y1),
                 a,
                 cy,
                 std::clamp<int64_t>(cx - f, 0, v->width - 1),
                 std::clamp<int64_t>(cx + f, 0, v->width - 1)};
    const float gain = static_cast<float>(static_cast<int64_t>(contrast) + 100) / 100.0f;
    with_format(v->bitCount, [&](auto fmt) {
        using F = decltype(fmt);
        const int64_t m = (green_sum<F>(*v, q) / (y1 - y0 + 1)) / (x1 - x0 + 1);
        uint8_t table[256];
        for (int32_t i = 0; i < 256; ++i) {
            const float t = static_cast<float>(i - m) * gain + static_cast<float>(m) + 0.5f;
            table[i] = t < 0.0f ? 0 : (t >= 255.0f ? 255 : static_cast<uint8_t>(static_cast<int32_t>(t)));
        }
        boost<F>(*v, q, table);
    });
}

} // extern "C"
