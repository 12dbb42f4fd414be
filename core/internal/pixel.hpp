// Pixel-format traits: the accessor rules of the Image record as inlineable
// row operations, so hot loops can be specialised per format instead of calling
// GetPixelColor / SetPixelColor per pixel.
//
// Each format offers
//   CRow / Row            row handles for reading / writing
//   crow(view, y), row(view, y)
//   load(crow, x)         packed colour exactly as GetPixelColor returns it
//   store(row, x, c)      exactly as SetPixelColor stores it
// `x` and `y` must lie inside the picture; clamping is the caller's loop
// structure (border and interior handled separately).
//
// `with_format` picks the format once per call. 8, 16, 24 and 32 bits get
// direct byte access; every other bit count (1, 4, and values no accessor
// reads) goes through the accessor functions, which already handle them.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/view.hpp"

namespace pxfx {

inline constexpr uint32_t kOpaque = 0xFF000000u;

constexpr uint32_t pack(uint32_t b, uint32_t g, uint32_t r, uint32_t a) { return b | g << 8 | r << 16 | a << 24; }
constexpr uint32_t blue_of(uint32_t c) { return c & 0xFF; }
constexpr uint32_t green_of(uint32_t c) { return (c >> 8) & 0xFF; }
constexpr uint32_t red_of(uint32_t c) { return (c >> 16) & 0xFF; }
constexpr uint32_t alpha_of(uint32_t c) { return c >> 24; }

// Gray of the drawing effects: (117 R + 601 G + 306 B) >> 10, with the small
// weight on red and the large one on blue.
constexpr uint32_t drawing_gray(uint32_t c) { return (117 * red_of(c) + 601 * green_of(c) + 306 * blue_of(c)) >> 10; }

// The byte formats: rows are byte pointers into the view's block.
struct DirectRows {
    static constexpr bool kDirect = true;
    using CRow = const uint8_t *;
    using Row = uint8_t *;
    static CRow crow(const View &v, int32_t y) { return v.row(y); }
    static Row row(const View &v, int32_t y) { return v.row(y); }
};

struct Gray8 : DirectRows {
    static constexpr uint32_t kBitCount = 8;
    static uint32_t load(CRow r, int32_t x) {
        const uint32_t i = r[x];
        return i | i << 8 | i << 16 | kOpaque;
    }
    // A colour written into an index image stores its green byte.
    static void store(Row r, int32_t x, uint32_t c) { r[x] = static_cast<uint8_t>(c >> 8); }
};

// 16-bit words hold blue in the high bits and red in the low bits; channels
// read back with zero low bits and alpha 0.
struct Word16 : DirectRows {
    static constexpr uint32_t kBitCount = 16;
    static uint32_t load(CRow r, int32_t x) {
        const uint32_t w = r[2 * x] | static_cast<uint32_t>(r[2 * x + 1]) << 8;
        return pack((w >> 11) * 8, ((w >> 5) & 63) * 4, (w & 31) * 8, 0);
    }
    static void store(Row r, int32_t x, uint32_t c) {
        const uint32_t w = ((blue_of(c) >> 3) << 11) + ((green_of(c) >> 2) << 5) + (red_of(c) >> 3);
        r[2 * x] = static_cast<uint8_t>(w);
        r[2 * x + 1] = static_cast<uint8_t>(w >> 8);
    }
};

struct Bgr24 : DirectRows {
    static constexpr uint32_t kBitCount = 24;
    static uint32_t load(CRow r, int32_t x) {
        const uint8_t *p = r + 3 * x;
        return pack(p[0], p[1], p[2], 255);
    }
    static void store(Row r, int32_t x, uint32_t c) {
        uint8_t *p = r + 3 * x;
        p[0] = static_cast<uint8_t>(c);
        p[1] = static_cast<uint8_t>(c >> 8);
        p[2] = static_cast<uint8_t>(c >> 16);
    }
};

struct Bgra32 : DirectRows {
    static constexpr uint32_t kBitCount = 32;
    static uint32_t load(CRow r, int32_t x) {
        const uint8_t *p = r + 4 * x;
        return pack(p[0], p[1], p[2], p[3]);
    }
    static void store(Row r, int32_t x, uint32_t c) {
        uint8_t *p = r + 4 * x;
        p[0] = static_cast<uint8_t>(c);
        p[1] = static_cast<uint8_t>(c >> 8);
        p[2] = static_cast<uint8_t>(c >> 16);
        p[3] = static_cast<uint8_t>(c >> 24);
    }
};

// Any other bit count: the accessors decide (1 and 4 bits read their index,
// the rest read as opaque black and ignore writes).
struct AnyFormat {
    static constexpr uint32_t kBitCount = 0;
    static constexpr bool kDirect = false;
    struct CRow {
        const Image *im;
        int32_t y;
    };
    struct Row {
        Image *im;
        int32_t y;
    };
    static CRow crow(const View &v, int32_t y) { return {v.record, y}; }
    static Row row(const View &v, int32_t y) { return {v.record, y}; }
    static uint32_t load(CRow r, int32_t x) { return GetPixelColor(r.im, x, r.y); }
    static void store(Row r, int32_t x, uint32_t c) { SetPixelColor(r.im, x, r.y, c); }
};

// Calls fn(Format{}) with the format of `bitCount`.
template <class Fn> decltype(auto) with_format(uint32_t bitCount, Fn &&fn) {
    switch (bitCount) {
    case 8: return fn(Gray8{});
    case 16: return fn(Word16{});
    case 24: return fn(Bgr24{});
    case 32: return fn(Bgra32{});
    default: return fn(AnyFormat{});
    }
}

// Calls fn(SrcFormat{}, DstFormat{}) for a copy from one record into another.
// Records of one bit count share their direct format; records that differ (a
// 1- or 4-bit source whose result was made with 8 bits, say) both go through
// the accessors, which convert.
template <class Fn> void with_formats(const View &src, const View &dst, Fn &&fn) {
    if (src.bitCount == dst.bitCount)
        with_format(src.bitCount, [&](auto f) { fn(f, f); });
    else
        fn(AnyFormat{}, AnyFormat{});
}

// Writes fn(colour) of every pixel of src to the same place of dst (src
// itself, or a record of the same size); both records have format F.
template <class F, class Fn> void map_pixels(const View &src, const View &dst, Fn fn) {
    const int32_t w = src.width;
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow in = F::crow(src, y);
        const typename F::Row out = F::row(dst, y);
        for (int32_t x = 0; x < w; ++x)
            F::store(out, x, fn(F::load(in, x)));
    }
}

// The pixels a kernel reads from a record that may have no pixel block, for
// a record whose rows its block can hold (rows_inside). The pixel readers
// read a record without pixels as 0; for the byte formats (8, 16, 24 and 32
// bits) the view's rows all lie on one zeroed row (pitch 0), so row loops
// read those zeros too; other formats read through the accessors, which give
// 0. A record with pixels is viewed as it is. ok() is false when the zeroed
// row cannot be had.
class ReadView {
  public:
    explicit ReadView(const Image *im)
        : view_{im->bits, im->pitch, im->width, im->height, im->bitCount, const_cast<Image *>(im)} {
        const uint32_t bc = im->bitCount;
        if (im->bits != nullptr || im->width <= 0 || im->height <= 0 || (bc != 8 && bc != 16 && bc != 24 && bc != 32))
            return;
        zeros_ = alloc_zeroed<uint8_t>(static_cast<size_t>(min_row_bytes(bc, im->width)));
        view_.bits = zeros_.get();
        view_.pitch = 0;
        ok_ = zeros_ != nullptr;
    }
    ReadView(const ReadView &) = delete;
    ReadView &operator=(const ReadView &) = delete;
    bool ok() const { return ok_; }
    const View &view() const { return view_; }

  private:
    View view_;
    Buffer<uint8_t> zeros_;
    bool ok_ = true;
};

// ---- Packed rows ----------------------------------------------------------
// The same formats in the toolkit's PXImage records, whose rows of width
// pixels follow each other without padding, seen as samples: a pixel holds
// kChannels samples of type T (bytes; one little-endian word for 16 bits,
// filtered as one sample of 0 .. 65535), each at most kMax.
template <class F> struct Packed {
    static constexpr uint32_t kBitCount = F::kBitCount;
    using T = std::conditional_t<kBitCount == 16, uint16_t, uint8_t>;
    static constexpr int32_t kChannels = static_cast<int32_t>(kBitCount / (8 * sizeof(T)));
    static constexpr int32_t kMax = static_cast<T>(~0u);
};

// Calls fn(Packed<Format>{}) for 8, 16 or 24 bits and returns true; returns
// false for any other bit count.
template <class Fn> bool with_packed_format(int32_t bitCount, Fn &&fn) {
    switch (bitCount) {
    case 8: fn(Packed<Gray8>{}); return true;
    case 16: fn(Packed<Word16>{}); return true;
    case 24: fn(Packed<Bgr24>{}); return true;
    default: return false;
    }
}

} // namespace pxfx
