// HEIF and HEIC (and AVIF in the same container) through libheif: the
// primary picture, turned and mirrored by the container's own transforms,
// with its EXIF block and colour profile. Not written.
#include <libheif/heif.h>

#include <cstring>

#include "picture_formats.hpp"

namespace pxio {

namespace {

struct Context {
    heif_context *ctx = heif_context_alloc();
    heif_image_handle *handle = nullptr;
    heif_image *image = nullptr;
    heif_decoding_options *options = nullptr;
    Context() = default;
    Context(const Context &) = delete;
    Context &operator=(const Context &) = delete;
    ~Context() {
        heif_decoding_options_free(options);
        heif_image_release(image);
        heif_image_handle_release(handle);
        heif_context_free(ctx);
    }
};

uint32_t be32(const uint8_t *p) {
    return static_cast<uint32_t>(p[0]) << 24 | static_cast<uint32_t>(p[1]) << 16 | static_cast<uint32_t>(p[2]) << 8 |
           p[3];
}

// The Exif item holds a 4-byte offset to the TIFF header, then the block.
std::vector<uint8_t> exif_of(heif_image_handle *h) {
    heif_item_id id;
    if (heif_image_handle_get_list_of_metadata_block_IDs(h, "Exif", &id, 1) < 1) return {};
    std::vector<uint8_t> item(heif_image_handle_get_metadata_size(h, id));
    if (item.size() < 4 || heif_image_handle_get_metadata(h, id, item.data()).code != heif_error_Ok) return {};
    const size_t skip = static_cast<size_t>(be32(item.data()));
    if (skip > item.size() - 4) return {};
    return exif_from_tiff(item.data() + 4 + skip, item.size() - 4 - skip);
}

std::vector<uint8_t> profile_of(heif_image_handle *h) {
    const heif_color_profile_type type = heif_image_handle_get_color_profile_type(h);
    if (type != heif_color_profile_type_prof && type != heif_color_profile_type_rICC) return {};
    std::vector<uint8_t> icc(heif_image_handle_get_raw_color_profile_size(h));
    if (icc.empty() || heif_image_handle_get_raw_color_profile(h, icc.data()).code != heif_error_Ok) return {};
    return icc;
}

} // namespace

bool decode_heif(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error) {
    Context c;
    if (c.ctx == nullptr) {
        *error = "out of memory";
        return false;
    }
    heif_error e = heif_context_read_from_memory_without_copy(c.ctx, data, size, nullptr);
    if (e.code == heif_error_Ok) e = heif_context_get_primary_image_handle(c.ctx, &c.handle);
    if (e.code != heif_error_Ok) {
        *error = std::string("corrupt HEIF file: ") + e.message;
        return false;
    }
    if (!size_allowed(static_cast<uint64_t>(heif_image_handle_get_width(c.handle)),
                      static_cast<uint64_t>(heif_image_handle_get_height(c.handle)), maxPixels, error))
        return false;
    const bool alpha = heif_image_handle_has_alpha_channel(c.handle) != 0;
    c.options = heif_decoding_options_alloc();
    e = heif_decode_image(c.handle, &c.image, heif_colorspace_RGB,
                          alpha ? heif_chroma_interleaved_RGBA : heif_chroma_interleaved_RGB, c.options);
    if (e.code != heif_error_Ok) {
        *error = std::string("cannot decode the HEIF picture: ") + e.message;
        return false;
    }
    int stride = 0;
    const uint8_t *plane = heif_image_get_plane_readonly(c.image, heif_channel_interleaved, &stride);
    const int w = heif_image_get_width(c.image, heif_channel_interleaved),
              h = heif_image_get_height(c.image, heif_channel_interleaved);
    if (plane == nullptr || w <= 0 || h <= 0 ||
        heif_image_get_bits_per_pixel_range(c.image, heif_channel_interleaved) != 8) {
        *error = "HEIF picture without 8-bit colour samples";
        return false;
    }
    ImagePtr im = new_picture(static_cast<uint32_t>(w), static_cast<uint32_t>(h), alpha, error);
    if (!im) return false;
    const size_t bpp = alpha ? 4 : 3;
    for (int y = 0; y < h; ++y) {
        const uint8_t *in = plane + static_cast<size_t>(y) * static_cast<size_t>(stride);
        uint8_t *row = im->bits + static_cast<size_t>(y) * im->pitch;
        for (int x = 0; x < w; ++x, in += bpp, row += bpp) {
            row[0] = in[2], row[1] = in[1], row[2] = in[0];
            if (alpha) row[3] = in[3];
        }
    }
    out->meta.exif = exif_of(c.handle);
    out->meta.icc = profile_of(c.handle);
    out->upright = true;
    out->image = std::move(im);
    return true;
}

} // namespace pxio
