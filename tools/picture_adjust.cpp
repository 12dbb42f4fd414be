// Colour profiles through Little CMS and EXIF orientation through libexif.
#include "picture_adjust.hpp"

#include <lcms2.h>
#include <libexif/exif-data.h>

#include <cstdlib>
#include <cstring>

namespace pxio {

namespace {

struct Profile {
    cmsHPROFILE h;
    explicit Profile(cmsHPROFILE p) : h(p) {}
    Profile(const Profile &) = delete;
    Profile &operator=(const Profile &) = delete;
    ~Profile() {
        if (h != nullptr) cmsCloseProfile(h);
    }
};

cmsHPROFILE open_profile(const std::vector<uint8_t> &icc) {
    if (icc.empty()) return nullptr;
    return cmsOpenProfileFromMem(icc.data(), static_cast<cmsUInt32Number>(icc.size()));
}

// Profiles that describe sRGB say so in their description; converting their
// pixels would only add rounding.
bool describes_srgb(cmsHPROFILE p) {
    char text[256] = {};
    cmsGetProfileInfoASCII(p, cmsInfoDescription, "en", "US", text, sizeof text);
    return std::strstr(text, "sRGB") != nullptr;
}

} // namespace

ProfileKind profile_kind(const std::vector<uint8_t> &icc) {
    Profile p(open_profile(icc));
    if (p.h == nullptr) return ProfileKind::None;
    if (cmsGetColorSpace(p.h) != cmsSigRgbData) return ProfileKind::Other;
    return describes_srgb(p.h) ? ProfileKind::Srgb : ProfileKind::Rgb;
}

bool convert_to_srgb(Image *im, const std::vector<uint8_t> &icc) {
    Profile in(open_profile(icc));
    if (in.h == nullptr || cmsGetColorSpace(in.h) != cmsSigRgbData) return false;
    Profile srgb(cmsCreate_sRGBProfile());
    const bool alpha = im->bitCount == 32;
    const cmsUInt32Number format = alpha ? TYPE_BGRA_8 : TYPE_BGR_8;
    cmsHTRANSFORM t =
        cmsCreateTransform(in.h, format, srgb.h, format, INTENT_PERCEPTUAL, alpha ? cmsFLAGS_COPY_ALPHA : 0);
    if (t == nullptr) return false;
    std::vector<uint8_t> line(im->pitch);
    for (int32_t y = 0; y < im->height; ++y) {
        uint8_t *row = im->bits + static_cast<size_t>(y) * im->pitch;
        cmsDoTransform(t, row, line.data(), static_cast<cmsUInt32Number>(im->width));
        std::memcpy(row, line.data(), static_cast<size_t>(im->width) * (alpha ? 4 : 3));
    }
    cmsDeleteTransform(t);
    return true;
}

CmykConverter::~CmykConverter() {
    if (transform_ != nullptr) cmsDeleteTransform(static_cast<cmsHTRANSFORM>(transform_));
}

void CmykConverter::prepare(const std::vector<uint8_t> &icc, bool inverted) {
    inverted_ = inverted;
    Profile in(open_profile(icc));
    if (in.h == nullptr || cmsGetColorSpace(in.h) != cmsSigCmykData) return;
    Profile srgb(cmsCreate_sRGBProfile());
    transform_ =
        cmsCreateTransform(in.h, inverted ? TYPE_CMYK_8_REV : TYPE_CMYK_8, srgb.h, TYPE_BGR_8, INTENT_PERCEPTUAL, 0);
}

void CmykConverter::convert(const uint8_t *cmyk, uint8_t *bgr, uint32_t width) const {
    if (transform_ != nullptr) {
        cmsDoTransform(static_cast<cmsHTRANSFORM>(transform_), cmyk, bgr, width);
        return;
    }
    for (uint32_t x = 0; x < width; ++x, cmyk += 4, bgr += 3) {
        // Light left by each ink: the stored value itself when inverted.
        const uint32_t flip = inverted_ ? 0 : 255;
        const uint32_t c = cmyk[0] ^ flip, m = cmyk[1] ^ flip, y = cmyk[2] ^ flip, k = cmyk[3] ^ flip;
        bgr[0] = static_cast<uint8_t>((y * k + 127) / 255);
        bgr[1] = static_cast<uint8_t>((m * k + 127) / 255);
        bgr[2] = static_cast<uint8_t>((c * k + 127) / 255);
    }
}

int take_orientation(std::vector<uint8_t> *exif) {
    if (exif->empty()) return 1;
    ExifData *ed = exif_data_new();
    if (ed == nullptr) return 1;
    // Read the block as it is: no entries added, none dropped.
    exif_data_unset_option(ed, EXIF_DATA_OPTION_FOLLOW_SPECIFICATION);
    exif_data_unset_option(ed, EXIF_DATA_OPTION_IGNORE_UNKNOWN_TAGS);
    exif_data_load_data(ed, exif->data(), static_cast<unsigned int>(exif->size()));
    int orientation = 1;
    ExifEntry *e = exif_content_get_entry(ed->ifd[EXIF_IFD_0], EXIF_TAG_ORIENTATION);
    if (e != nullptr && e->format == EXIF_FORMAT_SHORT && e->components >= 1 && e->data != nullptr) {
        const ExifByteOrder order = exif_data_get_byte_order(ed);
        const int v = exif_get_short(e->data, order);
        if (v >= 2 && v <= 8) {
            orientation = v;
            exif_set_short(e->data, order, 1);
            unsigned char *saved = nullptr;
            unsigned int size = 0;
            exif_data_save_data(ed, &saved, &size);
            if (saved != nullptr && size > kExifHeader)
                exif->assign(saved, saved + size);
            else
                exif->clear();
            std::free(saved);
        }
    }
    exif_data_unref(ed);
    return orientation;
}

ImagePtr orient(const Image *im, int orientation, std::string *error) {
    const int64_t w = im->width, h = im->height;
    const bool turned = orientation >= 5;
    ImagePtr out = new_picture(static_cast<uint32_t>(turned ? h : w), static_cast<uint32_t>(turned ? w : h),
                               im->bitCount == 32, error);
    if (!out) return out;
    const size_t bpp = im->bitCount / 8;
    for (int64_t y = 0; y < out->height; ++y) {
        uint8_t *row = out->bits + static_cast<size_t>(y) * out->pitch;
        for (int64_t x = 0; x < out->width; ++x) {
            int64_t sx = x, sy = y;
            switch (orientation) {
            case 2: sx = w - 1 - x; break;
            case 3: sx = w - 1 - x, sy = h - 1 - y; break;
            case 4: sy = h - 1 - y; break;
            case 5: sx = y, sy = x; break;
            case 6: sx = y, sy = h - 1 - x; break;
            case 7: sx = w - 1 - y, sy = h - 1 - x; break;
            case 8: sx = w - 1 - y, sy = x; break;
            default: break;
            }
            std::memcpy(row + static_cast<size_t>(x) * bpp,
                        im->bits + static_cast<size_t>(sy) * im->pitch + static_cast<size_t>(sx) * bpp, bpp);
        }
    }
    return out;
}

} // namespace pxio
