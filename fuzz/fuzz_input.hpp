// Shared input reader of the libFuzzer targets: turns the fuzzer's bytes into
// parameters, hand-made Image and PXImage records and caller-side arrays.
//
// Every pixel block is allocated with exactly the size its record claims
// (pitch * height, or width * height * bytes per pixel), so AddressSanitizer
// reports any read or write past it. Records come from malloc so that the
// library may release or replace them (result slots, caches) with free_Image
// or PXImage_Free. Bytes past the end of the input read as 0.
#pragma once

#include <pxfx/pxfx.h>

#include <climits>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <vector>

namespace fuzz {

class Input {
  public:
    Input(const uint8_t *data, size_t size) : p_(data), n_(size) {}

    uint32_t bits(uint32_t bytes) {
        uint32_t v = 0;
        for (uint32_t i = 0; i < bytes && n_ > 0; ++i, ++p_, --n_)
            v |= static_cast<uint32_t>(*p_) << (8 * i);
        return v;
    }
    uint8_t byte() { return static_cast<uint8_t>(bits(1)); }
    uint32_t u32() { return bits(4); }
    int32_t i32() { return static_cast<int32_t>(u32()); }
    // True about once in `in` calls.
    bool one_in(uint32_t in) { return byte() % in == 0; }
    // Uniform in lo..hi (hi - lo below 2^31).
    int32_t range(int32_t lo, int32_t hi) {
        const uint32_t span = static_cast<uint32_t>(hi - lo) + 1u;
        return lo + static_cast<int32_t>((span > 0xFFFFu ? u32() : bits(2)) % span);
    }
    // A parameter that is mostly inside lo..hi and sometimes just outside it,
    // negative or a 32-bit extreme.
    int32_t param(int32_t lo, int32_t hi) {
        switch (byte() % 20) {
        case 0: return INT_MIN;
        case 1: return INT_MAX;
        case 2: return lo == INT_MIN ? lo : lo - 1;
        case 3: return hi == INT_MAX ? hi : hi + 1;
        case 4: return -range(1, 1000);
        case 5: return i32();
        default: return range(lo, hi);
        }
    }
    // A float mostly inside lo..hi, sometimes outside, huge, infinite or NaN.
    double real(double lo, double hi) {
        const uint32_t raw = u32();
        switch (byte() % 24) {
        case 0: return std::numeric_limits<double>::quiet_NaN();
        case 1: return std::numeric_limits<double>::infinity();
        case 2: return -std::numeric_limits<double>::infinity();
        case 3: return -1e30;
        case 4: return 1e30;
        case 5: return 0.0;
        case 6: return lo - (hi - lo) * (raw / 4294967295.0);
        case 7: return hi + (hi - lo) * (raw / 4294967295.0);
        default: return lo + (hi - lo) * (raw / 4294967295.0);
        }
    }
    // 0, a small negative value or INT_MIN.
    int32_t nonpositive() { return one_in(4) ? INT_MIN : -range(0, 2); }
    size_t left() const { return n_; }

  private:
    const uint8_t *p_;
    size_t n_;
};

// Fills a block from the input: noise, a constant, a palette of a few input
// colours, or the input's bytes themselves (then zeros).
inline void fill(Input &in, uint8_t *block, size_t bytes) {
    if (block == nullptr || bytes == 0) return;
    const uint32_t mode = in.byte() % 4;
    uint32_t state = in.u32() | 1u;
    auto next = [&state] {
        state ^= state << 13;
        state ^= state >> 17;
        state ^= state << 5;
        return state;
    };
    if (mode == 0) {
        for (size_t i = 0; i < bytes; ++i)
            block[i] = static_cast<uint8_t>(next() >> 24);
    } else if (mode == 1) {
        const uint32_t c = in.u32();
        for (size_t i = 0; i < bytes; ++i)
            block[i] = static_cast<uint8_t>(c >> (8 * (i % 4)));
    } else if (mode == 2) {
        uint32_t palette[4];
        for (uint32_t &c : palette)
            c = in.u32();
        // Runs of a colour, so that regions of one kind (skin, eyes, lines) form.
        for (size_t i = 0; i < bytes;) {
            const uint32_t c = palette[next() % 4];
            const size_t run = 4 + next() % 64;
            for (size_t k = 0; k < run && i < bytes; ++k, ++i)
                block[i] = static_cast<uint8_t>(c >> (8 * (i % 4)));
        }
    } else {
        for (size_t i = 0; i < bytes; ++i)
            block[i] = in.byte();
    }
}

inline uint8_t *alloc_block(size_t bytes) {
    // malloc(0) still gives a distinct zero-sized block that ASan guards.
    return static_cast<uint8_t *>(std::malloc(bytes));
}

// Bit counts: mostly the four the library processes, sometimes odd ones.
inline uint32_t pick_bit_count(Input &in) {
    static const uint32_t kUsual[] = {8, 16, 24, 32};
    static const uint32_t kOdd[] = {0, 1, 4, 12, 48};
    return in.one_in(8) ? kOdd[in.byte() % 5] : kUsual[in.byte() % 4];
}

struct Shape {
    int32_t width;
    int32_t height;
    uint32_t bitCount;
};

// The largest picture (in pixels) a target has built from its inputs; it is
// printed when the fuzzer exits, so that a run shows how far its inputs
// reached.
struct Reach {
    int32_t width = 0, height = 0;
    ~Reach() {
        if (width > 0) std::fprintf(stderr, "largest picture: %d x %d\n", width, height);
    }
};

inline void note_reach(int32_t width, int32_t height) {
    static Reach reach;
    if (width > 0 && height > 0 &&
        static_cast<int64_t>(width) * height > static_cast<int64_t>(reach.width) * reach.height)
        reach.width = width, reach.height = height;
}

// Width and height 1..maxW x 1..maxH; about one in 48 shapes may be five
// times as large each way (several hundred pixels a side); sometimes 0 or
// negative.
inline Shape pick_shape(Input &in, int32_t maxW = 64, int32_t maxH = 64) {
    if (in.one_in(48)) maxW *= 5, maxH *= 5;
    Shape s{in.range(1, maxW), in.range(1, maxH), pick_bit_count(in)};
    if (in.one_in(32)) s.width = in.one_in(2) ? 0 : -in.range(1, 3);
    if (in.one_in(32)) s.height = in.one_in(2) ? 0 : -in.range(1, 3);
    return s;
}

// Hand-made Image record of a shape: the padded pitch mostly, sometimes one
// below a row, odd, or 0; sometimes no pixels. The block holds exactly pitch *
// height bytes.
inline Image *make_image(Input &in, Shape s) {
    Image *im = static_cast<Image *>(std::malloc(sizeof(Image)));
    im->width = s.width;
    im->height = s.height;
    im->bitCount = s.bitCount;
    im->tag = in.one_in(2) ? 0 : in.u32();
    note_reach(s.width, s.height);
    const int64_t w = s.width > 0 ? s.width : 0;
    const int64_t row = (w * s.bitCount + 7) / 8;
    int64_t pitch = (w * s.bitCount + 31) / 32 * 4;
    switch (in.byte() % 16) {
    case 0: pitch = row > 0 ? row - 1 : 0; break;
    case 1: pitch = row + 1 + in.range(0, 2); break;
    case 2: pitch = 0; break;
    default: break;
    }
    im->pitch = static_cast<uint32_t>(pitch);
    const size_t bytes = s.height > 0 ? static_cast<size_t>(pitch) * static_cast<size_t>(s.height) : 0;
    if (in.one_in(24)) {
        im->bits = nullptr;
    } else {
        im->bits = alloc_block(bytes);
        fill(in, im->bits, bytes);
    }
    return im;
}

inline Image *make_image(Input &in, int32_t maxW = 64, int32_t maxH = 64) {
    return make_image(in, pick_shape(in, maxW, maxH));
}

// A plane-like record: 8 bits mostly, otherwise any shape.
inline Image *make_plane(Input &in, int32_t maxW = 64, int32_t maxH = 64) {
    Shape s = pick_shape(in, maxW, maxH);
    if (!in.one_in(6)) s.bitCount = 8;
    return make_image(in, s);
}

// A second record: usually the shape of the first, otherwise its own.
inline Image *make_partner(Input &in, const Image *first, int32_t maxW = 64, int32_t maxH = 64) {
    if (first != nullptr && in.one_in(4) == false)
        return make_image(in, Shape{first->width, first->height, first->bitCount});
    return make_image(in, maxW, maxH);
}

// Owns a result slot for the call and releases whatever it holds afterwards.
// The slot starts empty, holds an image of the source's shape (reuse), one
// of another shape (replacement) or a record without pixels; sometimes the
// slot itself is null.
class Slot {
  public:
    Slot(Input &in, const Image *like, bool allowNull = true) {
        const uint32_t kind = in.byte() % 8;
        if (allowNull && kind == 0) {
            null_ = true;
        } else if (kind == 1 && like != nullptr) {
            img_ = make_image(in, Shape{like->width, like->height, like->bitCount});
        } else if (kind == 2) {
            img_ = make_image(in);
        } else if (kind == 3 && like != nullptr) {
            img_ = malloc_Image(like->width, like->height, static_cast<int32_t>(like->bitCount));
        }
    }
    ~Slot() { free_Image(&img_, 0); }
    Slot(const Slot &) = delete;
    Slot &operator=(const Slot &) = delete;
    Image **get() { return null_ ? nullptr : &img_; }
    Image *image() const { return img_; }
    // Hands `img` to the slot (releasing what it held): the slot owns it now.
    void hold(Image *img) {
        free_Image(&img_, 0);
        img_ = img;
    }

  private:
    Image *img_ = nullptr;
    bool null_ = false;
};

// Releases a hand-made record (or one the library made) at scope exit.
struct ImageGuard {
    Image *img;
    ~ImageGuard() { free_Image(&img, 0); }
};

// Hand-made packed record: width x height x (bitcount / 8) bytes exactly,
// bit counts mostly 8, 16, 24, 32, sometimes null data.
inline PXImage *make_pximage(Input &in, Shape s) {
    PXImage *im = static_cast<PXImage *>(std::malloc(sizeof(PXImage)));
    im->width = s.width;
    im->height = s.height;
    im->bitcount = static_cast<int32_t>(s.bitCount);
    note_reach(s.width, s.height);
    const size_t bytes = s.width > 0 && s.height > 0
                             ? static_cast<size_t>(s.width) * static_cast<size_t>(s.height) * (s.bitCount / 8)
                             : 0;
    if (in.one_in(24)) {
        im->data = nullptr;
    } else {
        im->data = alloc_block(bytes);
        fill(in, im->data, bytes);
    }
    return im;
}

inline PXImage *make_pximage(Input &in, int32_t maxW = 64, int32_t maxH = 64) {
    return make_pximage(in, pick_shape(in, maxW, maxH));
}

struct PXImageGuard {
    PXImage *img;
    ~PXImageGuard() { PXImage_Free(img); }
};

// An int32 array of n values, each mostly in lo..hi.
inline std::vector<int32_t> ints(Input &in, size_t n, int32_t lo, int32_t hi) {
    std::vector<int32_t> v(n);
    for (int32_t &x : v)
        x = in.one_in(8) ? in.param(lo, hi) : in.range(lo, hi);
    return v;
}

// Pointer to the data of a vector, or null for about one call in `in`.
template <class T> T *maybe_null(Input &in, std::vector<T> &v, uint32_t nullIn = 16) {
    return in.one_in(nullIn) ? nullptr : v.data();
}

} // namespace fuzz
