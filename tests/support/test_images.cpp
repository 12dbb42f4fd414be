#include "support/test_images.hpp"

#include <cstdio>
#include <cstring>
#include <sstream>
#include <vector>

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
    if (im->pitch != src->pitch) {
        PX_free(im->bits);
        im->bits = static_cast<uint8_t *>(PX_malloc(static_cast<size_t>(src->pitch) * src->height));
        im->pitch = src->pitch;
    }
    std::memcpy(im->bits, src->bits, static_cast<size_t>(src->pitch) * src->height);
    return im;
}

Owned load_fixture(const std::string &name) {
    int32_t size = 0;
    unsigned char *file = PX_ReadMemFile((std::string(PXFX_TEST_DATA_DIR) + "/" + name).c_str(), &size);
    if (file == nullptr) return Owned();
    auto le = [&](int at) { return int32_t(file[at] | file[at + 1] << 8 | file[at + 2] << 16 | file[at + 3] << 24); };
    Owned im;
    if (size >= 54 && file[0] == 'B' && file[1] == 'M' && (file[28] | file[29] << 8) == 24) {
        im = make(le(18), le(22), 24);
        const size_t bytes = size_t(im->pitch) * im->height;
        if (im && size_t(size) >= size_t(le(10)) + bytes)
            std::memcpy(im->bits, file + le(10), bytes);
        else
            im.reset();
    }
    PX_ReleaseMemFile(file);
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
