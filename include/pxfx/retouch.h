/*
 * pxfx portrait retouching: skin mask and smoothing, tone curves and automatic
 * levels, brush tools (soft paste, clone, tint and smoothing brushes, blemish
 * removal) with caller-owned cache slots, Bezier helpers, eye and under-eye tools.
 *
 * Output slots: an image already in the slot with the source's width, height
 * and bit count is reused as it stands (one without pixels takes no writes);
 * any other is released and replaced by malloc_Image of the source's size,
 * which gives none for an empty size. The tools that prepare a slot this way
 * (the skin tools, auto levels, the threshold blur) read a source without a
 * pixel block as 0 everywhere, as the pixel readers do, and so write what an
 * all-zero source of its size gives; a source or slot image whose rows
 * overrun its block is refused (nothing touched). Cache slots of
 * the brushes keep a prepared whole-picture image between dabs; its `tag`
 * records the tint or strength it was made with. The caller owns every image
 * left in a slot and releases it with free_Image.
 *
 * Functions that name no bit count accept any: pixels are read and written as
 * GetPixelColor / SetPixelColor do (a bit count without a pixel layout reads as
 * gray 0 and is never written); result images of sources other than 16, 24 and
 * 32 bits are 8-bit (malloc_Image's rule).
 */
#ifndef PXFX_RETOUCH_H
#define PXFX_RETOUCH_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Tint levels of the tint brush, 128 meaning unchanged; packed as red in bits
 * 0-7, green 8-15, blue 16-23 where one value is needed (the cache tag). */
typedef struct PXTint {
    uint8_t red;
    uint8_t green;
    uint8_t blue;
} PXTint;

/* ---- Skin mask and skin smoothing -------------------------------------------------- */

/* New 8-bit skin mask (green of skin pixels, 0 elsewhere) into *mask. 1; 0 for a
 * null source, pixel block or slot (slot untouched), and when the mask cannot be
 * made (an empty size among them: the slot's old image is then already released). */
PXFX_API int32_t CreateFaceMaskImg(const Image *src, Image **mask);
/* The skin mask as a picture of the source's format in *dst; `unused` is ignored.
 * Always 1. The slot is prepared first; the mask is copied into it only when it can
 * be made, so a source without pixels (or a call short of memory for the mask)
 * leaves the prepared image as it was (white when new). Null arguments do nothing.
 * The temporary mask is released. */
PXFX_API int32_t SmileDetect(const Image *src, Image **dst, int32_t unused);
/* Brightens small dark spots on the skin into *dst. 1; 0 for a null source or slot,
 * when the result image cannot be made (an empty size), and on a failed allocation
 * of the spot map, the skin mask or their working rows (the slot then holds the
 * prepared result image, its pixels not written). A picture without skin, and a
 * source without pixels (no mask: it reads as 0), is copied. */
PXFX_API int32_t alg_Img_smooth_1(const Image *src, Image **dst);
/* alg_Img_smooth_1 followed by LightUP on the slot's image, also when the smoothing
 * failed for want of memory (the prepared, unwritten image is then lightened). A
 * null source or slot, or a source whose rows overrun its block, does nothing. */
PXFX_API void alg_Img_smooth(const Image *src, Image **dst);
/* Skin smoothing, LightUP once (twice when lighten is non-zero) and a tone curve on
 * the slot's image. Always 1: when alg_Img_smooth_1 fails for want of memory its
 * prepared, unwritten image is brightened and toned as it is; null arguments or a
 * source whose rows overrun its block do nothing. */
PXFX_API int32_t alg_Img_Skin(const Image *src, Image **dst, int32_t lighten);
/* Maps blue, green and red through ZANTOMOPI in place. 1 (also for a record without
 * pixels or of an empty size, which it leaves as it is); 0 for null, or a record whose
 * rows overrun its block. */
PXFX_API int32_t LightUP(Image *img);
/* Third-largest value of a size x size window (size up to 25) of an 8-bit image, in
 * place; windows of fewer than three values (size <= 1) give 0. 1 (an empty size
 * has nothing to filter); 0 for a null image or pixel block, another bit count, a
 * size above 25, rows that overrun the block, or failed working memory. */
PXFX_API int32_t Best_Color(Image *img, int32_t size);
/* Lifts dark specks of an 8-bit image by the window's largest value into *dst.
 * Sizes above 255 are refused (the slot is left alone), as are null arguments. A
 * source without pixels reads as 0 and is copied. A size <= 0 reads an empty
 * window: its list stays cleared, so only sizes 0 and -1 (size * size <= 1) lift.
 * The slot is prepared only after the lift map is computed: when its working memory
 * cannot be had, the slot is left as given. */
PXFX_API void MoreLight(const Image *src, int32_t size, Image **dst);
/* Sorts values[0..count-1] largest first (stable selection); returns values (null stays null). */
PXFX_API int32_t *Sort_largelow(int32_t *values, int32_t count);
/* First index i with values[i] <= value, or count (also for null values). */
PXFX_API int32_t getpos(const int32_t *values, int32_t count, int32_t value);

/* ---- Tone curves and automatic gradation ----------------------------------------------- */

/* 256-entry gamma table; a null table is ignored, a NaN gamma gives every entry 0. */
PXFX_API void BuildTable(uint8_t table[256], float gamma);
/* Turns a 256-bin histogram into a stretch mapping in place. An empty histogram has
 * both cuts at 0 (every entry 0); a null table is ignored. */
PXFX_API void MakeMapping(int32_t table[256], float lowFraction, float highThreshold);
/* Auto levels blended with a local screen by amount (0..100) into *dst; alpha is the
 * source's. Always 1: null arguments, a source whose rows overrun its block and a
 * failed allocation of the working memory (taken before the slot is touched) leave
 * the slot alone. A source without pixels reads as 0. */
PXFX_API int32_t ImageAutoGradationProcess(const Image *src, Image **dst, int32_t amount);
/* Auto levels of the darker half with an optional 5/6 gamma (identity when gammaFlag
 * is 0) into *dst; alpha is the source's. A source without pixels reads as 0; null
 * arguments do nothing. */
PXFX_API void ImageAutoGradationProcess1(const Image *src, Image **dst, int32_t unused, int32_t gammaFlag);
/* Adds delta to the HSL lightness into *dst (32-bit sources keep their alpha plane).
 * 1; 0 for a source without pixels, a null slot, or a failed split (an empty size
 * among them) or combine. An image in the slot receives the result through
 * PX_Img_Copy (one without pixels takes nothing). */
PXFX_API int32_t ImageExposure(const Image *src, Image **dst, int32_t delta);
/* 15 x 15 cross median of an 8-bit image into *dst, or in place when dst is null; the
 * result of an empty slot is 8-bit with an uncomputed border of 255. 1 or 0. */
PXFX_API int32_t MyOneKeyFliter(Image *src, Image **dst);
/* Blur of near-black values with a tone curve into *dst. A source without pixels reads
 * as 0. Null arguments do nothing; so does a call whose working rows cannot be had
 * (they are taken before the slot is prepared, which is then left as given). */
PXFX_API void thresholdBlur(int32_t unused1, int32_t unused2, int32_t size, int32_t amount, const Image *src,
                            Image **dst);

/* ---- Area copy, clone and blending --------------------------------------------------------- */

/* Soft round paste of src into dst at (cx, cy) with radius r. 0 for a null image or
 * r = 0, and for a destination whose rows overrun its block or a source claiming a
 * block over 2^31 - 1 bytes; else 1. The source is read in the destination's layout;
 * pixels it does not hold (rows past its height, columns past its pitch, all of them
 * without a pixel block) are left unchanged. A destination of an empty size, without
 * pixels or of a bit count other than 8, 24 or 32 is left unchanged with result 1. */
PXFX_API int32_t PointArea_Copy(Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r);
/* Lighten-only round paste with a rim darkened by level. Results and degenerate
 * images as PointArea_Copy. */
PXFX_API int32_t PointArea_Copy_Alph(Image *dst, const Image *src, int32_t cx, int32_t cy, int32_t r, int32_t level);
/* Clone brush: pastes a copy of the picture (or reference) shifted by (srcX - dstX,
 * srcY - dstY), cached in *cache. 1; 0 for a null picture, pixel block or cache slot,
 * a picture whose rows overrun its block, and when the copy cannot be made (an empty
 * size among them: the cache is then already released). A reference without pixels
 * is copied as zeros (PX_Img_Copy). */
PXFX_API int32_t PX_Mimic(Image *picture, int32_t srcX, int32_t srcY, const Image *reference, int32_t dstX,
                          int32_t dstY, int32_t cx, int32_t cy, int32_t r, int32_t reload, Image **cache);
/* Tint brush: pastes a tinted copy of the picture (cached in *cache when given). 1; 0
 * for a null picture or pixel block, another bit count than 24 or 32, rows that
 * overrun the block, and when the planes cannot be split (an empty size among them)
 * or combined: the slot is then empty. A cached image of the picture's size and tint
 * is used as it is, with or without pixels. */
PXFX_API int32_t alg_Blending(Image *picture, void *unused, int32_t cx, int32_t cy, PXTint tint, int32_t r,
                              Image **cache);
/* Whole-picture tint into *out, or in place when out is null. The tint is made, the
 * output slot prepared from the source (as the other output slots) whether or not
 * it could be, and the tint copied into it. 1; 0 when the tint cannot be made (a
 * picture alg_Blending refuses, or failed working memory: a prepared slot image is
 * then left unwritten) or the output image is missing. */
PXFX_API int32_t alg_Img_Blending(Image *src, Image **out);
/* Smoothing brush: pastes a box-smoothed copy (cached in *cache when given). 1; 0 for a
 * picture refused as by alg_Blending, or when the smoothed copy (none for an empty
 * size) or the smoothing's working memory cannot be had (a cache that did not match
 * is then released and the slot left empty). */
PXFX_API int32_t alg_smooth(Image *picture, int32_t unused, int32_t cx, int32_t cy, int32_t r, int32_t strength,
                            Image **cache);
/* Pulls a disc toward the mean colour of its surroundings; a rectangle with no pixel
 * outside the disc leaves the picture unchanged. */
PXFX_API void alg_Img_Eradicate(Image *picture, int32_t cx, int32_t cy, int32_t r);
/* Point of the cubic Bezier curve of four control points at t, written to *result (when
 * not null) and returned. Coordinates beyond 32 bits saturate, NaN gives 0; null controls
 * give (0, 0). */
PXFX_API PXPoint PointOnCubicBezier(PXPoint *result, const PXPoint controls[4], float t);
/* n points along the cubic Bezier curve (n = 1 gives the start point; n <= 0 or null
 * arrays: nothing). */
PXFX_API void ComputeBezier(const PXPoint controls[4], int32_t n, PXPoint *result);

/* ---- Eyes and under-eyes ----------------------------------------------------------------- */

/* Vertical stretch of an eye inside an ellipse of semi-axis a around (cx, cy), in place.
 * Centres and axes may lie outside the picture: reads are clamped to it and only its
 * own pixels are written. */
PXFX_API void alg_Img_EyesEnlarge_ellipse(Image *img, int32_t cx, int32_t cy, int32_t a);
/* Vertical stretch of an eye inside a circle of radius r, in place. */
PXFX_API void alg_Img_EyesEnlarge_circle(Image *img, int32_t cx, int32_t cy, int32_t r);
/* The ellipse variant (shape non-zero, a = size) or the circle variant (r = size). */
PXFX_API void alg_Img_EyesEnlarge(Image *img, int32_t cx, int32_t cy, int32_t size, int32_t shape);
/* Finds both eyes from the skin colour and enlarges them. 1 when the search ran, 0 for no
 * pixels or a failed allocation. All working memory is released; the hole fill uses
 * one stack bounded by the face band. */
PXFX_API int32_t EyesEnlarge(Image *img);
/* Contrast boost by a percent inside an eye ellipse, in place. */
PXFX_API void alg_Img_EyesMoreContrast_ellipse(Image *img, int32_t cx, int32_t cy, int32_t a, int32_t contrast);
/* Lightens the dark crescent under an eye centre by strength 0..10, in place; alpha is
 * kept. Only pixels inside the picture are visited. */
PXFX_API void alg_Img_quheiyanquan_ellipse(Image *img, int32_t cx, int32_t cy, int32_t strength);
/* Lightening brush with a cached lightened copy. 1; 0 for a picture refused as by
 * alg_Blending or a copy that cannot be made (none for an empty size; a cache that
 * did not match is then released). A cache of the picture's size and level is used
 * as it is, with or without pixels. */
PXFX_API int32_t alg_QuHeiYanQuan(Image *img, int32_t cx, int32_t cy, int32_t r, int32_t level, Image **cache,
                                  int32_t refresh);
/* Lightening brush applied at `count` centres. 1 or 0. */
PXFX_API int32_t alg_QuHeiYanQuan_1(Image *img, const int32_t *xs, const int32_t *ys, int32_t count, int32_t r,
                                    int32_t level);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_RETOUCH_H */
