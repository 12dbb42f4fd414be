// Skin mask of a portrait: colour rule, removal of short runs, an 11 x 11
// erosion that reads the mask while rewriting it, and the clearing of the
// erosion marks. SmileDetect hands the mask out as a picture.
#include <pxfx/retouch.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kMinRun = 20;
constexpr int32_t kErodeHalf = 5;

template <class F> void colour_rule(const View &src, const View &mask) {
    const int32_t w = src.width, h = src.height;
    if constexpr (F::kBitCount == 24 || F::kBitCount == 32) {
        // Blue, green and red straight from the bytes of each pixel.
        constexpr int32_t n = F::kBitCount / 8;
        for (int32_t y = 0; y < h; ++y) {
            const uint8_t *in = src.row(y);
            uint8_t *m = mask.row(y);
            for (int32_t x = 0; x < w; ++x) {
                const uint8_t b = in[n * x], g = in[n * x + 1], r = in[n * x + 2];
                m[x] = r >= g && r >= b && r > 49 ? g : 0;
            }
        }
        return;
    }
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow in = F::crow(src, y);
        uint8_t *m = mask.row(y);
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = F::load(in, x);
            const uint32_t b = blue_of(c), g = green_of(c), r = red_of(c);
            m[x] = r >= g && r >= b && r > 49 ? static_cast<uint8_t>(g) : 0;
        }
    }
}

// Whether any of the eight bytes of v is 0.
constexpr bool has_zero_byte(uint64_t v) { return ((v - 0x0101010101010101u) & ~v & 0x8080808080808080u) != 0; }

// Runs shorter than kMinRun end at a zero byte or at the last column; the
// last column itself is never counted. Eight bytes before the last column
// that are all skin extend the run at once, eight zeros outside a run pass.
void remove_short_runs(const View &mask) {
    const int32_t w = mask.width, h = mask.height;
    for (int32_t y = 0; y < h; ++y) {
        uint8_t *m = mask.row(y);
        int32_t run = 0;
        for (int32_t x = 0; x < w; ++x) {
            if (x + 8 < w) {
                uint64_t eight;
                std::memcpy(&eight, m + x, 8);
                if (!has_zero_byte(eight) || (eight == 0 && run == 0)) {
                    run += eight != 0 ? 8 : 0;
                    x += 7;
                    continue;
                }
            }
            if (m[x] != 0 && x < w - 1) {
                ++run;
                continue;
            }
            if (run >= 1 && run < kMinRun)
                for (int32_t i = x - run; i < x; ++i)
                    m[i] = 0;
            run = 0;
        }
    }
}

// The erosion visits (x, y) in [5, w - 6) x [5, h - 6) row by row and marks a
// pixel 1 when its 11 x 11 window holds a 0 at that moment. A visited pixel
// is never 0 afterwards (its own position is in its window), so the zeros a
// window sees are the original zeros outside the visited area: everywhere in
// the rows below, at and right of x in row y, and in the border band (outside
// the visited rectangle) in row y to the left and in the rows above. These
// counts come from a summed-area table of the original zeros. The window of
// row y reads the table's rows y - 5 .. y + 6 only, so the table is kept as
// a ring of its last rows, each built from a mask row before any pixel of
// that row is visited.
bool erode(const View &mask) {
    constexpr int32_t kRing = 16; // a power of two above the 12 rows in use
    const int32_t w = mask.width, h = mask.height;
    const int32_t x0 = kErodeHalf, x1 = w - kErodeHalf - 1, y0 = kErodeHalf, y1 = h - kErodeHalf - 1;
    if (x1 <= x0 || y1 <= y0) return true;
    const size_t sw = static_cast<size_t>(w) + 1;
    Buffer<uint32_t> sat = alloc_buffer<uint32_t>(checked_size(sw, kRing));
    if (!sat) return false;
    auto table_row = [&](int32_t r) { return sat.get() + static_cast<size_t>(r & (kRing - 1)) * sw; };
    // Table row r + 1 counts the zeros of mask rows 0 .. r.
    int32_t built = 0;
    auto build_until = [&](int32_t end) {
        for (; built <= end; ++built) {
            uint32_t *cur = table_row(built);
            if (built == 0) {
                for (size_t i = 0; i < sw; ++i)
                    cur[i] = 0;
                continue;
            }
            const uint8_t *m = mask.row(built - 1);
            const uint32_t *prev = table_row(built - 1);
            uint32_t run = 0;
            cur[0] = 0;
            for (int32_t x = 0; x < w; ++x) {
                run += m[x] == 0;
                cur[x + 1] = prev[x + 1] + run;
            }
        }
    };
    // Zeros in rows [ya, yb) and columns [xa, xb), empty ranges giving 0.
    auto zeros = [&](int32_t ya, int32_t yb, int32_t xa, int32_t xb) -> uint32_t {
        if (ya >= yb || xa >= xb) return 0;
        const uint32_t *ra = table_row(ya), *rb = table_row(yb);
        return rb[xb] - rb[xa] - ra[xb] + ra[xa];
    };
    auto clip = [](int32_t v, int32_t lo, int32_t hi) { return v < lo ? lo : (v > hi ? hi : v); };
    for (int32_t y = y0; y < y1; ++y) {
        build_until(y + kErodeHalf + 1);
        uint8_t *m = mask.row(y);
        const int32_t above = y - kErodeHalf;
        const int32_t aboveInner = clip(above, y0, y); // rows [aboveInner, y) are visited rows
        for (int32_t x = x0; x < x1; ++x) {
            const int32_t xa = x - kErodeHalf, xb = x + kErodeHalf + 1;
            const int32_t ia = clip(xa, x0, x1), ib = clip(xb, x0, x1);
            if (zeros(above, y + kErodeHalf + 1, xa, xb) == 0) continue;
            uint32_t n = zeros(y + 1, y + kErodeHalf + 1, xa, xb) + zeros(y, y + 1, x, xb);
            if (n == 0)
                n = zeros(y, y + 1, xa, x) - zeros(y, y + 1, ia, x) + zeros(above, y, xa, xb) -
                    zeros(aboveInner, y, ia, ib);
            if (n != 0) m[x] = 1;
        }
    }
    return true;
}

void clear_marks(const View &mask) {
    const int32_t w = mask.width, h = mask.height;
    for (int32_t y = 1; y < h - 1; ++y) {
        uint8_t *m = mask.row(y);
        // Written unconditionally, so that the loop runs in vectors.
        for (int32_t x = 1; x < w - 1; ++x)
            m[x] = m[x] == 1 ? 0 : m[x];
    }
}

} // namespace

extern "C" {

int32_t CreateFaceMaskImg(const Image *src, Image **mask) {
    if (src == nullptr || src->bits == nullptr || mask == nullptr || !rows_inside(src)) return 0;
    free_Image(mask, 0);
    ImagePtr m = make_image(src->width, src->height, 8);
    // A source with a block and the sizes of a mask that could be made has
    // pixels.
    const std::optional<View> in = view_of(src), out = view_of(m.get());
    if (!in || !out) return 0;
    with_format(in->bitCount, [&](auto f) { colour_rule<decltype(f)>(*in, *out); });
    remove_short_runs(*out);
    if (!erode(*out)) return 0;
    clear_marks(*out);
    *mask = m.release();
    return 1;
}

int32_t SmileDetect(const Image *src, Image **dst, int32_t) {
    if (src == nullptr || dst == nullptr) return 1;
    // The slot is prepared first; the mask is copied in only when it could
    // be made (a source without pixels has none).
    Image *out = prepare_slot(src, dst);
    Image *mask = nullptr;
    if (CreateFaceMaskImg(src, &mask) && out != nullptr) PX_Img_Copy(out, mask);
    free_Image(&mask, 0);
    return 1;
}

} // extern "C"
