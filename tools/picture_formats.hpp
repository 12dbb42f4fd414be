// The picture formats of the tool, each decoded and encoded through the
// field's libraries: libjpeg, libpng, libwebp, libheif and stb_image (BMP).
// Decoders work on the whole file in memory and hand over the pixels as
// stored with the metadata they found; image_io.cpp then applies the colour
// profile and the orientation. Pictures are Image records with row 0 at the
// top, 24-bit (32-bit with alpha), blue first.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

#include "image_io.hpp"

namespace pxio {

struct ImageFree {
    void operator()(Image *im) const { free_Image(&im, 0); }
};
using ImagePtr = std::unique_ptr<Image, ImageFree>;

struct Decoded {
    ImagePtr image;
    Metadata meta;
    // The container applied its own orientation already: the EXIF
    // orientation is not to be applied again.
    bool upright = false;
};

// Each decoder: true with the picture in *out, or false with a message that
// does not name the file.
bool decode_jpeg(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error);
bool decode_png(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error);
bool decode_bmp(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error);
bool decode_webp(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error);
bool decode_heif(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error);

// Each encoder writes to an open file; false with a message on failure.
bool encode_jpeg(FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt, std::string *error);
bool encode_png(FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt, std::string *error);
bool encode_webp(FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt, std::string *error);
bool encode_bmp(const std::string &path, const Image *im, std::string *error);

// False with a message when a picture of w x h pixels is empty or above the limit.
bool size_allowed(uint64_t w, uint64_t h, uint64_t maxPixels, std::string *error);

// A new 24-bit (32-bit with alpha) Image of w x h, or null with a message.
ImagePtr new_picture(uint32_t w, uint32_t h, bool alpha, std::string *error);

// Blue, green, red and alpha bytes of row y of any Image, 4 bytes a pixel.
// Without `keepAlpha` the alpha of every pixel is 255; with a background
// (0xRRGGBB) the colour is composited onto it and the alpha becomes 255.
void bgra_row(const Image *im, int32_t y, uint8_t *out, bool keepAlpha, const uint32_t *background);

// Size of the EXIF header that starts an APP1 payload ("Exif\0\0").
inline constexpr size_t kExifHeader = 6;
// The EXIF of `tiff` (a TIFF-structured block) in the APP1 form Metadata keeps.
std::vector<uint8_t> exif_from_tiff(const uint8_t *tiff, size_t size);

} // namespace pxio
