// PNG through libpng: every colour type and bit depth in (16-bit samples
// scaled to 8 bits as they are, palettes and transparency expanded), with the
// colour profile (iCCP) and EXIF (eXIf); gray, BGR or BGRA pictures out at a
// chosen zlib level, with the same metadata.
#include <png.h>

#include <cstring>

#include "picture_formats.hpp"

namespace pxio {

namespace {

struct PngFailure {
    std::string message;
};

[[noreturn]] void png_fail(png_structp png, png_const_charp message) {
    static_cast<PngFailure *>(png_get_error_ptr(png))->message = message;
    png_longjmp(png, 1);
}

void png_quiet(png_structp, png_const_charp) {}

struct MemoryReader {
    const uint8_t *data;
    size_t size, pos;
};

void read_memory(png_structp png, png_bytep out, size_t n) {
    auto *r = static_cast<MemoryReader *>(png_get_io_ptr(png));
    if (n > r->size - r->pos) png_error(png, "truncated PNG file");
    std::memcpy(out, r->data + r->pos, n);
    r->pos += n;
}

} // namespace

bool decode_png(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error) {
    PngFailure failure;
    png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, &failure, png_fail, png_quiet);
    png_infop info = png == nullptr ? nullptr : png_create_info_struct(png);
    if (info == nullptr) {
        png_destroy_read_struct(&png, nullptr, nullptr);
        *error = "out of memory";
        return false;
    }
    MemoryReader reader{data, size, 0};
    ImagePtr im;
    std::vector<png_bytep> rows;
    if (setjmp(png_jmpbuf(png))) {
        png_destroy_read_struct(&png, &info, nullptr);
        *error = failure.message;
        return false;
    }
    png_set_read_fn(png, &reader, read_memory);
    png_read_info(png, info);
    const png_uint_32 w = png_get_image_width(png, info), h = png_get_image_height(png, info);
    if (!size_allowed(w, h, maxPixels, error)) {
        png_destroy_read_struct(&png, &info, nullptr);
        return false;
    }
    const int type = png_get_color_type(png, info);
    png_set_scale_16(png);
    png_set_expand(png); // palettes to RGB, gray below 8 bits to 8, transparency to alpha
    if ((type & PNG_COLOR_MASK_COLOR) == 0) png_set_gray_to_rgb(png);
    png_set_bgr(png);
    png_set_interlace_handling(png);
    png_read_update_info(png, info);
    const bool alpha = (png_get_color_type(png, info) & PNG_COLOR_MASK_ALPHA) != 0;
    im = new_picture(w, h, alpha, error);
    if (!im) {
        png_destroy_read_struct(&png, &info, nullptr);
        return false;
    }
    rows.resize(h);
    for (png_uint_32 y = 0; y < h; ++y)
        rows[y] = im->bits + static_cast<size_t>(y) * im->pitch;
    png_read_image(png, rows.data());
    png_read_end(png, info);
    png_charp name = nullptr;
    int compression = 0;
    png_bytep profile = nullptr;
    png_uint_32 profileSize = 0;
    if (png_get_iCCP(png, info, &name, &compression, &profile, &profileSize) != 0 && profileSize > 0)
        out->meta.icc.assign(profile, profile + profileSize);
    png_uint_32 exifSize = 0;
    png_bytep exif = nullptr;
    if (png_get_eXIf_1(png, info, &exifSize, &exif) != 0 && exifSize > 0)
        out->meta.exif = exif_from_tiff(exif, exifSize);
    png_destroy_read_struct(&png, &info, nullptr);
    out->image = std::move(im);
    return true;
}

namespace {

// The libpng calls of an encoding, apart from the objects with destructors
// (a longjmp out of libpng must not skip any). `converted` holds a row of
// BGRA bytes for pictures of other bit counts than 8, 24 and 32, else null.
bool write_png(png_structp png, png_infop info, FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt,
               uint8_t *converted) {
    if (setjmp(png_jmpbuf(png))) return false;
    png_init_io(png, f);
    png_set_compression_level(png, opt.compression);
    const int type = im->bitCount == 8    ? PNG_COLOR_TYPE_GRAY
                     : im->bitCount == 24 ? PNG_COLOR_TYPE_RGB
                                          : PNG_COLOR_TYPE_RGB_ALPHA;
    png_set_IHDR(png, info, static_cast<png_uint_32>(im->width), static_cast<png_uint_32>(im->height), 8, type,
                 PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    if (!opt.strip) {
        if (!meta.icc.empty())
            png_set_iCCP(png, info, "icc", PNG_COMPRESSION_TYPE_BASE, meta.icc.data(),
                         static_cast<png_uint_32>(meta.icc.size()));
        if (meta.exif.size() > kExifHeader)
            png_set_eXIf_1(png, info, static_cast<png_uint_32>(meta.exif.size() - kExifHeader),
                           const_cast<png_bytep>(meta.exif.data() + kExifHeader));
    }
    png_write_info(png, info);
    png_set_bgr(png);
    for (int32_t y = 0; y < im->height; ++y) {
        png_bytep row = im->bits + static_cast<size_t>(y) * im->pitch;
        if (converted != nullptr) {
            bgra_row(im, y, converted, false, nullptr);
            row = converted;
        }
        png_write_row(png, row);
    }
    png_write_end(png, info);
    return true;
}

} // namespace

bool encode_png(FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt, std::string *error) {
    PngFailure failure;
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, &failure, png_fail, png_quiet);
    png_infop info = png == nullptr ? nullptr : png_create_info_struct(png);
    const bool bytes = im->bitCount == 8 || im->bitCount == 24 || im->bitCount == 32;
    std::vector<uint8_t> converted(bytes ? 0 : static_cast<size_t>(im->width) * 4);
    const bool made = info != nullptr;
    const bool ok = made && write_png(png, info, f, im, meta, opt, bytes ? nullptr : converted.data());
    png_destroy_write_struct(&png, &info);
    if (!ok) *error = made ? failure.message : "out of memory";
    return ok;
}

} // namespace pxio
