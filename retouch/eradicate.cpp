// Blemish removal: the pixels of a disc that are darker in green than the
// disc's surroundings are pulled toward the surroundings' mean colour, fully
// at the centre and not at all on the rim.
#include <pxfx/retouch.h>

#include <algorithm>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

namespace {

struct Rect {
    int32_t x0, x1, y0, y1; // columns [x0, x1), rows [y0, y1]
};

int32_t dist(int32_t x, int32_t y, int32_t cx, int32_t cy) {
    const int64_t dx = static_cast<int64_t>(x) - cx, dy = static_cast<int64_t>(y) - cy;
    return static_cast<int32_t>(
        distance2d(static_cast<int32_t>(dx < 0 ? -dx : dx), static_cast<int32_t>(dy < 0 ? -dy : dy)));
}

template <class F> void eradicate(const View &img, int32_t cx, int32_t cy, int32_t r, const Rect &q) {
    int64_t sb = 0, sg = 0, sr = 0, count = 0;
    for (int32_t y = q.y0; y <= q.y1; ++y) {
        const typename F::CRow in = F::crow(img, y);
        for (int32_t x = q.x0; x < q.x1; ++x) {
            if (dist(x, y, cx, cy) < r) continue;
            const uint32_t c = F::load(in, x);
            sb += blue_of(c);
            sg += green_of(c);
            sr += red_of(c);
            ++count;
        }
    }
    if (count == 0) return;
    const int64_t ab = sb / count, ag = sg / count, ar = sr / count;
    auto pull = [r](int64_t v, int64_t target, int64_t w) -> uint32_t {
        const int64_t res = v + w * (target - v) / r;
        return res > 255 ? 255u : static_cast<uint32_t>(res);
    };
    for (int32_t y = q.y0; y <= q.y1; ++y) {
        const typename F::CRow in = F::crow(img, y);
        const typename F::Row row = F::row(img, y);
        for (int32_t x = q.x0; x < q.x1; ++x) {
            const int32_t d = dist(x, y, cx, cy);
            if (d > r) continue;
            const uint32_t c = F::load(in, x);
            const int64_t g = ag - green_of(c);
            if (g <= 1) continue;
            const int64_t w = static_cast<int64_t>(r) - d;
            F::store(row, x,
                     pack(pull(blue_of(c), ab, w), pull(green_of(c), ag, w), pull(red_of(c), ar, w), alpha_of(c)));
        }
    }
}

} // namespace

extern "C" {

void alg_Img_Eradicate(Image *picture, int32_t cx, int32_t cy, int32_t r) {
    const std::optional<View> v = view_of(picture);
    if (!v) return;
    const int64_t x0 = std::max<int64_t>(static_cast<int64_t>(cx) - r, 0);
    const int64_t x1 = std::min<int64_t>(static_cast<int64_t>(cx) + r, v->width - 1);
    const int64_t y0 = std::max<int64_t>(static_cast<int64_t>(cy) - r, 0);
    const int64_t y1 = std::min<int64_t>(static_cast<int64_t>(cy) + r, v->height - 1);
    if (x0 >= x1 || y0 > y1) return;
    const Rect q{static_cast<int32_t>(x0), static_cast<int32_t>(x1), static_cast<int32_t>(y0),
                 static_cast<int32_t>(y1)};
    with_format(v->bitCount, [&](auto f) { eradicate<decltype(f)>(*v, cx, cy, r, q); });
}

} // extern "C"
