// Tone curves and automatic levels: the gamma table, the histogram stretch
// mapping, auto levels blended with a local screen, and the split auto levels
// of the darker half.
#include <pxfx/retouch.h>

#include <cmath>
#include <cstring>

#include "core/internal/byte_map.hpp"
#include "core/internal/channel_map.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/vector_kernels.hpp"

using namespace pxfx;

namespace {

// The stretch mapping of a histogram whose bins may exceed 32 bits.
void make_mapping(const int64_t hist[256], float lowFraction, float highThreshold, int32_t map[256]) {
    int64_t total = 0;
    for (int32_t i = 0; i < 256; ++i)
        total += hist[i];
    const float lowCut = static_cast<float>(total) * lowFraction;
    int32_t lo = 0, hi = 0;
    int64_t run = 0;
    for (int32_t i = 0; i < 256; ++i) {
        run += hist[i];
        if (static_cast<float>(run) > lowCut) {
            lo = i;
            break;
        }
    }
    run = 0;
    for (int32_t i = 255; i >= 0; --i) {
        run += hist[i];
        if (static_cast<float>(run) > highThreshold) {
            hi = i;
            break;
        }
    }
    for (int32_t i = 0; i < 256; ++i) {
        if (hi == lo)
            map[i] = hi;
        else if (i < lo)
            map[i] = 0;
        else if (i <= hi)
            map[i] = (255 * i - 255 * lo) / (hi - lo);
        else
            map[i] = 255;
    }
}

template <class F> void channel_histogram(const View &src, int64_t hist[256]) {
    const int32_t w = src.width, h = src.height;
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow in = F::crow(src, y);
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = F::load(in, x);
            ++hist[blue_of(c)];
            ++hist[green_of(c)];
            ++hist[red_of(c)];
        }
    }
}

// Loads row y of src into buf[1..w] with the edge pixels repeated at 0 and w + 1.
template <class F> void load_row(const View &src, int32_t y, uint32_t *buf) {
    const typename F::CRow in = F::crow(src, y);
    const int32_t w = src.width;
    for (int32_t x = 0; x < w; ++x)
        buf[x + 1] = F::load(in, x);
    buf[0] = buf[1];
    buf[w + 1] = buf[w];
}

struct LocalScreen {
    uint8_t map[256];
    uint8_t screen[256][256]; // [neighbour mean n][M[v]]
    uint8_t blend[256][256];  // [screen s][v]
};

void make_screen(const int32_t map[256], int32_t amount, LocalScreen &t) {
    for (int32_t i = 0; i < 256; ++i)
        t.map[i] = static_cast<uint8_t>(map[i]);
    for (int32_t n = 0; n < 256; ++n)
        for (int32_t m = 0; m < 256; ++m)
            t.screen[n][m] = static_cast<uint8_t>(255 - ((255 - n) * (255 - m)) / 255);
    for (int32_t s = 0; s < 256; ++s)
        for (int32_t v = 0; v < 256; ++v)
            t.blend[s][v] = static_cast<uint8_t>((amount * s + (100 - amount) * v) / 100);
}

// The pixel of colour c whose neighbours are l and r (left, right), a and b
// (above, below): each channel blended with the screen of its mapped value
// and the rounded mean of its neighbours' mapped values; alpha kept.
uint32_t level_pixel(const LocalScreen &t, uint32_t c, uint32_t l, uint32_t r, uint32_t a, uint32_t b) {
    uint32_t res = c & 0xFF000000u;
    for (uint32_t shift = 0; shift < 24; shift += 8) {
        const uint32_t v = (c >> shift) & 255;
        const uint32_t n = (t.map[(l >> shift) & 255] + t.map[(r >> shift) & 255] + t.map[(a >> shift) & 255] +
                            t.map[(b >> shift) & 255] + 2) /
                           4;
        res |= static_cast<uint32_t>(t.blend[t.screen[n][t.map[v]]][v]) << shift;
    }
    return res;
}

// Edge pixels take themselves as their missing neighbours.
template <class FS, class FD> void auto_levels(const View &src, const View &out, const LocalScreen &t, uint32_t *rows) {
    const int32_t w = src.width, h = src.height;
    uint32_t *up = rows, *cur = up + (w + 2), *down = cur + (w + 2);
    load_row<FS>(src, 0, cur);
    load_row<FS>(src, h > 1 ? 1 : 0, down);
    for (int32_t i = 0; i < w + 2; ++i)
        up[i] = cur[i];
    for (int32_t y = 0; y < h; ++y) {
        const typename FD::Row o = FD::row(out, y);
        for (int32_t x = 1; x <= w; ++x)
            FD::store(o, x - 1, level_pixel(t, cur[x], cur[x - 1], cur[x + 1], up[x], down[x]));
        uint32_t *spare = up;
        up = cur;
        cur = down;
        down = spare;
        if (y + 2 < h)
            load_row<FS>(src, y + 2, down);
        else
            for (int32_t i = 0; i < w + 2; ++i)
                down[i] = cur[i];
    }
}

// auto_levels for byte formats of 1, 3 or 4 bytes with the vector copy of
// the rows, into a block apart from the source's. mapped holds three rows of
// bytes, each source row through the levels map.
template <class F>
void auto_levels_rows(const View &src, const View &out, const LocalScreen &t, int32_t amount, vec::GradationRow run,
                      uint8_t *mapped) {
    constexpr int kChannels = static_cast<int>(F::kBitCount / 8);
    const int32_t w = src.width, h = src.height;
    const size_t bytes = static_cast<size_t>(w) * kChannels;
    const uint8_t *const table[1] = {t.map};
    uint8_t *up = mapped, *cur = up + bytes, *down = cur + bytes;
    map_bytes(src.row(0), cur, bytes, 1, table);
    std::memcpy(up, cur, bytes);
    map_bytes(src.row(h > 1 ? 1 : 0), down, bytes, 1, table);
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow above = F::crow(src, y > 0 ? y - 1 : 0), row = F::crow(src, y),
                               below = F::crow(src, y + 1 < h ? y + 1 : h - 1);
        const typename F::Row o = F::row(out, y);
        const auto done = static_cast<int32_t>(run(row, up, cur, down, static_cast<size_t>(w), kChannels, amount, o));
        auto pixel = [&](int32_t x) {
            const uint32_t l = F::load(row, x > 0 ? x - 1 : 0), r = F::load(row, x + 1 < w ? x + 1 : w - 1);
            F::store(o, x, level_pixel(t, F::load(row, x), l, r, F::load(above, x), F::load(below, x)));
        };
        pixel(0);
        for (int32_t x = 1 + done; x < w; ++x)
            pixel(x);
        uint8_t *spare = up;
        up = cur;
        cur = down;
        down = spare;
        if (y + 2 < h)
            map_bytes(src.row(y + 2), down, bytes, 1, table);
        else
            std::memcpy(down, cur, bytes);
    }
}

template <class F> void green_and_dark_histograms(const View &src, int64_t green[256], int64_t dark[256]) {
    const int32_t w = src.width, h = src.height;
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow in = F::crow(src, y);
        for (int32_t x = 0; x < w; ++x)
            ++green[green_of(F::load(in, x))];
    }
    int64_t half = static_cast<int64_t>(w) * h / 2, sum = 0;
    int32_t split = 255;
    for (int32_t i = 255; i > 0; --i) {
        sum += green[i];
        if (sum >= half) {
            split = i;
            break;
        }
    }
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow in = F::crow(src, y);
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = F::load(in, x);
            if (red_of(c) <= static_cast<uint32_t>(split)) {
                ++dark[blue_of(c)];
                ++dark[green_of(c)];
            }
        }
    }
}

} // namespace

extern "C" {

void BuildTable(uint8_t table[256], float gamma) {
    if (table == nullptr) return;
    for (int32_t i = 0; i < 256; ++i) {
        const float x = (static_cast<float>(i) + 0.5f) * 0.00390625f;
        const float p = static_cast<float>(std::pow(static_cast<double>(x), static_cast<double>(gamma)));
        const float v = p * 256.0f - 0.5f;
        table[i] = clamp_u8(trunc_sat<int32_t>(v)); // a NaN gamma gives 0
    }
}

void MakeMapping(int32_t table[256], float lowFraction, float highThreshold) {
    if (table == nullptr) return;
    int64_t hist[256];
    for (int32_t i = 0; i < 256; ++i)
        hist[i] = table[i];
    make_mapping(hist, lowFraction, highThreshold, table);
}

int32_t ImageAutoGradationProcess(const Image *src, Image **dst, int32_t amount) {
    if (src == nullptr || dst == nullptr || !rows_inside(src)) return 1;
    if (src->width <= 0 || src->height <= 0) {
        prepare_slot(src, dst); // no pixel to write
        return 1;
    }
    // Working memory comes first, so its failure leaves the slot as it was.
    const ReadView view(src);
    Buffer<LocalScreen> tables = alloc_buffer<LocalScreen>(1);
    Buffer<uint32_t> rows = alloc_buffer<uint32_t>(checked_size(static_cast<uint64_t>(src->width) + 2, 3));
    if (!view.ok() || !tables || !rows) return 1;
    const std::optional<View> out = view_of(prepare_slot(src, dst));
    if (!out) return 1;
    const View &in = view.view();
    amount = clamp_to(amount, 0, 100);
    int64_t hist[256] = {};
    with_format(in.bitCount, [&](auto f) { channel_histogram<decltype(f)>(in, hist); });
    int32_t map[256];
    make_mapping(hist, 0.0005f, 0.0005f, map);
    make_screen(map, amount, tables[0]);
    // The vector rows read the source as they write: only into a block of
    // its own.
    const uint32_t bits = in.bitCount;
    const vec::GradationRow run = vec::gradation_row();
    Buffer<uint8_t> mapped;
    if (run != nullptr && blocks_apart(in, *out) && bits == out->bitCount && (bits == 8 || bits == 24 || bits == 32))
        mapped = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(in.width), bits / 8, 3));
    if (mapped) {
        with_format(bits, [&](auto f) {
            if constexpr (decltype(f)::kBitCount == 8 || decltype(f)::kBitCount >= 24)
                auto_levels_rows<decltype(f)>(in, *out, tables[0], amount, run, mapped.get());
        });
    } else {
        with_formats(in, *out, [&](auto fs, auto fd) {
            auto_levels<decltype(fs), decltype(fd)>(in, *out, tables[0], rows.get());
        });
    }
    return 1;
}

void ImageAutoGradationProcess1(const Image *src, Image **dst, int32_t, int32_t gammaFlag) {
    if (src == nullptr || dst == nullptr || !rows_inside(src)) return;
    const ReadView view(src);
    if (!view.ok()) return;
    const std::optional<View> out = view_of(prepare_slot(src, dst));
    if (!out) return;
    const View &in = view.view();
    uint8_t gamma[256];
    if (gammaFlag != 0)
        BuildTable(gamma, 0.8333333f);
    else
        for (int32_t i = 0; i < 256; ++i)
            gamma[i] = static_cast<uint8_t>(i);
    // The stretch of the brighter half would be written first and then
    // overwritten everywhere by the darker half's, so only the latter is made.
    int64_t green[256] = {}, dark[256] = {};
    with_format(in.bitCount, [&](auto f) { green_and_dark_histograms<decltype(f)>(in, green, dark); });
    int32_t map[256];
    make_mapping(dark, 0.0f, 0.0f, map);
    uint8_t table[256];
    for (int32_t i = 0; i < 256; ++i)
        table[i] = gamma[map[i]];
    map_channels(in, *out, {table, table, table});
}

} // extern "C"
