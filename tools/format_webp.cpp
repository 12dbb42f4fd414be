// WebP through libwebp: still pictures (the first frame of an animation) in,
// with their EXIF and ICCP chunks; lossy pictures out at a chosen quality,
// with the same chunks added through the muxer.
#include <webp/decode.h>
#include <webp/demux.h>
#include <webp/encode.h>
#include <webp/mux.h>

#include <cstring>

#include "picture_formats.hpp"

namespace pxio {

namespace {

struct Demuxer {
    WebPDemuxer *d;
    explicit Demuxer(const WebPData *data) : d(WebPDemux(data)) {}
    Demuxer(const Demuxer &) = delete;
    Demuxer &operator=(const Demuxer &) = delete;
    ~Demuxer() { WebPDemuxDelete(d); }
};

std::vector<uint8_t> chunk(WebPDemuxer *d, const char id[4]) {
    std::vector<uint8_t> bytes;
    WebPChunkIterator it;
    if (WebPDemuxGetChunk(d, id, 1, &it)) bytes.assign(it.chunk.bytes, it.chunk.bytes + it.chunk.size);
    WebPDemuxReleaseChunkIterator(&it);
    return bytes;
}

} // namespace

bool decode_webp(const uint8_t *data, size_t size, uint64_t maxPixels, Decoded *out, std::string *error) {
    const WebPData whole{data, size};
    Demuxer demux(&whole);
    if (demux.d == nullptr) {
        *error = "truncated or corrupt WebP file";
        return false;
    }
    WebPIterator frame;
    if (!WebPDemuxGetFrame(demux.d, 1, &frame)) {
        *error = "WebP file without a picture";
        return false;
    }
    const WebPData bits = frame.fragment;
    WebPDemuxReleaseIterator(&frame);
    WebPBitstreamFeatures features;
    if (WebPGetFeatures(bits.bytes, bits.size, &features) != VP8_STATUS_OK) {
        *error = "corrupt WebP picture data";
        return false;
    }
    if (!size_allowed(static_cast<uint64_t>(features.width), static_cast<uint64_t>(features.height), maxPixels, error))
        return false;
    const bool alpha = features.has_alpha != 0;
    ImagePtr im =
        new_picture(static_cast<uint32_t>(features.width), static_cast<uint32_t>(features.height), alpha, error);
    if (!im) return false;
    const size_t bytes = static_cast<size_t>(im->pitch) * static_cast<size_t>(im->height);
    const uint8_t *done = alpha
                              ? WebPDecodeBGRAInto(bits.bytes, bits.size, im->bits, bytes, static_cast<int>(im->pitch))
                              : WebPDecodeBGRInto(bits.bytes, bits.size, im->bits, bytes, static_cast<int>(im->pitch));
    if (done == nullptr) {
        *error = "truncated or corrupt WebP picture data";
        return false;
    }
    const std::vector<uint8_t> exif = chunk(demux.d, "EXIF");
    if (!exif.empty()) out->meta.exif = exif_from_tiff(exif.data(), exif.size());
    out->meta.icc = chunk(demux.d, "ICCP");
    out->image = std::move(im);
    return true;
}

bool encode_webp(FILE *f, const Image *im, const Metadata &meta, const WriteOptions &opt, std::string *error) {
    const bool alpha = im->bitCount == 32;
    const size_t stride = static_cast<size_t>(im->width) * (alpha ? 4 : 3);
    std::vector<uint8_t> pixels(stride * static_cast<size_t>(im->height)), line(static_cast<size_t>(im->width) * 4);
    for (int32_t y = 0; y < im->height; ++y) {
        bgra_row(im, y, line.data(), alpha, nullptr);
        uint8_t *row = pixels.data() + static_cast<size_t>(y) * stride;
        for (int32_t x = 0; x < im->width; ++x)
            std::memcpy(row + static_cast<size_t>(x) * (alpha ? 4 : 3), &line[4 * static_cast<size_t>(x)],
                        alpha ? 4 : 3);
    }
    uint8_t *encoded = nullptr;
    const float quality = static_cast<float>(opt.quality);
    const size_t n =
        alpha ? WebPEncodeBGRA(pixels.data(), im->width, im->height, static_cast<int>(stride), quality, &encoded)
              : WebPEncodeBGR(pixels.data(), im->width, im->height, static_cast<int>(stride), quality, &encoded);
    if (n == 0) {
        WebPFree(encoded);
        *error = "the WebP encoder failed (a side above 16383 pixels?)";
        return false;
    }
    WebPData result{encoded, n};
    WebPData assembled{nullptr, 0};
    const bool exif = !opt.strip && meta.exif.size() > kExifHeader, icc = !opt.strip && !meta.icc.empty();
    if (exif || icc) {
        WebPMux *mux = WebPMuxCreate(&result, 1);
        bool ok = mux != nullptr;
        if (ok && exif) {
            const WebPData chunkData{meta.exif.data() + kExifHeader, meta.exif.size() - kExifHeader};
            ok = WebPMuxSetChunk(mux, "EXIF", &chunkData, 1) == WEBP_MUX_OK;
        }
        if (ok && icc) {
            const WebPData chunkData{meta.icc.data(), meta.icc.size()};
            ok = WebPMuxSetChunk(mux, "ICCP", &chunkData, 1) == WEBP_MUX_OK;
        }
        ok = ok && WebPMuxAssemble(mux, &assembled) == WEBP_MUX_OK;
        WebPMuxDelete(mux);
        if (!ok) {
            WebPFree(encoded);
            WebPDataClear(&assembled);
            *error = "cannot add the metadata to the WebP file";
            return false;
        }
        result = assembled;
    }
    const bool written = std::fwrite(result.bytes, 1, result.size, f) == result.size;
    WebPFree(encoded);
    WebPDataClear(&assembled);
    if (!written) *error = "cannot write";
    return written;
}

} // namespace pxio
