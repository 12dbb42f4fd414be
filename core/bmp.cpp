// BMP output: a 14-byte file header, a 40-byte information header, a gray
// palette for 8-bit images, then the rows exactly as they lie in memory.
#include <pxfx/core.h>

#include <cstdint>

#include "core/internal/image_check.hpp"

using namespace pxfx;

namespace {

void put16(uint8_t *p, uint32_t v) {
    p[0] = static_cast<uint8_t>(v);
    p[1] = static_cast<uint8_t>(v >> 8);
}

void put32(uint8_t *p, uint32_t v) {
    put16(p, v);
    put16(p + 2, v >> 16);
}

} // namespace

extern "C" int32_t saveBmp(const char *path, const Image *image) {
    // The block written is the pitch x height bytes the record claims; a
    // negative height claims none that could be written.
    if (image == nullptr || image->bits == nullptr || image->height < 0 || !block_claim_ok(image)) return 0;
    uint8_t palette[256 * 4];
    for (uint32_t i = 0; i < 256; ++i) {
        palette[4 * i] = palette[4 * i + 1] = palette[4 * i + 2] = static_cast<uint8_t>(i);
        palette[4 * i + 3] = 0;
    }
    FILE *f = PX_fopen(path, "wb");
    if (f == nullptr) return 0;

    const bool indexed = image->bitCount == 8;
    const uint32_t imageSize = image->pitch * static_cast<uint32_t>(image->height);
    const uint32_t offset = indexed ? 1078 : 54;
    uint8_t header[54] = {};
    put16(header, 0x4D42);
    put32(header + 2, offset + imageSize);
    put32(header + 10, offset);
    put32(header + 14, 40);
    put32(header + 18, static_cast<uint32_t>(image->width));
    put32(header + 22, static_cast<uint32_t>(image->height));
    put16(header + 26, 1);
    put16(header + 28, image->bitCount);
    put32(header + 34, imageSize);
    PX_fwrite(header, 1, sizeof header, f);
    if (indexed) PX_fwrite(palette, 1, sizeof palette, f);
    PX_fwrite(image->bits, static_cast<size_t>(imageSize), 1, f);
    PX_fclose(f);
    return 1;
}
