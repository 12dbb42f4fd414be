#include "support/test_images.hpp"

#include <cstring>
#include <sstream>

namespace pxtest {

Owned make(int32_t width, int32_t height, int32_t bitCount) { return Owned(malloc_Image(width, height, bitCount)); }

Owned random_image(int32_t width, int32_t height, int32_t bitCount, uint32_t seed) {
    Owned im = make(width, height, bitCount);
    std::mt19937 rng(seed);
    const size_t n = static_cast<size_t>(im->pitch) * im->height;
    for (size_t i = 0; i < n; ++i)
        im->bits[i] = static_cast<uint8_t>(rng() >> 24);
    return im;
}

Owned filled(int32_t width, int32_t height, int32_t bitCount, uint32_t colour) {
    Owned im = make(width, height, bitCount);
    for (int32_t y = 0; y < height; ++y)
        for (int32_t x = 0; x < width; ++x)
            SetPixelColor(im.get(), x, y, colour);
    return im;
}

Owned clone(const Image *src) {
    Owned im = make(src->width, src->height, static_cast<int32_t>(src->bitCount));
    std::memcpy(im->bits, src->bits, static_cast<size_t>(src->pitch) * src->height);
    return im;
}

std::string diff(const Image *a, const Image *b) {
    std::ostringstream out;
    if (a == nullptr || b == nullptr) return "null image";
    if (a->width != b->width || a->height != b->height || a->bitCount != b->bitCount) {
        out << "shape " << a->width << "x" << a->height << "@" << a->bitCount << " vs " << b->width << "x" << b->height
            << "@" << b->bitCount;
        return out.str();
    }
    const size_t rowBytes = (static_cast<size_t>(a->width) * a->bitCount + 7) / 8;
    for (int32_t y = 0; y < a->height; ++y) {
        const uint8_t *ra = a->bits + static_cast<size_t>(y) * a->pitch;
        const uint8_t *rb = b->bits + static_cast<size_t>(y) * b->pitch;
        for (size_t i = 0; i < rowBytes; ++i) {
            if (ra[i] != rb[i]) {
                out << "row " << y << " byte " << i << ": " << int(ra[i]) << " vs " << int(rb[i]);
                return out.str();
            }
        }
    }
    return "";
}

} // namespace pxtest
