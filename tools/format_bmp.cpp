// BMP in through stb_image (palettes of 1, 4 and 8 bits, 16- and 32-bit bit
// fields, 24 and 32 bits, bottom-up or top-down, a 32-bit alpha that is 0
// everywhere read as opaque). stb_image reads no run-length encoded files, so
// those (RLE8, RLE4) are first expanded here into an uncompressed 8-bit file
// with the same palette. BMP out through the library's saveBmp.
#define STB_IMAGE_IMPLEMENTATION
#define STBI_ONLY_BMP
#define STBI_NO_STDIO
#define STBI_NO_LINEAR
#define STBI_NO_HDR
#define STBI_NO_FAILURE_STRINGS
#if defined(__GNUC__)
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wconversion"
#pragma GCC diagnostic ignored "-Wsign-conversion"
#pragma GCC diagnostic ignored "-Wold-style-cast"
#pragma GCC diagnostic ignored "-Wcast-qual"
#pragma GCC diagnostic ignored "-Wshadow"
#pragma GCC diagnostic ignored "-Wunused-parameter"
#pragma GCC diagnostic ignored "-Wunused-function"
#pragma GCC diagnostic ignored "-Wimplicit-fallthrough"
#endif
#include <stb/stb_image.h>
#if defined(__GNUC__)
#pragma GCC diagnostic pop
#endif

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "picture_formats.hpp"

namespace pxio {

namespace {

constexpr size_t kFileHeader = 14;
constexpr uint32_t kRle8 = 1, kRle4 = 2;

uint32_t le16(const uint8_t *p) { return p[0] | static_cast<uint32_t>(p[1]) << 8; }
uint32_t le32(const uint8_t *p) { return le16(p) | le16(p + 2) << 16; }
void put32(uint8_t *p, uint32_t v) {
    for (int i = 0; i < 4; ++i)
        p[i] = static_cast<uint8_t>(v >> (8 * i));
}

struct BmpHeader {
    uint32_t offset = 0, headerSize = 0, bits = 0, compression = 0, colours = 0;
    int64_t width = 0, height = 0;
};

bool parse_header(const uint8_t *data, size_t size, BmpHeader *h) {
    if (size < kFileHeader + 12) return false;
    h->offset = le32(data + 10);
    h->headerSize = le32(data + 14);
    const uint8_t *info = data + kFileHeader;
    if (h->headerSize == 12) {
        h->width = le16(info + 4);
        h->height = le16(info + 6);
        h->bits = le16(info + 10);
        return true;
    }
    if (h->headerSize < 40 || size < kFileHeader + 40) return false;
    h->width = static_cast<int32_t>(le32(info + 4));
    h->height = static_cast<int32_t>(le32(info + 8));
    h->bits = le16(info + 14);
    h->compression = le32(info + 16);
    h->colours = le32(info + 32);
    return true;
}

// Expands the run-length codes of an RLE8 or RLE4 file into a bottom-up
// 8-bit file with the same palette. Pixels the codes skip or never reach
// take index 0. False for codes that run past the file or the picture.
bool expand_rle(const uint8_t *data, size_t size, const BmpHeader &h, std::vector<uint8_t> *file) {
    if (h.width <= 0 || h.height <= 0 || h.offset > size) return false;
    const size_t w = static_cast<size_t>(h.width), rows = static_cast<size_t>(h.height);
    const size_t pitch = (w + 3) & ~size_t{3};
    const size_t paletteEnd = kFileHeader + h.headerSize;
    const size_t entries = std::min<size_t>(h.colours == 0 ? (h.bits == 4 ? 16 : 256) : h.colours, 256);
    const size_t paletteBytes = std::min(entries * 4, size > paletteEnd ? size - paletteEnd : 0);
    const size_t pixels = kFileHeader + 40 + 256 * 4;
    file->assign(pixels + pitch * rows, 0);
    uint8_t *out = file->data();
    out[0] = 'B', out[1] = 'M';
    put32(out + 2, static_cast<uint32_t>(file->size()));
    put32(out + 10, static_cast<uint32_t>(pixels));
    put32(out + 14, 40);
    put32(out + 18, static_cast<uint32_t>(w));
    put32(out + 22, static_cast<uint32_t>(rows));
    out[26] = 1, out[28] = 8;
    put32(out + 46, 256);
    if (paletteBytes > 0) std::memcpy(out + kFileHeader + 40, data + paletteEnd, paletteBytes);
    const bool four = h.compression == kRle4;
    const uint8_t *p = data + h.offset, *end = data + size;
    size_t x = 0, y = 0;
    auto put = [&](uint8_t index) {
        if (x < w && y < rows) out[pixels + y * pitch + x] = index;
        ++x;
    };
    while (p + 2 <= end) {
        const uint32_t count = p[0], value = p[1];
        p += 2;
        if (count > 0) {
            for (uint32_t i = 0; i < count; ++i)
                put(four ? static_cast<uint8_t>(i % 2 == 0 ? value >> 4 : value & 15) : static_cast<uint8_t>(value));
        } else if (value == 0) {
            x = 0, ++y;
        } else if (value == 1) {
            return true;
        } else if (value == 2) {
            if (p + 2 > end) return false;
            x += p[0], y += p[1];
            p += 2;
        } else {
            const size_t bytes = four ? (value + 1) / 2 : value;
            if (static_cast<size_t>(end - p) < bytes) return false;
            for (uint32_t i = 0; i < value; ++i)
                put(four ? static_cast<uint8_t>(i % 2 == 0 ? p[i / 2] >> 4 : p[i / 2] & 15) : p[i]);
            p += bytes + (bytes & 1);
        }
        if (y > rows) return false;
    }
    return false; // no end-of-bitmap code: the file is cut short
}

} // namespace

bool decode_bmp(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error) {
    BmpHeader h;
    if (!parse_header(data, size, &h)) {
        *error = "truncated or corrupt BMP header";
        return false;
    }
    if (!size_allowed(static_cast<uint64_t>(h.width < 0 ? -h.width : h.width),
                      static_cast<uint64_t>(h.height < 0 ? -h.height : h.height), maxPixels, error))
        return false;
    std::vector<uint8_t> expanded;
    const bool rle = h.headerSize >= 40 && (h.compression == kRle8 || h.compression == kRle4);
    // stb_image reads missing rows as zeros: a file shorter than its rows is
    // refused here.
    const uint64_t rowBytes = (static_cast<uint64_t>(h.width < 0 ? -h.width : h.width) * h.bits + 31) / 32 * 4;
    if (!rle &&
        static_cast<uint64_t>(h.offset) + rowBytes * static_cast<uint64_t>(h.height < 0 ? -h.height : h.height) >
            size) {
        *error = "truncated BMP file";
        return false;
    }
    if (rle) {
        if (!expand_rle(data, size, h, &expanded)) {
            *error = "truncated or corrupt run-length encoded BMP data";
            return false;
        }
        data = expanded.data();
        size = expanded.size();
    }
    int w = 0, hgt = 0, channels = 0;
    if (size > static_cast<size_t>(INT32_MAX) ||
        stbi_info_from_memory(data, static_cast<int>(size), &w, &hgt, &channels) == 0) {
        *error = "unsupported or corrupt BMP file";
        return false;
    }
    const bool alpha = channels == 4;
    stbi_uc *pixels = stbi_load_from_memory(data, static_cast<int>(size), &w, &hgt, &channels, alpha ? 4 : 3);
    if (pixels == nullptr) {
        *error = "truncated or corrupt BMP file";
        return false;
    }
    ImagePtr im = new_picture(static_cast<uint32_t>(w), static_cast<uint32_t>(hgt), alpha, error);
    if (im) {
        const size_t bpp = alpha ? 4 : 3;
        for (int y = 0; y < hgt; ++y) {
            const stbi_uc *in = pixels + static_cast<size_t>(y) * static_cast<size_t>(w) * bpp;
            uint8_t *row = im->bits + static_cast<size_t>(y) * im->pitch;
            for (int x = 0; x < w; ++x, in += bpp, row += bpp) {
                row[0] = in[2], row[1] = in[1], row[2] = in[0];
                if (alpha) row[3] = in[3];
            }
        }
    }
    stbi_image_free(pixels);
    if (!im) return false;
    out->image = std::move(im);
    return true;
}

// BMP files show their first row at the bottom: a flipped copy is written so
// that the picture stands upright.
bool encode_bmp(const std::string &path, const Image *im, std::string *error) {
    ImagePtr flipped(malloc_Image(im->width, im->height, static_cast<int32_t>(im->bitCount)));
    if (!flipped) {
        *error = "out of memory";
        return false;
    }
    for (int32_t y = 0; y < im->height; ++y)
        std::memcpy(flipped->bits + static_cast<size_t>(y) * flipped->pitch,
                    im->bits + static_cast<size_t>(im->height - 1 - y) * im->pitch, im->pitch);
    if (saveBmp(path.c_str(), flipped.get()) != 1) {
        *error = "cannot write";
        return false;
    }
    return true;
}

} // namespace pxio
