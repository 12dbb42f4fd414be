#include "image_io.hpp"

#include <png.h>

#include <cstdio>
#include <memory>
#include <vector>

namespace pxio {

namespace {

struct FileCloser {
    void operator()(FILE *f) const { std::fclose(f); }
};
using File = std::unique_ptr<FILE, FileCloser>;

} // namespace

Image *read_png(const std::string &path, std::string *error) {
    png_image png{};
    png.version = PNG_IMAGE_VERSION;
    if (!png_image_begin_read_from_file(&png, path.c_str())) {
        *error = path + ": " + png.message;
        return nullptr;
    }
    const bool alpha = (png.format & PNG_FORMAT_FLAG_ALPHA) != 0;
    png.format = alpha ? PNG_FORMAT_BGRA : PNG_FORMAT_BGR;
    Image *im = malloc_Image(static_cast<int32_t>(png.width), static_cast<int32_t>(png.height), alpha ? 32 : 24);
    if (im == nullptr) {
        png_image_free(&png);
        *error = path + ": picture too large";
        return nullptr;
    }
    if (!png_image_finish_read(&png, nullptr, im->bits, static_cast<png_int_32>(im->pitch), nullptr)) {
        *error = path + ": " + png.message;
        free_Image(&im, 0);
        return nullptr;
    }
    return im;
}

bool write_png(const std::string &path, const Image *image, std::string *error) {
    if (image == nullptr || image->bits == nullptr) {
        *error = "no picture to write";
        return false;
    }
    png_image png{};
    png.version = PNG_IMAGE_VERSION;
    png.width = static_cast<png_uint_32>(image->width);
    png.height = static_cast<png_uint_32>(image->height);
    std::vector<uint8_t> converted;
    const void *rows = image->bits;
    png_int_32 stride = static_cast<png_int_32>(image->pitch);
    switch (image->bitCount) {
    case 8: png.format = PNG_FORMAT_GRAY; break;
    case 24: png.format = PNG_FORMAT_BGR; break;
    case 32: png.format = PNG_FORMAT_BGRA; break;
    default: {
        png.format = PNG_FORMAT_BGR;
        converted.resize(static_cast<size_t>(image->width) * 3 * image->height);
        for (int32_t y = 0; y < image->height; ++y)
            for (int32_t x = 0; x < image->width; ++x) {
                const uint32_t c = GetPixelColor(image, x, y);
                uint8_t *p = &converted[(static_cast<size_t>(y) * image->width + x) * 3];
                p[0] = static_cast<uint8_t>(c);
                p[1] = static_cast<uint8_t>(c >> 8);
                p[2] = static_cast<uint8_t>(c >> 16);
            }
        rows = converted.data();
        stride = image->width * 3;
    }
    }
    File f(std::fopen(path.c_str(), "wb"));
    if (!f) {
        *error = path + ": cannot open for writing";
        return false;
    }
    if (!png_image_write_to_stdio(&png, f.get(), 0, rows, stride, nullptr)) {
        *error = path + ": " + png.message;
        return false;
    }
    return true;
}

} // namespace pxio
