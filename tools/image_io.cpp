#include "image_io.hpp"

#include <jpeglib.h>
#include <png.h>

#include <csetjmp>
#include <cstdio>
#include <cstring>
#include <memory>
#include <vector>

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

uint8_t *row(const Image *im, int32_t y) { return im->bits + static_cast<size_t>(y) * im->pitch; }

// Blue, green, red (and alpha) bytes of any Image, one row at a time.
void read_bgra(const Image *im, int32_t y, uint8_t *out) {
    for (int32_t x = 0; x < im->width; ++x) {
        const uint32_t c = GetPixelColor(im, x, y);
        out[4 * x] = static_cast<uint8_t>(c), out[4 * x + 1] = static_cast<uint8_t>(c >> 8);
        out[4 * x + 2] = static_cast<uint8_t>(c >> 16), out[4 * x + 3] = static_cast<uint8_t>(c >> 24);
    }
}

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

bool write_png(const std::string &path, const Image *im, std::string *error) {
    png_image png{};
    png.version = PNG_IMAGE_VERSION;
    png.width = static_cast<png_uint_32>(im->width);
    png.height = static_cast<png_uint_32>(im->height);
    const void *rows = im->bits;
    png_int_32 stride = static_cast<png_int_32>(im->pitch);
    std::vector<uint8_t> converted;
    if (im->bitCount == 8) {
        png.format = PNG_FORMAT_GRAY;
    } else if (im->bitCount == 24) {
        png.format = PNG_FORMAT_BGR;
    } else {
        png.format = PNG_FORMAT_BGRA;
        if (im->bitCount != 32) {
            converted.resize(static_cast<size_t>(im->width) * 4 * im->height);
            for (int32_t y = 0; y < im->height; ++y)
                read_bgra(im, y, converted.data() + static_cast<size_t>(y) * im->width * 4);
            for (size_t i = 3; i < converted.size(); i += 4)
                converted[i] = 255;
            rows = converted.data();
            stride = im->width * 4;
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

struct JpegError {
    jpeg_error_mgr mgr;
    std::jmp_buf jump;
    char message[JMSG_LENGTH_MAX];
};

void jpeg_fail(j_common_ptr info) {
    auto *err = reinterpret_cast<JpegError *>(info->err);
    (*info->err->format_message)(info, err->message);
    std::longjmp(err->jump, 1);
}

Image *read_jpeg(const std::string &path, std::string *error) {
    File f(std::fopen(path.c_str(), "rb"));
    if (!f) {
        *error = path + ": cannot open";
        return nullptr;
    }
    jpeg_decompress_struct info{};
    JpegError err{};
    info.err = jpeg_std_error(&err.mgr);
    err.mgr.error_exit = jpeg_fail;
    Image *im = nullptr;
    std::vector<uint8_t> line;
    if (setjmp(err.jump)) {
        *error = path + ": " + err.message;
        jpeg_destroy_decompress(&info);
        free_Image(&im, 0);
        return nullptr;
    }
    jpeg_create_decompress(&info);
    jpeg_stdio_src(&info, f.get());
    jpeg_read_header(&info, TRUE);
    info.out_color_space = JCS_RGB;
    jpeg_start_decompress(&info);
    im = malloc_Image(static_cast<int32_t>(info.output_width), static_cast<int32_t>(info.output_height), 24);
    if (im == nullptr) {
        *error = path + ": picture too large";
        jpeg_destroy_decompress(&info);
        return nullptr;
    }
    line.resize(static_cast<size_t>(info.output_width) * 3);
    while (info.output_scanline < info.output_height) {
        const int32_t y = static_cast<int32_t>(info.output_scanline);
        JSAMPROW p = line.data();
        jpeg_read_scanlines(&info, &p, 1);
        uint8_t *out = row(im, y);
        for (size_t x = 0; x < info.output_width; ++x) {
            out[3 * x] = line[3 * x + 2];
            out[3 * x + 1] = line[3 * x + 1];
            out[3 * x + 2] = line[3 * x];
        }
    }
    jpeg_finish_decompress(&info);
    jpeg_destroy_decompress(&info);
    return im;
}

bool write_jpeg(const std::string &path, const Image *im, std::string *error) {
    File f(std::fopen(path.c_str(), "wb"));
    if (!f) {
        *error = path + ": cannot open for writing";
        return false;
    }
    jpeg_compress_struct info{};
    JpegError err{};
    info.err = jpeg_std_error(&err.mgr);
    err.mgr.error_exit = jpeg_fail;
    std::vector<uint8_t> line(static_cast<size_t>(im->width) * 4);
    std::vector<uint8_t> rgb(static_cast<size_t>(im->width) * 3);
    if (setjmp(err.jump)) {
        *error = path + ": " + err.message;
        jpeg_destroy_compress(&info);
        return false;
    }
    jpeg_create_compress(&info);
    jpeg_stdio_dest(&info, f.get());
    info.image_width = static_cast<JDIMENSION>(im->width);
    info.image_height = static_cast<JDIMENSION>(im->height);
    info.input_components = 3;
    info.in_color_space = JCS_RGB;
    jpeg_set_defaults(&info);
    jpeg_set_quality(&info, 92, TRUE);
    jpeg_start_compress(&info, TRUE);
    for (int32_t y = 0; y < im->height; ++y) {
        read_bgra(im, y, line.data());
        for (int32_t x = 0; x < im->width; ++x) {
            rgb[3 * x] = line[4 * x + 2];
            rgb[3 * x + 1] = line[4 * x + 1];
            rgb[3 * x + 2] = line[4 * x];
        }
        JSAMPROW p = rgb.data();
        jpeg_write_scanlines(&info, &p, 1);
    }
    jpeg_finish_compress(&info);
    jpeg_destroy_compress(&info);
    return true;
}

uint32_t le32(const uint8_t *p) { return p[0] | p[1] << 8 | p[2] << 16 | static_cast<uint32_t>(p[3]) << 24; }

// Uncompressed 8-, 24- and 32-bit BMP files, bottom-up or top-down.
Image *read_bmp(const std::string &path, std::string *error) {
    int32_t size = 0;
    unsigned char *file = PX_ReadMemFile(path.c_str(), &size);
    if (file == nullptr) {
        *error = path + ": cannot read";
        return nullptr;
    }
    std::unique_ptr<unsigned char, void (*)(void *)> owner(file, PX_ReleaseMemFile);
    if (size < 54 || file[0] != 'B' || file[1] != 'M') {
        *error = path + ": not a BMP file";
        return nullptr;
    }
    const uint32_t offset = le32(file + 10);
    const int32_t width = static_cast<int32_t>(le32(file + 18));
    const int32_t rawHeight = static_cast<int32_t>(le32(file + 22));
    const uint32_t bits = file[28] | file[29] << 8;
    const uint32_t compression = le32(file + 30);
    if ((bits != 8 && bits != 24 && bits != 32) || (compression != 0 && compression != 3) || width <= 0 ||
        rawHeight == 0 || rawHeight == INT32_MIN) {
        *error = path + ": unsupported BMP layout";
        return nullptr;
    }
    const int32_t height = rawHeight < 0 ? -rawHeight : rawHeight;
    Image *im = malloc_Image(width, height, static_cast<int32_t>(bits));
    if (im == nullptr) {
        *error = path + ": picture too large";
        return nullptr;
    }
    const uint64_t need = static_cast<uint64_t>(offset) + static_cast<uint64_t>(im->pitch) * height;
    if (need > static_cast<uint64_t>(size)) {
        free_Image(&im, 0);
        *error = path + ": truncated BMP file";
        return nullptr;
    }
    for (int32_t y = 0; y < height; ++y) {
        const int32_t src = rawHeight > 0 ? height - 1 - y : y;
        std::memcpy(row(im, y), file + offset + static_cast<size_t>(src) * im->pitch, im->pitch);
    }
    return im;
}

// BMP files show their first row at the bottom; write a flipped copy so the
// picture stands upright.
bool write_bmp(const std::string &path, const Image *im, std::string *error) {
    Image *flipped = malloc_Image(im->width, im->height, static_cast<int32_t>(im->bitCount));
    if (flipped == nullptr) {
        *error = "out of memory";
        return false;
    }
    for (int32_t y = 0; y < im->height; ++y)
        std::memcpy(row(flipped, y), row(im, im->height - 1 - y), im->pitch);
    const bool ok = saveBmp(path.c_str(), flipped) == 1;
    free_Image(&flipped, 0);
    if (!ok) *error = path + ": cannot write";
    return ok;
}

} // namespace

Image *read_image(const std::string &path, std::string *error) {
    unsigned char magic[8] = {};
    {
        File f(std::fopen(path.c_str(), "rb"));
        if (!f) {
            *error = path + ": cannot open";
            return nullptr;
        }
        if (std::fread(magic, 1, sizeof magic, f.get()) < 2) {
            *error = path + ": not a picture";
            return nullptr;
        }
    }
    if (magic[0] == 0x89 && magic[1] == 'P' && magic[2] == 'N' && magic[3] == 'G') return read_png(path, error);
    if (magic[0] == 0xFF && magic[1] == 0xD8) return read_jpeg(path, error);
    if (magic[0] == 'B' && magic[1] == 'M') return read_bmp(path, error);
    *error = path + ": not a PNG, JPEG or BMP file";
    return nullptr;
}

bool known_output(const std::string &path) {
    const std::string ext = lower_extension(path);
    return ext == "png" || ext == "jpg" || ext == "jpeg" || ext == "bmp";
}

bool write_image(const std::string &path, const Image *image, std::string *error) {
    if (image == nullptr || image->bits == nullptr) {
        *error = "no picture to write";
        return false;
    }
    const std::string ext = lower_extension(path);
    if (ext == "png") return write_png(path, image, error);
    if (ext == "jpg" || ext == "jpeg") return write_jpeg(path, image, error);
    if (ext == "bmp") return write_bmp(path, image, error);
    *error = path + ": unknown output type (use .png, .jpg or .bmp)";
    return false;
}

} // namespace pxio
