/*
 * pxfx geometric deformations: polar transforms around the image centre, a
 * concentric wave and a free-form warp driven by control-point pairs. All
 * follow the result-image rule described in effects.h.
 *
 * Common decisions:
 *  - A null source is refused (result 0, slot untouched).
 *  - Every conversion of a double to an integer truncates toward zero and, for
 *    values beyond the 32-bit range, saturates, with NaN giving 0 (as the ARM
 *    conversion instructions do); in-range values convert exactly.
 *  - Any bit count is accepted. A source of a bit count other than 16, 24 or
 *    32 gets an 8-bit result (malloc_Image's rule); its pixels are converted
 *    as GetPixelColor / SetPixelColor do (bit counts without a pixel layout
 *    read as gray 0 and are never written).
 *  - Platform dependence: the polar transforms use atan2, sin and cos and the
 *    free-form warp exp and log from the platform's libm; a libm whose results
 *    differ in the last bit can move a pixel. sqrt is exact everywhere, so the
 *    bathroom glass (mode 4 and up) and the whole wave, which is integer
 *    arithmetic only, are identical on every platform.
 */
#ifndef PXFX_DEFORM_H
#define PXFX_DEFORM_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* One control pair of the free-form warp: a source point and its target. */
typedef struct DeformationPair {
    double srcX;
    double srcY;
    double dstX;
    double dstY;
} DeformationPair;

/* ---- Polar transforms ------------------------------------------------------------ */

/* Inverse polar mapping around the centre (width / 2, height / 2): mode 0 punch,
 * 1 pinch, 2 swirl, 3 cylinder, 4 or more bathroom glass; radius 0 means the
 * half diagonal; a factor of 0 means 1. Inside the circle the punch, pinch and
 * swirl act on the picture mirrored left to right. Pixels outside the circle
 * take source pixel (0, 0). 1 or 0.
 * Negative modes behave as mode 0 (punch). A negative radius leaves every pixel
 * outside the circle. Squared distances are formed exactly in 64 bits before
 * their conversion to single precision (no wrap on very wide pictures). */
PXFX_API uint32_t CircleTransform(Image *src, Image **dst, int32_t mode, int32_t radius, float factor);
/* CircleTransform mode 0 (punch). */
PXFX_API uint32_t Punch_Transform(Image *src, Image **dst);
/* CircleTransform mode 1 (pinch). */
PXFX_API uint32_t Pinch_Transform(Image *src, Image **dst);
/* CircleTransform mode 2 (swirl, factor 100). */
PXFX_API uint32_t Swirl_Transform(Image *src, Image **dst);
/* CircleTransform mode 3 (cylinder). */
PXFX_API uint32_t Cylinder_Transform(Image *src, Image **dst);
/* CircleTransform mode 4 (bathroom glass ribs). */
PXFX_API uint32_t Bathroom_Transform(Image *src, Image **dst);

/* ---- Wave ------------------------------------------------------------------------- */

/* Concentric ripples of the given amplitude, fading to the farthest corner. 1 or 0:
 * 0 for a null slot, a source without a pixel block or whose rows overrun its
 * block, or a failed allocation of the map (2 bytes per entry, over 2^31 - 1
 * bytes counts as failed) or the result. The map, height x stride entries
 * with the stride width + 3 rounded down to a multiple of 4, is made before
 * the result rule: for a source of an empty size it has no size (0, slot
 * untouched) unless both sizes are negative; then the result rule alone
 * decides (1 with a matching record in the slot, nothing drawn).
 * Products of amplitude and distance wrap as create_wave describes (keep
 * amplitude x half diagonal below about 21474 for a clean wave). */
PXFX_API uint32_t Wave_Transform(Image *src, Image **dst, int32_t amplitude);
/* Fills a height map (height rows of width rounded up to 4 entries; only the
 * first width entries of a row are written) of integer wave displacements
 * around (cx, cy). Always 1; does nothing for a null map or a width or height
 * below 1. Entry = ((sin x 100000) x amplitude x (maxd - d)) / (maxd x 100000):
 * the product and the divisor are 32-bit values that wrap modulo 2^32, the
 * quotient truncates toward zero (a zero divisor, possible only with a centre
 * far outside the picture, gives 0) and the map keeps its low 16 bits.
 * Coordinate differences wrap modulo 2^32 as Distance2D's squares do. */
PXFX_API int32_t create_wave(int16_t *map, int32_t width, int32_t height, int32_t cx, int32_t cy, int32_t amplitude);
/* Moves each interior pixel by the mean of its neighbours' map values (left and
 * right for x, above and below for y); a displacement leaving the picture
 * leaves the pixel in place; the outer rows and columns are copied. cx and cy
 * are accepted and ignored. Always 1; writes nothing when the map is null, dst
 * lacks pixels, src's rows overrun its block, or their widths or heights
 * differ. A source without pixels reads as 0 (every pixel of dst becomes 0).
 * Records of different bit counts are converted as GetPixelColor /
 * SetPixelColor do. */
PXFX_API int32_t render_wave(Image *src, Image *dst, const int16_t *map, int32_t cx, int32_t cy);

/* ---- Free-form warp --------------------------------------------------------------- */

/* Rigid moving-least-squares warp of src by `count` control pairs into *dst. 1 or 0.
 * Refused with 0 and the slot untouched: a null source, pairs null while count
 * is non-zero (up to 2^31 - 1), a null slot, or a source without a pixel
 * block or whose rows overrun its block. A count above 2^31 - 1 reaches the
 * warp as a negative one: no pair. A source of an empty size needs a matching
 * record in the slot (no new result of its size can be made: 0); that record
 * gets DeformationFunc's black background over the block it claims. A reused
 * result without a pixel block is drawn into by nothing (1).
 * After the result rule, DeformationFunc's result is returned: on its failure
 * (working memory) the slot holds the result image unwarped. */
PXFX_API int32_t DeformationImage(Image *src, const DeformationPair *pairs, uint32_t count, Image **dst);
/* The warp itself, from src into dst of the same size, with hole filling. 1, or
 * 0 with dst untouched when either record is null, their sizes differ, pairs
 * is null with a positive count, dst has no pixel block, either record's rows
 * overrun its block, or the working memory (width x height bytes, plus 16 +
 * 8 x width bytes per used pair, each block at most 2^31 - 1 bytes) cannot be
 * had. A negative count uses no pair; a source without pixels reads as 0 (the
 * background is then black); an empty size maps nothing and only clears the
 * block dst claims to the black background. Bit counts may differ: colours are
 * then converted as GetPixelColor / SetPixelColor do.
 *  - A pair with any coordinate whose truncation falls outside the picture
 *    (NaN and infinities included) is skipped entirely: it marks, copies and
 *    weighs nothing. With no pair left (count 0 too) every pixel maps to (0, 0).
 *  - The background (every byte 255 if the green of source pixel (0, 0) is
 *    non-zero, else 0) is written over the whole pixel block, padding included.
 *  - Holes are filled within 5 pixels, interpolating in double precision; a
 *    filled pixel takes the alpha of the nearest known pixel it used: of the
 *    four-corner stage the corner on the nearer side horizontally and
 *    vertically, otherwise the nearer of the two; on a tie the left or upper. */
PXFX_API int32_t DeformationFunc(Image *src, Image *dst, const DeformationPair *pairs, int32_t count);
/* Weighted centre of `count` integer points (x, y pairs): trunc(sum w x / sum w
 * + 0.5) per axis in double precision, (0, 0) when the weight sum is below
 * 1e-6 and when either array is null or count is below 1. */
PXFX_API PXPoint WeightedCentroid(const int32_t *points, const double *weights, int32_t count);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_DEFORM_H */
