/*
 * pxfx packed-image toolkit: the PXImage record with rows packed without
 * padding, its geometry, exposure and white balance, neighbourhood filters and
 * binarisation; and the curve-table colour filters on Image records with their
 * three exported tables.
 *
 * Every PXImage returned belongs to the caller and is released with
 * PXImage_Free. Inputs of functions returning a new record are not changed.
 */
#ifndef PXFX_TOOLKIT_H
#define PXFX_TOOLKIT_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Packed-row picture: width x height pixels of bitcount / 8 bytes, rows back to back. */
typedef struct PXImage {
    int32_t width;
    int32_t height;
    int32_t bitcount;
    uint8_t *data;
} PXImage;

/* Bottom-up rectangle: top is the larger row index (height = top - bottom). */
typedef struct PXRect {
    int32_t left;
    int32_t top;
    int32_t right;
    int32_t bottom;
} PXRect;

/* ---- Record and geometry ---------------------------------------------------------- */

/* Releases the data and the record; null is ignored. */
PXFX_API void PXImage_Free(PXImage *img);
/* Bilinear resize to newWidth x newHeight (8-bit stays 8, 16 and 24 give 24); null on failure. */
PXFX_API PXImage *PXImage_Resize(const PXImage *src, int32_t newWidth, int32_t newHeight);
/* Bilinear interpolation of one 8-bit plane (source coordinate i * dst / src). 1 or 0. */
PXFX_API int32_t DualLinearIntepol(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst,
                                   int32_t dstWidth, int32_t dstHeight);
/* The same interpolation with one scale for both axes (coordinate i / scale). 1 or 0. */
PXFX_API int32_t DualLinearIntepol_KWB(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst,
                                       int32_t dstWidth, int32_t dstHeight, float scale);
/* Copy of a bottom-up rectangle, width rounded up to 8 columns; null on failure. */
PXFX_API PXImage *PXImage_Crop(const PXImage *src, const PXRect *rect);
/* Quarter turn, result width rounded up to 8 columns; null on failure. */
PXFX_API PXImage *PXImage_Rotate90(const PXImage *src);
/* Half turn; null on failure. */
PXFX_API PXImage *PXImage_Rotate180(const PXImage *src);
/* Three-quarter turn, result width rounded up to 8 columns; null on failure. */
PXFX_API PXImage *PXImage_Rotate270(const PXImage *src);
/* 2x enlargement with rounded averages; null on failure. */
PXFX_API PXImage *PXImage_ZoomIn(const PXImage *src);
/* 2x reduction by decimation, width rounded up to 8 columns; null on failure. */
PXFX_API PXImage *PXImage_ZoomOut(const PXImage *src);
/* Scales a rectangle of a 32-bit image into another 32-bit image at (x, y). 1 or 0. */
PXFX_API int32_t PXImage_ROI_Zoom(const PXImage *src, PXImage *dst, const PXRect *rect, double scale, int32_t x,
                                  int32_t y);
/* 1 when two 8-, 24- or 32-bit images differ by at most half a level on average. */
PXFX_API int32_t PXImage_IsSameImage(const PXImage *a, const PXImage *b);
/* 1 when the point lies strictly inside the rectangle. */
PXFX_API int32_t px_PtInRect(const PXPoint *pt, const PXRect *rect);
/* Floor of the square root of n (0 <= n < 2^31). */
PXFX_API int32_t px_sqrt(int32_t n);
/* Stamping is not carried out; always 0. */
PXFX_API int32_t PXImage_Stamp(PXImage *img, const PXRect *rect, const PXPoint *pt);

/* ---- Exposure and white balance --------------------------------------------------- */

/* Percentile stretch with a 0.4 power curve, in place; 0 for bright or rejected images. */
PXFX_API int32_t PXImage_AutoExposure(PXImage *img);
/* As PXImage_AutoExposure with a fixed 0.4 power curve for 8-bit images. */
PXFX_API int32_t PXImage_AutoExposure_1(PXImage *img);
/* White balance against the colour around a picked point, in place. 1 or 0. */
PXFX_API int32_t PXImage_AutoWhiteBalance(PXImage *img, const PXPoint *pt);
/* Otsu threshold 0..254 of an 8-bit plane, or 120 for degenerate planes. */
PXFX_API int32_t ProbabilityDensityValue(const uint8_t *plane, int32_t width, int32_t height);
/* Inverts every byte of a 24-bit image (8 and 16 bits unchanged). 1 or 0. */
PXFX_API int32_t PXImage_BlueEnhancement(PXImage *img);
/* Copies byte 1 of every 24- or 32-bit pixel into bytes 0, 1 and 2. 1 or 0. */
PXFX_API int32_t PXImage_GreenChannel(PXImage *img);

/* ---- Neighbourhood filters and binarisation ---------------------------------------- */

/* Sharpens in place with a 3x3, 5x5 or 7x7 kernel chosen by strength (1..100). 1 or 0. */
PXFX_API int32_t PXImage_Sharpen(PXImage *img, int32_t strength);
/* Mean or median smoothing in place, chosen by strength. 1 or 0. */
PXFX_API int32_t PXImage_Smooth(PXImage *img, int32_t strength);
/* Sorts values[first..last] ascending in place (partition exchange). */
PXFX_API void px_ShellSort(int32_t *values, int32_t first, int32_t last);
/* 3x3 edge kernel, sum shifted right by 2, in place. 1 or 0. */
PXFX_API int32_t PXImage_EdgeDetection(PXImage *img);
/* Otsu binarisation in place. 1 or 0. */
PXFX_API int32_t PXImage_GrayToBinarization(PXImage *img);
/* New 24-bit copy of the frame with the photo shown through its dark window; null on failure. */
PXFX_API PXImage *PXImage_Effect_Clip(const PXImage *photo, const PXImage *frame);
/* Two-tone paint effect in place; always 0. */
PXFX_API int32_t PXImage_Effect_Paint(PXImage *img);
/* Contrast stretch of a gray plane in place; 1 if changed. */
PXFX_API int32_t EffectPaint_GrayRowData(uint8_t *plane, int32_t width, int32_t height);
/* Contrast stretch of a blue plane in place; 1 if changed. */
PXFX_API int32_t EffectPaint_BlueRowData(uint8_t *plane, int32_t width, int32_t height);

/* ---- Curve-table colour filters ------------------------------------------------------- */

/* Gentle lifting curve (not used by the filters below). */
PXFX_API extern const uint8_t ZANTOMOPI[256];
/* Darkening curve of ColorFilter_zanto; not monotone near its top end. */
PXFX_API extern const uint8_t ZANTOFILTERBK[256];
/* Brightening curve of ColorFilter_zanto; not monotone near its top end. */
PXFX_API extern const uint8_t ZANTOFILTER[256];

/* Shifts every sample of an 8-bit image by the luminance of a colour (R bits
 * 0-7, G 8-15, B 16-23): -44..+47, nothing for luminance 127 or 128. With a
 * mask only the top-left area common to both records is visited, and there
 * only samples whose mask byte is non-zero change. 1, or 0 when img is not an
 * 8-bit image with pixels or a mask is given that is not one either. */
PXFX_API int32_t ColorFilter(Image *img, uint32_t colour, const Image *mask);
/* Tints a 24-bit image 45/255 of the way toward a colour (R bits 0-7, G 8-15,
 * B 16-23), optionally masked as ColorFilter. 1, or 0 when img is not a 24-bit
 * image with pixels or a given mask is not an 8-bit image with pixels. */
PXFX_API int32_t ColorFilter24(Image *img, uint32_t colour, const Image *mask);
/* Circular-arc tone curve of an 8-bit image: level 129..255 brightens, 0..127
 * darkens (the mirrored curve). 1, or 0 for level 128, a level outside 0..255
 * or an image that is not 8-bit with pixels. */
PXFX_API int32_t ColorFilter1(Image *img, int32_t level);
/* Blend of identity and ZANTOFILTER (level 129..255) or ZANTOFILTERBK (level
 * 0..127) by |level - 128| / 127, rounded, on every sample of an 8-bit plane.
 * 1, or 0 for level 128, a level outside 0..255 or an image that is not 8-bit
 * with pixels. */
PXFX_API int32_t ColorFilter_zanto(Image *img, int32_t level);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_TOOLKIT_H */
