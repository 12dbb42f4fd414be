/*
 * pxfx colour spaces and generic filters: per-pixel conversions between RGB and
 * HSL, YUV, YIQ, XYZ; channel planes; hue/lightness/saturation shifts; the
 * kernel convolution filter with its fixed kernels; the fast box smoothing.
 *
 * Packed colours are B in bits 0-7, G 8-15, R 16-23, A 24-31 for RGB. The other
 * spaces keep their first component in bits 16-23, the second in 8-15 and the
 * third in 0-7; alpha passes through. Mode numbers: 1 HSL, 2 YUV, 3 YIQ, 4 XYZ,
 * anything else plain RGB. Pictures of any bit count are read as GetPixelColor
 * reads them (unknown bit counts read as opaque black) unless a function says
 * otherwise.
 */
#ifndef PXFX_COLOR_H
#define PXFX_COLOR_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Colour-space conversions ---------------------------------------------- */

/* RGB to HSL (hue 0-255 a full turn, achromatic hue 170), integer arithmetic. */
PXFX_API uint32_t RGBtoHSL(uint32_t colour);
/* HSL to RGB, integer arithmetic. */
PXFX_API uint32_t HSLtoRGB(uint32_t colour);
/* One channel of HSLtoRGB from the two levels and a hue; result modulo 65536. */
PXFX_API uint16_t HueToRGB(uint16_t lo, uint16_t hi, uint16_t hue);
/* RGB to YUV (U, V offset by 128), single precision, truncated and clamped. */
PXFX_API uint32_t RGBtoYUV(uint32_t colour);
/* YUV to RGB, single precision, truncated and clamped. */
PXFX_API uint32_t YUVtoRGB(uint32_t colour);
/* RGB to YIQ (I, Q offset by 128), single precision, truncated and clamped. */
PXFX_API uint32_t RGBtoYIQ(uint32_t colour);
/* YIQ to RGB, single precision, truncated and clamped. */
PXFX_API uint32_t YIQtoRGB(uint32_t colour);
/* RGB to XYZ (Z scaled by 0.9184837), single precision, truncated. */
PXFX_API uint32_t RGBtoXYZ(uint32_t colour);
/* XYZ to RGB; the Z term is finished in double precision. */
PXFX_API uint32_t XYZtoRGB(uint32_t colour);

/* ---- Channel planes -------------------------------------------------------- */

/* Splits src (any bit count the pixel readers handle) into three new 8-bit
 * planes of its size (first component, second, third) and, when alphaPlane is
 * not null, an alpha plane. Images already held in the slots are released;
 * the new planes belong to the caller. If the alpha plane cannot be made,
 * *alphaPlane is null and the call still succeeds. Returns 1, or 0 when src or
 * its pixel block is null or its rows overrun its block, when any of the three
 * plane slots is null (a partial set is refused, nothing is touched), when two
 * slots are the same pointer, or when a plane cannot be made (an empty size
 * among them: the three slots are then released and null).
 * A slot may hold src itself: the old images are released after the split,
 * an image held in two slots once. */
PXFX_API int32_t Split(const Image *src, Image **plane1, Image **plane2, Image **plane3, Image **alphaPlane,
                       int32_t mode);
/* Joins three planes (and an optional alpha plane) into a new image of
 * plane1's size: 32-bit with an alpha plane, else 24-bit. plane2 and plane3
 * must be at least as wide as plane1 and plane2 at least as high; a lower
 * plane3 and an alpha plane of any size are read with edge clamping. Planes
 * are read as GetPixelIndex does (a plane of more than 8 bits, or without a
 * pixel block, reads as 0). Returns null when one of the three planes is null,
 * a plane's rows overrun its block, on the size rules above, for an empty
 * plane1, or when memory runs out. Caller owns the result. */
PXFX_API Image *Combine(const Image *plane1, const Image *plane2, const Image *plane3, const Image *alphaPlane,
                        int32_t mode);

/* ---- Hue, lightness and saturation ---------------------------------------- */

/* Shifts every value of an 8-bit hue plane by (amount * 255 - 25500) / 100
 * (amount 100: none, 0: -255, 200: +255), wrapping by 255 past either end.
 * The step is computed exactly for any amount. 1 (a plane of an empty size has
 * nothing to shift), or 0 when plane or its pixel block is null, its rows
 * overrun its block, or it is not 8-bit. */
PXFX_API int32_t BaseTran_Hue(Image *plane, int32_t amount);
/* Shifts an 8-bit saturation or lightness plane by the same step, clamped to
 * 0..255. 1 or 0 as BaseTran_Hue. */
PXFX_API int32_t BaseTran_LS(Image *plane, int32_t amount);
/* Shifts hue (component 0), saturation (1) or lightness (2) of a picture by a
 * slider amount (100 = unchanged; other components change nothing) through
 * HSL, into *out: a 32-bit picture with the source's alpha. An image already
 * in *out receives it through PX_Img_Copy (keeping its size and bit count);
 * with *out null a 32-bit source gets the 32-bit picture itself and other
 * sources a new image of their own bit count (a record in *out without pixels
 * takes nothing). Returns 1, or 0 when src or out is null, src has no pixels
 * (an empty size among them), or memory runs out (*out is then unchanged). */
PXFX_API int32_t PX_IMG_Transform(const Image *src, Image **out, int32_t amount, int32_t component);

/* ---- Kernel convolution ------------------------------------------------------ */

/* Normalised Gaussian kernels: row r - 1 holds radius r (taps 0..2r, sigma
 * r / 3, each row summing to 1), zero-padded. Not read by Filter. */
PXFX_API extern const float matrixX[10][21];

/* Convolves src with a size x size kernel (row-major; weight of the source
 * pixel at (x + dx, y + dy) at [(dy + size/2) * size + dx + size/2]), sums in
 * 32-bit integers (wrapping), divides by divisor (none for 0), adds offset and
 * clamps to 0..255. Source reads repeat the edge pixels.
 *  - Writes into dst (any size: its width x height is processed), or with dst
 *    null into a working image that is then copied back into src and released
 *    whole (record and pixels). A dst whose pixels overlap src's is filtered
 *    from a snapshot of src, as if it were a separate image. A src of an empty
 *    size (with a pixel block) reads as 0 everywhere: a given dst then gets
 *    the clamped offset (alpha 0 at 32 bits).
 *  - An 8-bit mask limits the processed area to its width x height, also
 *    without pixels or of an empty size (then nothing is processed: a given
 *    dst is unchanged, in place src takes the white working image). For an
 *    8-bit result every mask selects: where its byte y * pitch + x (past a
 *    row's end, the next row's) is 0 the source index is copied; bytes beyond
 *    the block it claims, and all of a mask without pixels, count as set. A
 *    mask whose rows overrun its block is ignored.
 *  - 8-bit results read the source as GetPixelIndex does, 24- and 32-bit ones
 *    as GetPixelColor does; gray >= 1 writes (B + 2G + R) >> 2 to all three
 *    channels. A 32-bit result takes the alpha of the bottom-right tap's pixel
 *    (x + size - size/2 - 1, y + size - size/2 - 1, clamped), or keeps its own
 *    alpha when size <= 0 (no taps: every channel is the clamped offset).
 *  - Other result bit counts are not written (in place, a 16-bit src thus
 *    turns white).
 * Returns 1, or 0 when src or its pixel block is null, src's or a given dst's
 * rows overrun their block, src has an empty size with dst null (no working
 * image of that size), memory runs out, or taps are to be read (a non-empty
 * area of an 8-, 24- or 32-bit result) while the kernel is null with
 * size > 0 or size * size exceeds 2^31 - 1. A given dst without a pixel block
 * or of an empty size takes nothing (1). */
PXFX_API int32_t Filter(Image *src, const int32_t *kernel, int32_t size, int32_t divisor, int32_t offset,
                        const Image *mask, Image *dst, int32_t gray);
/* 3 x 3 mean into *out (reused when its width, height and bit count match,
 * else replaced). Result of Filter, or 0 for a null src or out, a src without
 * a pixel block, or when no result of src's size can be made (an empty size
 * with no matching record in *out); a reused record of an empty size or
 * without pixels takes nothing (1). When Filter's working memory cannot be
 * had, 0 with the prepared result left in *out. The three below follow the
 * same rules. */
PXFX_API int32_t PX_IMG_Blur(const Image *src, Image **out);
/* 3 x 3 soften (centre weight 8, divisor 16) into *out. */
PXFX_API int32_t PX_IMG_Soften(const Image *src, Image **out);
/* 3 x 3 sharpen (centre 15, others -1, divisor 7) into *out. */
PXFX_API int32_t PX_IMG_Sharpen(const Image *src, Image **out);
/* Gray diagonal relief 127 + (pixel (x-1, y+1) - pixel (x+1, y-1)) into *out. */
PXFX_API int32_t PX_IMG_Emboss1(const Image *src, Image **out);

/* ---- Fast box smoothing ------------------------------------------------------- */

/* In-place box mean: every channel of pixel (x, y) becomes the mean (sum
 * divided by size * size, truncated) of the size x size box from
 * (x - size/2, y - size/2), edges repeated, plus offset, clamped to 0..255.
 * 8-, 24- and 32-bit images; the alpha of 32-bit images is smoothed and offset
 * too. The result is that of a new white working image copied back with
 * PX_Img_Copy: an image with malloc_Image's pitch takes the whole block, so its
 * row padding becomes 255; one with another pitch takes the pixels only, and a
 * 32-bit one then keeps its own alpha. Other bit counts of 8 or more are not
 * smoothed and the call returns 1: a 16-bit image receives the untouched white
 * working image (pixels only for another pitch); one of a bit count without a
 * pixel layout (12, 48, ...) takes the converting copy, which writes nothing.
 * A negative size makes every box empty: each channel becomes the offset,
 * clamped. Sums are exact at every size (no 32-bit wrap). Images with malloc_Image's pitch are smoothed in place,
 * keeping only the source rows still needed (size / 2 + 2 rows); when that
 * memory cannot be had a whole working image is used instead.
 * Returns 1 when processed, 0 (image unchanged) when the image is null, has
 * no pixels (an empty size among them) or fewer than 8 bits, size is 0 or
 * beyond +-2^20, or no working memory can be had. */
PXFX_API int32_t Filter_fast(Image *image, int32_t size, int32_t offset);
/* Box smoothing by a strength: size min(strength, 100) / 10, nothing for a
 * strength of 3 or less (a plain copy). With out null src itself is smoothed;
 * else src is copied into *out (created when null; an existing image is used
 * whatever its size and bit count, one without pixels taking nothing) and *out
 * smoothed (a picture Filter_fast refuses, such as one of fewer than 8 bits or
 * of an empty size, is left as it is: a src of an empty size smoothed in place
 * gives 1). Returns 1, or 0 when src or its pixel block is null, its rows
 * overrun its block, or *out cannot be made (an empty size among them); also 0
 * when the smoothing's working
 * image cannot be made: src is then unchanged, an *out made by the call
 * released (null), an existing *out left holding the plain copy. */
PXFX_API int32_t PX_IMG_Smooth(const Image *src, Image **out, int32_t strength);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_COLOR_H */
