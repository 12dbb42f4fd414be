// Straightening of a luma plane along its detected boundary, the vertical
// resampler that feeds it, and the entry points around them.
#include <pxfx/lines.h>

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "lines/lines_internal.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kStripWidth = 30;
constexpr int32_t kFirstRow = 10;
constexpr int32_t kMinDark = 15;
// The boundary line passes through the strip centres, columns 65 and
// width - 55.
constexpr int32_t kLeftStrip = 50, kLeftCentre = 65;
constexpr int32_t kRightStripFromEnd = 70, kRightCentreFromEnd = 55;

// First row from kFirstRow on where fewer than kMinDark pixels of the strip
// are darker than t; height - 2 when every row is dark enough.
int32_t boundary_row(const View &img, int32_t x0, int32_t t) {
    const int32_t h = img.height;
    for (int32_t y = kFirstRow; y < h - 2; ++y) {
        const uint8_t *r = img.row(y) + x0;
        int32_t dark = 0;
        for (int32_t i = 0; i < kStripWidth; ++i)
            dark += r[i] < t;
        if (dark < kMinDark) return y;
    }
    return h - 2;
}

int64_t row_sum(const uint8_t *r, int32_t x0, int32_t x1) {
    int64_t s = 0;
    for (int32_t x = x0; x < x1; ++x)
        s += r[x];
    return s;
}

} // namespace

namespace pxfx::lines {

// Every intermediate value is bounded by the picture: with width >= 121,
// |(c + 1 - 66) (r2 - r1)| < width * height < 2^31 and |line[c] - r1| is at
// most 65 |r2 - r1| < 65 * 2^31 / 121, so the rows fit 32 bits; products are formed in 64 bits
// all the same, and the level sum of the refinement is exact.
void detect_boundary(const View &img, int32_t *line) {
    const int32_t w = img.width, h = img.height;
    const int32_t right = w - kRightStripFromEnd;
    uint32_t histL[256] = {}, histR[256] = {};
    for (int32_t y = kFirstRow; y <= h - 3; ++y) {
        const uint8_t *r = img.row(y);
        for (int32_t i = 0; i < kStripWidth; ++i) {
            ++histL[r[kLeftStrip + i]];
            ++histR[r[right + i]];
        }
    }
    const int32_t r1 = boundary_row(img, kLeftStrip, GetMaxHtoThrod2(histL, 0));
    const int32_t r2 = boundary_row(img, right, GetMaxHtoThrod2(histR, 0));

    const int32_t mid = w - kRightCentreFromEnd;
    const int64_t d = r2 - r1, span = mid - kLeftCentre;
    for (int32_t c = 0; c < w; ++c)
        line[c] = static_cast<int32_t>(r1 + (static_cast<int64_t>(c + 1) * d - (kLeftCentre + 1) * d) / span);

    // Mean level around the boundary; rows below the picture read as its last
    // row.
    const int32_t top = std::max(std::min(r1, r2) - 8, 0), bottom = std::max(r1, r2);
    int64_t sum = 0;
    for (int32_t y = top; y <= bottom + 7; ++y)
        sum += row_sum(img.row(std::min(y, h - 1)), kLeftCentre, mid);
    const int64_t mean = sum / ((static_cast<int64_t>(bottom) + 8 - top) * span);

    // The edge test looks at the same pixel pair, rows top and top + 1 of
    // column 65, for every column and row it walks: when the pair is an
    // upward edge every column's edge is the last row walked, bottom + 6,
    // otherwise no column has one. (top <= height - 10, so top + 1 exists.)
    const uint8_t above = img.row(top)[kLeftCentre], below = img.row(top + 1)[kLeftCentre];
    if (!(above < mean && below >= mean)) return;
    const int64_t edge = static_cast<int64_t>(bottom) + 6;
    int64_t off = 0;
    for (int32_t x = kLeftCentre; x < mid; ++x)
        off += edge - line[x];
    const int32_t shift = static_cast<int32_t>((off + span / 2) / span);
    if (shift != 0)
        for (int32_t c = 0; c < w; ++c)
            line[c] += shift;
}

namespace {

// Rows 0 .. rows - 1 of columns [c0, c1) of res: res(r, c) = img(line[c] + r, c),
// row 0 above the picture; from the bottom row up where `upward`.
void straighten_columns(const View &img, const int32_t *line, const View &res, int32_t c0, int32_t c1, int64_t rows,
                        bool upward) {
    if (c0 >= c1 || rows <= 0) return;
    auto source = [&](int32_t c, int64_t r) {
        const int64_t sr = line[c] + r;
        return img.row(static_cast<int32_t>(sr < 0 ? 0 : sr));
    };
    auto row_at = [&](int64_t i) { return upward ? rows - 1 - i : i; };
    // A nearly level line changes its value rarely: columns sharing a value
    // are copied as pieces of their source row.
    if (std::abs(static_cast<int64_t>(line[c1 - 1]) - line[c0]) * 64 <= c1 - c0) {
        for (int64_t i = 0; i < rows; ++i) {
            const int64_t r = row_at(i);
            uint8_t *out = res.row(static_cast<int32_t>(r));
            for (int32_t c = c0; c < c1;) {
                int32_t e = c + 1;
                while (e < c1 && line[e] == line[c])
                    ++e;
                std::memmove(out + c, source(c, r) + c, static_cast<size_t>(e - c));
                c = e;
            }
        }
        return;
    }
    // A steeper line reads many source rows per output row: going down the
    // picture in strips of 64 columns keeps those rows in cache.
    constexpr int32_t kStrip = 64;
    for (int32_t s0 = c0; s0 < c1; s0 += kStrip) {
        const int32_t s1 = std::min(s0 + kStrip, c1);
        for (int64_t i = 0; i < rows; ++i) {
            const int64_t r = row_at(i);
            uint8_t *out = res.row(static_cast<int32_t>(r));
            for (int32_t c = s0; c < s1; ++c)
                out[c] = source(c, r)[c];
        }
    }
}

} // namespace

// line[] is monotone in c (a truncated linear function plus a constant), so
// its largest value is at one end and every source row line[c] + r of the
// rows copied lies below the last row. Column 65 holds r1 >= 0, so at most
// `height` rows are copied. Only ends extrapolated above the picture can ask
// for a negative row; those read row 0.
int64_t straighten(const View &img, const int32_t *line, const View &res) {
    const int32_t w = img.width, h = img.height;
    const int64_t rows = std::min(static_cast<int64_t>(h) - line[0], static_cast<int64_t>(h) - line[w - 1]);
    if (res.bits != img.bits) {
        straighten_columns(img, line, res, 0, w, rows, false);
        return rows;
    }
    // Within one block: the columns whose line lies above the picture read
    // rows above the one written (or row 0) and go from the bottom up, the
    // others read rows at or below it and go from the top down. The line is
    // monotone, so the first kind is a run at one end.
    int32_t up0 = 0, up1 = 0;
    if (line[0] < 0) {
        while (up1 < w && line[up1] < 0)
            ++up1;
    } else if (line[w - 1] < 0) {
        up0 = up1 = w;
        while (up0 > 0 && line[up0 - 1] < 0)
            --up0;
    }
    straighten_columns(img, line, res, 0, up0, rows, false);
    straighten_columns(img, line, res, up0, up1, rows, true);
    straighten_columns(img, line, res, up1, w, rows, false);
    return rows;
}

} // namespace pxfx::lines

namespace {

// RecognizeYUV(img, nullptr) on MyResample2's own new image, which the caller
// drops when this fails: straightened within its own block rather than
// through a copy.
bool recognize_own(Image *img) {
    const std::optional<View> in = plane_view_of(img);
    if (!in || in->width < lines::kMinRecognizeWidth || in->height < lines::kMinRecognizeHeight)
        return RecognizeYUV(img, nullptr) != 0;
    Buffer<int32_t> line = alloc_buffer<int32_t>(static_cast<size_t>(in->width));
    if (!line) return false;
    lines::detect_boundary(*in, line.get());
    const int32_t w = in->width, h = in->height;
    // Rows past the copied ones are cleared, as in a new result.
    const int64_t rows = lines::straighten(*in, line.get(), *in);
    for (int64_t r = std::max<int64_t>(rows, 0); r < h; ++r)
        std::memset(in->row(static_cast<int32_t>(r)), 0, static_cast<size_t>(w));
    line.reset();
    return BinImg(img, nullptr) != 0;
}

} // namespace

extern "C" {

int32_t RecognizeYUV(Image *img, Image **out) {
    const std::optional<View> in = plane_view_of(img);
    if (!in || in->width < lines::kMinRecognizeWidth || in->height < lines::kMinRecognizeHeight) return 0;
    ImagePtr res = make_image(in->width, in->height, 8);
    const std::optional<View> to = view_of(res.get());
    if (!to) return 0;
    std::memset(to->bits, 0, to->block_bytes());
    Buffer<int32_t> line = alloc_buffer<int32_t>(static_cast<size_t>(in->width));
    if (!line) return 0;
    lines::detect_boundary(*in, line.get());
    lines::straighten(*in, line.get(), *to);
    line.reset();
    if (BinImg(res.get(), nullptr) == 0) return 0;
    return InPlaceOrSlot(img, out).deliver(std::move(res));
}

void ImgDecode(Image *img, Image **out) {
    if (img != nullptr) RecognizeYUV(img, out);
}

// new(y f + k) = (img(y) (f - k) + img(y + 1) k + (f + 1) / 2) / f. The
// division is a multiplication by m = 2^23 / f + 1 and a shift: for numerators
// n <= 255 f + 25 the error n (m - 2^23 / f) / 2^23 stays below 0.002, less
// than the 1 / f that separates n / f from the next integer, and n m < 2^32.
Image *MyResample2(Image *img, int32_t factor) {
    if (factor < 2 || factor > 49 || img == nullptr || img->bitCount != 8 || !rows_inside(img)) return nullptr;
    const int32_t w = img->width, h = img->height;
    // A plane of one row is read by nothing but the copy of its last row; a
    // taller one needs its block.
    const std::optional<View> in = view_of(img);
    if (!in && h > 1) return nullptr;
    const int64_t newHeight = static_cast<int64_t>(factor) * (h - 1) + 1;
    if (newHeight > INT32_MAX) return nullptr;
    ImagePtr res = make_image(w, static_cast<int32_t>(newHeight), 8);
    const std::optional<View> to = view_of(res.get());
    if (!to) return nullptr;
    const uint32_t f = static_cast<uint32_t>(factor), round = (f + 1) >> 1, m = (1u << 23) / f + 1;
    for (int32_t y = 0; y < h - 1; ++y) {
        const uint8_t *a = in->row(y), *b = in->row(y + 1);
        for (uint32_t k = 0; k < f; ++k) {
            uint8_t *o = to->row(static_cast<int32_t>(static_cast<uint32_t>(y) * f + k));
            const uint32_t wa = f - k;
            for (int32_t x = 0; x < w; ++x)
                o[x] = static_cast<uint8_t>(((a[x] * wa + b[x] * k + round) * m) >> 23);
        }
    }
    // The last row lies exactly on the last source row; without a block it
    // stays as malloc_Image made it.
    if (in) std::memcpy(to->row(to->height - 1), in->row(h - 1), static_cast<size_t>(w));
    // A plane below the straightening's minimum size is returned as it is; a
    // straightening that runs out of memory fails the call.
    if (!recognize_own(res.get()) && w >= lines::kMinRecognizeWidth && to->height >= lines::kMinRecognizeHeight)
        return nullptr;
    return res.release();
}

void ImgLineDecode(void) {}

void CheckAvailableBlock(void) {}

void RebuildImg(void) {}

} // extern "C"
