// Reading and writing pictures for the command-line tool. Formats are
// recognised by their first bytes on input (PNG, JPEG, BMP, WebP, HEIF) and by
// the extension on output (PNG, JPEG, BMP, WebP). Pictures come out upright
// (EXIF orientation applied) and in sRGB (embedded colour profiles converted
// through Little CMS), as Image records with row 0 at the top: 24-bit, or
// 32-bit when the file has alpha.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace pxio {

// Metadata carried from an input picture to the outputs made from it.
struct Metadata {
    std::vector<uint8_t> exif; // APP1 form: "Exif\0\0" and a TIFF block, orientation 1
    std::vector<uint8_t> icc;  // a colour profile the pixels are in (empty: sRGB)
};

struct ReadOptions {
    // Pictures with more pixels are refused before decoding (decompression bombs).
    uint64_t maxPixels = 268435456;
    // Keep the pixels in the embedded profile and the profile in the metadata
    // instead of converting them to sRGB.
    bool keepProfile = false;
};

struct WriteOptions {
    int quality = 92;               // JPEG and WebP, 1..100
    int compression = 1;            // PNG (zlib level 0..9): fast by default
    uint32_t background = 0xFFFFFF; // 0xRRGGBB under transparent pixels in JPEG
    bool strip = false;             // write no EXIF and no profile
};

// Reads a picture file. False with a message naming the file on failure.
bool read_picture(const std::string &path, const ReadOptions &options, Image **image, Metadata *meta,
                  std::string *error);

// The same from a whole file in memory (`name` only for messages).
bool decode_picture(const uint8_t *data, size_t size, const std::string &name, const ReadOptions &options,
                    Image **image, Metadata *meta, std::string *error);

// Writes an Image of any bit count in the format of the extension of `path`,
// with the metadata the format can carry. False with a message on failure.
bool write_picture(const std::string &path, const Image *image, const Metadata &meta, const WriteOptions &options,
                   std::string *error);

// read_picture and write_picture with default options and no metadata.
Image *read_image(const std::string &path, std::string *error);
bool write_image(const std::string &path, const Image *image, std::string *error);

// True when write_picture knows the extension of `path`.
bool known_output(const std::string &path);

// Parses a colour as #RRGGBB, RRGGBB or one of white, black, gray; false when
// it is none of these.
bool parse_colour(const std::string &text, uint32_t *rgb);

} // namespace pxio
