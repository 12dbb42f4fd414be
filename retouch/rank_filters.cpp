// Window rank filters of 8-bit pictures (third largest value, lift of dark
// specks) and the list helpers they are defined by.
#include <pxfx/retouch.h>

#include <algorithm>
#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "retouch/retouch_common.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kMaxBestColorSize = 25;
constexpr int32_t kMaxMoreLightSize = 255;
constexpr double kLiftWeight = 0.8;

// Window offsets of a side: -(size / 2) .. size - size / 2 - 1.
int32_t window_lo(int32_t size) { return -(size / 2); }
int32_t window_hi(int32_t size) { return size - size / 2 - 1; }

// The index plane MoreLight reads: 8-bit pictures directly, 1- and 4-bit ones
// through GetPixelIndex into `own`; null when every index reads 0.
const uint8_t *index_plane(const View &src, Buffer<uint8_t> &own, size_t &stride, bool &failed) {
    failed = false;
    if (src.bitCount == 8) {
        stride = src.pitch;
        return src.bits;
    }
    if (src.bitCount != 1 && src.bitCount != 4) return nullptr;
    const int32_t w = src.width, h = src.height;
    own = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h)));
    if (!own) {
        failed = true;
        return nullptr;
    }
    stride = static_cast<size_t>(w);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            own[static_cast<size_t>(y) * stride + x] = static_cast<uint8_t>(GetPixelIndex(src.record, x, y));
    return own.get();
}

} // namespace

extern "C" {

int32_t *Sort_largelow(int32_t *values, int32_t count) {
    if (values == nullptr) return values;
    for (int32_t i = 0; i < count; ++i) {
        int32_t best = i;
        for (int32_t j = i + 1; j < count; ++j)
            if (values[j] > values[best]) best = j;
        const int32_t t = values[i];
        values[i] = values[best];
        values[best] = t;
    }
    return values;
}

int32_t getpos(const int32_t *values, int32_t count, int32_t value) {
    if (values == nullptr) return count;
    int32_t i = 0;
    while (i < count && values[i] > value)
        ++i;
    return i < count ? i : count;
}

int32_t Best_Color(Image *img, int32_t size) {
    if (img == nullptr || img->bits == nullptr || size > kMaxBestColorSize || img->bitCount != 8 || !rows_inside(img))
        return 0;
    // Without pixel rows there is nothing to rank.
    const std::optional<View> v = view_of(img);
    if (!v) return 1;
    const int32_t w = v->width, h = v->height;
    if (size < 2) {
        // One value or none: the third place of the cleared list is 0.
        for (int32_t y = 0; y < h; ++y)
            std::memset(v->row(y), 0, static_cast<size_t>(w));
        return 1;
    }
    // Third largest of every window, gathered offset by offset over whole
    // padded rows: each row keeps its three largest values so far.
    const size_t pw = static_cast<size_t>(w) + size - 1;
    Buffer<uint8_t> pad = padded_plane(v->bits, v->pitch, w, h, window_lo(size), size);
    Buffer<uint8_t> rows = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), 3));
    if (!pad || !rows) return 0;
    uint8_t *first = rows.get(), *second = first + w, *third = second + w;
    for (int32_t y = 0; y < h; ++y) {
        std::memset(rows.get(), 0, static_cast<size_t>(w) * 3);
        for_each_window_offset(pad.get(), pw, y, size, [&](const uint8_t *p) {
            for (int32_t x = 0; x < w; ++x) {
                const uint8_t v = p[x];
                third[x] = std::max(third[x], std::min(second[x], v));
                second[x] = std::max(second[x], std::min(first[x], v));
                first[x] = std::max(first[x], v);
            }
        });
        std::memcpy(v->row(y), third, static_cast<size_t>(w));
    }
    return 1;
}

void MoreLight(const Image *src, int32_t size, Image **dst) {
    if (src == nullptr || dst == nullptr || size > kMaxMoreLightSize || !rows_inside(src)) return;
    if (src->width <= 0 || src->height <= 0) {
        prepare_slot(src, dst); // no pixel to write
        return;
    }
    const ReadView view(src);
    if (!view.ok()) return;
    const View &in = view.view();
    const int32_t w = in.width, h = in.height;
    Buffer<uint8_t> own;
    size_t stride = 0;
    bool failed = false;
    const uint8_t *plane = index_plane(in, own, stride, failed);
    if (failed) return;
    Buffer<uint8_t> lift = alloc_zeroed<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h)));
    if (!lift) return;
    if (plane != nullptr && size <= 0) {
        // Empty window: the list stays cleared, its largest value is 0 and no
        // value lies above the centre, so only n = size * size <= 1 passes.
        const int64_t n = static_cast<int64_t>(size) * size;
        for (int32_t y = 0; y < h && n / 2 == 0; ++y)
            for (int32_t x = 0; x < w; ++x) {
                const uint32_t c = plane[static_cast<size_t>(y) * stride + x];
                const uint32_t d = (0u - c) & 255u;
                if (c != 0 && d > 10) lift[static_cast<size_t>(y) * w + x] = static_cast<uint8_t>(d);
            }
    } else if (plane != nullptr) {
        const uint32_t half = static_cast<uint32_t>(size * size) / 2;
        const bool ok = for_each_window(plane, stride, w, h, window_lo(size), window_hi(size),
                                        [&](int32_t x, int32_t y, uint8_t c, const auto &hist) {
                                            if (c == 0) return;
                                            const uint32_t d =
                                                static_cast<uint32_t>(rank::kth_largest(hist, 0) - c) & 255u;
                                            if (d > 10 && rank::count_above(hist, c) >= half)
                                                lift[static_cast<size_t>(y) * w + x] = static_cast<uint8_t>(d);
                                        });
        if (!ok) return;
    }
    // The result is prepared only once the lift map stands, so a call short
    // of working memory leaves the slot as it was.
    const std::optional<View> out = view_of(prepare_slot(src, dst));
    if (!out) return;
    with_formats(in, *out, [&](auto fs, auto fd) {
        lift_pixels<decltype(fs), decltype(fd)>(in, *out, lift.get(), static_cast<size_t>(w), kLiftWeight, kLiftWeight,
                                                kLiftWeight);
    });
}

} // extern "C"
