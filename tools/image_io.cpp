// Pictures in and out: the format is recognised by its first bytes, decoded
// by its library, converted to sRGB and turned upright; outputs are written
// in the format of their extension with the metadata it can carry.
#include "image_io.hpp"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>
#include <memory>

#include "picture_adjust.hpp"
#include "picture_formats.hpp"

namespace pxio {

namespace {

struct FileCloser {
    void operator()(FILE *f) const { std::fclose(f); }
};
using File = std::unique_ptr<FILE, FileCloser>;

std::string lower_extension(const std::string &path) {
    const size_t dot = path.find_last_of('.');
    const size_t slash = path.find_last_of('/');
    if (dot == std::string::npos || (slash != std::string::npos && dot < slash)) return "";
    std::string ext = path.substr(dot + 1);
    for (char &c : ext)
        c = static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
    return ext;
}

bool starts_with(const uint8_t *data, size_t size, size_t at, const char *text) {
    const size_t n = std::strlen(text);
    return size >= at + n && std::memcmp(data + at, text, n) == 0;
}

// HEIF files open with a file-type box naming one of these brands.
bool is_heif(const uint8_t *data, size_t size) {
    if (!starts_with(data, size, 4, "ftyp")) return false;
    for (const char *brand : {"heic", "heix", "hevc", "hevx", "heim", "heis", "mif1", "msf1", "avif", "avis"})
        if (starts_with(data, size, 8, brand)) return true;
    return false;
}

using Decoder = bool (*)(const uint8_t *, size_t, uint64_t, Decoded *, std::string *);

Decoder decoder_for(const uint8_t *data, size_t size, const char **format) {
    const uint8_t png[8] = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n'};
    if (size >= 8 && std::memcmp(data, png, 8) == 0) return *format = "PNG", decode_png;
    if (size >= 3 && data[0] == 0xFF && data[1] == 0xD8 && data[2] == 0xFF) return *format = "JPEG", decode_jpeg;
    if (starts_with(data, size, 0, "BM")) return *format = "BMP", decode_bmp;
    if (starts_with(data, size, 0, "RIFF") && starts_with(data, size, 8, "WEBP")) return *format = "WebP", decode_webp;
    if (is_heif(data, size)) return *format = "HEIF", decode_heif;
    return nullptr;
}

} // namespace

bool size_allowed(uint64_t w, uint64_t h, uint64_t maxPixels, std::string *error) {
    if (w == 0 || h == 0) {
        *error = "picture without pixels";
        return false;
    }
    if (w > maxPixels || h > maxPixels / w) {
        *error = "picture of " + std::to_string(w) + " x " + std::to_string(h) + " pixels is above the limit of " +
                 std::to_string(maxPixels) + " pixels (--max-pixels)";
        return false;
    }
    return true;
}

ImagePtr new_picture(uint32_t w, uint32_t h, bool alpha, std::string *error) {
    ImagePtr im;
    if (w <= static_cast<uint32_t>(INT32_MAX) && h <= static_cast<uint32_t>(INT32_MAX))
        im.reset(malloc_Image(static_cast<int32_t>(w), static_cast<int32_t>(h), alpha ? 32 : 24));
    if (!im) *error = "picture too large for memory";
    return im;
}

void bgra_row(const Image *im, int32_t y, uint8_t *out, bool keepAlpha, const uint32_t *background) {
    const bool alpha = im->bitCount == 32;
    for (int32_t x = 0; x < im->width; ++x, out += 4) {
        const uint32_t c = GetPixelColor(im, x, y);
        const uint32_t a = alpha ? c >> 24 : 255;
        for (int i = 0; i < 3; ++i) {
            uint32_t v = (c >> (8 * i)) & 255;
            if (background != nullptr && a != 255)
                v = (v * a + ((*background >> (8 * i)) & 255) * (255 - a) + 127) / 255;
            out[i] = static_cast<uint8_t>(v);
        }
        out[3] = static_cast<uint8_t>(keepAlpha && background == nullptr ? a : 255);
    }
}

std::vector<uint8_t> exif_from_tiff(const uint8_t *tiff, size_t size) {
    static const uint8_t header[kExifHeader] = {'E', 'x', 'i', 'f', 0, 0};
    if (size >= kExifHeader && std::memcmp(tiff, header, kExifHeader) == 0) return {tiff, tiff + size};
    std::vector<uint8_t> exif(header, header + kExifHeader);
    exif.insert(exif.end(), tiff, tiff + size);
    return exif;
}

bool decode_picture(const uint8_t *data, size_t size, const std::string &name, const ReadOptions &options,
                    Image **image, Metadata *meta, std::string *error) {
    const char *format = "";
    const Decoder decode = decoder_for(data, size, &format);
    if (decode == nullptr) {
        *error = name + ": not a PNG, JPEG, BMP, WebP or HEIF file";
        return false;
    }
    Decoded d;
    if (!decode(data, size, options.maxPixels, &d, error)) {
        *error = name + ": " + format + ": " + *error;
        return false;
    }
    // Colour: the pixels go to sRGB unless the profile is to be kept with
    // them; a profile that is not an RGB one, or sRGB itself, is dropped.
    const ProfileKind kind = profile_kind(d.meta.icc);
    if (kind == ProfileKind::Rgb && !options.keepProfile && convert_to_srgb(d.image.get(), d.meta.icc))
        d.meta.icc.clear();
    if (kind != ProfileKind::Rgb) d.meta.icc.clear();
    const int orientation = take_orientation(&d.meta.exif);
    if (orientation != 1 && !d.upright) {
        ImagePtr upright = orient(d.image.get(), orientation, error);
        if (!upright) {
            *error = name + ": " + *error;
            return false;
        }
        d.image = std::move(upright);
    }
    *image = d.image.release();
    if (meta != nullptr) *meta = std::move(d.meta);
    return true;
}

bool read_picture(const std::string &path, const ReadOptions &options, Image **image, Metadata *meta,
                  std::string *error) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        *error = path + ": cannot open";
        return false;
    }
    const std::vector<uint8_t> data{std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
    if (in.bad()) {
        *error = path + ": cannot read";
        return false;
    }
    return decode_picture(data.data(), data.size(), path, options, image, meta, error);
}

Image *read_image(const std::string &path, std::string *error) {
    Image *im = nullptr;
    return read_picture(path, ReadOptions{}, &im, nullptr, error) ? im : nullptr;
}

bool known_output(const std::string &path) {
    const std::string ext = lower_extension(path);
    return ext == "png" || ext == "jpg" || ext == "jpeg" || ext == "bmp" || ext == "webp";
}

bool write_picture(const std::string &path, const Image *image, const Metadata &meta, const WriteOptions &options,
                   std::string *error) {
    if (image == nullptr || image->bits == nullptr || image->width <= 0 || image->height <= 0) {
        *error = "no picture to write";
        return false;
    }
    const std::string ext = lower_extension(path);
    if (!known_output(path)) {
        *error = path + ": unknown output type (use .png, .jpg, .webp or .bmp)";
        return false;
    }
    bool ok = false;
    if (ext == "bmp") {
        ok = encode_bmp(path, image, error);
    } else {
        File f(std::fopen(path.c_str(), "wb"));
        if (!f) {
            *error = path + ": cannot open for writing";
            return false;
        }
        if (ext == "png")
            ok = encode_png(f.get(), image, meta, options, error);
        else if (ext == "webp")
            ok = encode_webp(f.get(), image, meta, options, error);
        else
            ok = encode_jpeg(f.get(), image, meta, options, error);
        ok = std::fclose(f.release()) == 0 && ok;
    }
    if (!ok) {
        std::remove(path.c_str());
        *error = path + ": " + (error->empty() ? "cannot write" : *error);
    }
    return ok;
}

bool write_image(const std::string &path, const Image *image, std::string *error) {
    return write_picture(path, image, Metadata{}, WriteOptions{}, error);
}

bool parse_colour(const std::string &text, uint32_t *rgb) {
    if (text == "white") return *rgb = 0xFFFFFF, true;
    if (text == "black") return *rgb = 0x000000, true;
    if (text == "gray" || text == "grey") return *rgb = 0x808080, true;
    const std::string hex = !text.empty() && text[0] == '#' ? text.substr(1) : text;
    if (hex.size() != 6 || hex.find_first_not_of("0123456789abcdefABCDEF") != std::string::npos) return false;
    *rgb = static_cast<uint32_t>(std::stoul(hex, nullptr, 16));
    return true;
}

} // namespace pxio
