// What is done to a decoded picture before use: colour management through
// Little CMS (embedded RGB profiles and CMYK pixels to sRGB) and the EXIF
// orientation applied.
#pragma once

#include <pxfx/core.h>

#include <cstdint>
#include <string>
#include <vector>

#include "picture_formats.hpp"

namespace pxio {

// The kind of colour profile `icc` is, read from its header.
enum class ProfileKind { None, Srgb, Rgb, Other };
ProfileKind profile_kind(const std::vector<uint8_t> &icc);

// Converts a 24- or 32-bit picture from the RGB profile `icc` to sRGB in
// place (alpha kept). False, and the picture unchanged, when no transform
// can be made from the profile.
bool convert_to_srgb(Image *im, const std::vector<uint8_t> &icc);

// CMYK rows to blue-green-red: through the picture's CMYK profile when it has
// one, otherwise by the complement formula R = (255 - C)(255 - K) / 255.
class CmykConverter {
  public:
    CmykConverter() = default;
    CmykConverter(const CmykConverter &) = delete;
    CmykConverter &operator=(const CmykConverter &) = delete;
    ~CmykConverter();
    // `inverted`: the file stores 255 - ink, as Adobe's writers do.
    void prepare(const std::vector<uint8_t> &icc, bool inverted);
    void convert(const uint8_t *cmyk, uint8_t *bgr, uint32_t width) const;

  private:
    void *transform_ = nullptr;
    bool inverted_ = false;
};

// The EXIF orientation of `exif` (1..8; 1 when there is none), which is reset
// to 1 in the block.
int take_orientation(std::vector<uint8_t> *exif);

// A new picture: `im` turned and mirrored so that a picture stored with EXIF
// orientation `orientation` stands upright. Null with a message on failure.
ImagePtr orient(const Image *im, int orientation, std::string *error);

} // namespace pxio
