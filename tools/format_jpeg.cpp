// JPEG through libjpeg(-turbo): colour and CMYK/YCCK pictures in, with their
// EXIF (APP1) and colour profile (APP2); BGR pictures out with quality,
// metadata and transparent pixels composited onto a background.
#include <csetjmp>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <jerror.h>
#include <jpeglib.h>

#include "picture_adjust.hpp"
#include "picture_formats.hpp"

namespace pxio {

namespace {

struct JpegError {
    jpeg_error_mgr mgr;
    std::jmp_buf jump;
    char message[JMSG_LENGTH_MAX];
    bool damaged; // a warning that means missing or corrupt picture data
};

[[noreturn]] void jpeg_fail(j_common_ptr info) {
    auto *err = reinterpret_cast<JpegError *>(info->err);
    (*info->err->format_message)(info, err->message);
    std::longjmp(err->jump, 1);
}

// Warnings are not printed. Extraneous bytes between markers are harmless;
// any other warning (a truncated file, corrupt entropy data) fails the
// picture rather than hand over the gray fill libjpeg puts in its place.
void jpeg_warn(j_common_ptr info, int level) {
    auto *err = reinterpret_cast<JpegError *>(info->err);
    if (level >= 0 || err->damaged || info->err->msg_code == JWRN_EXTRANEOUS_DATA) return;
    (*info->err->format_message)(info, err->message);
    err->damaged = true;
}

jpeg_error_mgr *init_errors(JpegError *err) {
    jpeg_std_error(&err->mgr);
    err->mgr.error_exit = jpeg_fail;
    err->mgr.emit_message = jpeg_warn;
    err->damaged = false;
    return &err->mgr;
}

constexpr uint8_t kExifSignature[kExifHeader] = {'E', 'x', 'i', 'f', 0, 0};
constexpr size_t kMaxMarkerPayload = 65533;

} // namespace

bool decode_jpeg(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error) {
    jpeg_decompress_struct info{};
    JpegError err{};
    info.err = init_errors(&err);
    ImagePtr im;
    std::vector<uint8_t> line;
    CmykConverter cmyk;
    if (setjmp(err.jump)) {
        *error = err.message;
        jpeg_destroy_decompress(&info);
        return false;
    }
    jpeg_create_decompress(&info);
    jpeg_mem_src(&info, data, static_cast<unsigned long>(size));
    jpeg_save_markers(&info, JPEG_APP0 + 1, 0xFFFF);
    jpeg_save_markers(&info, JPEG_APP0 + 2, 0xFFFF);
    jpeg_read_header(&info, TRUE);
    if (!size_allowed(info.image_width, info.image_height, maxPixels, error)) {
        jpeg_destroy_decompress(&info);
        return false;
    }
    for (jpeg_saved_marker_ptr m = info.marker_list; m != nullptr; m = m->next)
        if (m->marker == JPEG_APP0 + 1 && m->data_length > kExifHeader && out->meta.exif.empty() &&
            std::memcmp(m->data, kExifSignature, kExifHeader) == 0)
            out->meta.exif.assign(m->data, m->data + m->data_length);
    JOCTET *icc = nullptr;
    unsigned int iccSize = 0;
    if (jpeg_read_icc_profile(&info, &icc, &iccSize)) {
        out->meta.icc.assign(icc, icc + iccSize);
        std::free(icc);
    }
    const bool fourChannels = info.jpeg_color_space == JCS_CMYK || info.jpeg_color_space == JCS_YCCK;
    info.out_color_space = fourChannels ? JCS_CMYK : JCS_EXT_BGR;
    jpeg_start_decompress(&info);
    im = new_picture(info.output_width, info.output_height, false, error);
    if (!im) {
        jpeg_destroy_decompress(&info);
        return false;
    }
    if (fourChannels) {
        // Adobe's writers store CMYK inverted, and mark it with their marker.
        cmyk.prepare(out->meta.icc, info.saw_Adobe_marker != 0);
        out->meta.icc.clear(); // the pixels are sRGB from here on
        line.resize(static_cast<size_t>(info.output_width) * 4);
    }
    while (info.output_scanline < info.output_height) {
        uint8_t *row = im->bits + static_cast<size_t>(info.output_scanline) * im->pitch;
        JSAMPROW p = fourChannels ? line.data() : row;
        jpeg_read_scanlines(&info, &p, 1);
        if (fourChannels) cmyk.convert(line.data(), row, info.output_width);
    }
    jpeg_finish_decompress(&info);
    jpeg_destroy_decompress(&info);
    if (err.damaged) {
        *error = err.message;
        return false;
    }
    out->image = std::move(im);
    return true;
}

bool encode_jpeg(FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt, std::string *error) {
    jpeg_compress_struct info{};
    JpegError err{};
    info.err = init_errors(&err);
    std::vector<uint8_t> line(static_cast<size_t>(im->width) * 4), bgr(static_cast<size_t>(im->width) * 3);
    if (setjmp(err.jump)) {
        *error = err.message;
        jpeg_destroy_compress(&info);
        return false;
    }
    jpeg_create_compress(&info);
    jpeg_stdio_dest(&info, f);
    info.image_width = static_cast<JDIMENSION>(im->width);
    info.image_height = static_cast<JDIMENSION>(im->height);
    info.input_components = 3;
    info.in_color_space = JCS_EXT_BGR;
    jpeg_set_defaults(&info);
    jpeg_set_quality(&info, opt.quality, TRUE);
    jpeg_start_compress(&info, TRUE);
    if (!opt.strip) {
        if (!meta.exif.empty() && meta.exif.size() <= kMaxMarkerPayload)
            jpeg_write_marker(&info, JPEG_APP0 + 1, meta.exif.data(), static_cast<unsigned int>(meta.exif.size()));
        if (!meta.icc.empty())
            jpeg_write_icc_profile(&info, meta.icc.data(), static_cast<unsigned int>(meta.icc.size()));
    }
    for (int32_t y = 0; y < im->height; ++y) {
        bgra_row(im, y, line.data(), false, &opt.background);
        for (int32_t x = 0; x < im->width; ++x)
            std::memcpy(&bgr[3 * static_cast<size_t>(x)], &line[4 * static_cast<size_t>(x)], 3);
        JSAMPROW p = bgr.data();
        jpeg_write_scanlines(&info, &p, 1);
    }
    jpeg_finish_compress(&info);
    jpeg_destroy_compress(&info);
    return true;
}

} // namespace pxio
