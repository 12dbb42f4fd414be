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

/*
 * A record's pixel block is width x height x bytes per pixel. A record with a
 * width or height of 0 or below has no pixel rows: loops over it do nothing,
 * and pixels a function would read from it anyway read as 0, as do those of a
 * record without data where a function below says it takes one. Block sizes
 * follow signed arithmetic: an empty size asks for no block (data null),
 * exactly one negative size for a negative count that no allocation can
 * give, two negative sizes for a positive count. Sizes and byte counts beyond
 * the signed 32-bit range are refused. Records with data and positive sizes
 * whose block exceeds 2^31 - 1 bytes claim memory they cannot have and get
 * the function's failure result.
 */

/* Releases the data and the record; null is ignored. */
PXFX_API void PXImage_Free(PXImage *img);
/* Bilinear resize to newWidth x newHeight (8-bit stays 8, 16 and 24 give 24); null on failure.
 * Sizes are mapped as in DualLinearIntepol. A 16-bit source is read as three-byte pixels; the
 * bytes that stride puts past the end of its block read as 0. A new size of 0, or exactly one
 * negative new size, gives a record of that size with data null. Two negative new sizes, or a
 * source without data or pixel rows, give a record whose block is cleared to 0. Null for a null
 * source, bit counts other than 8, 16 and 24, a block beyond 2^31 - 1 bytes, or when the result
 * or its working memory cannot be allocated. */
PXFX_API PXImage *PXImage_Resize(const PXImage *src, int32_t newWidth, int32_t newHeight);
/* Bilinear interpolation of one 8-bit plane (source coordinate i * dst / src). 1 or 0.
 * Single precision throughout. Float to integer conversions truncate and saturate (NaN gives 0,
 * values past the range give its limit), so no argument makes them undefined. 0 for null planes
 * or a size of 0. A negative destination width or height leaves nothing to compute: 1, dst
 * unchanged. Otherwise 0, dst unchanged, for a negative source width or height (its rows would
 * lie before the plane) and for planes above 2^31 - 1 bytes. */
PXFX_API int32_t DualLinearIntepol(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst,
                                   int32_t dstWidth, int32_t dstHeight);
/* The same interpolation with one scale for both axes (coordinate i / scale). 1 or 0.
 * Any scale is accepted (zero, negative or NaN scales give saturated or NaN coordinates, held
 * to the plane by the clamps). 0 also for dstWidth <= 0; otherwise sizes are treated as in
 * DualLinearIntepol (a negative dstHeight gives 1, dst unchanged). */
PXFX_API int32_t DualLinearIntepol_KWB(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst,
                                       int32_t dstWidth, int32_t dstHeight, float scale);
/* Copy of a bottom-up rectangle, width rounded up to 8 columns; null on failure.
 * Coordinates are held to 0 .. size - 1 (below 0 gives 0, the size or above gives size - 1,
 * also for sizes of 0 or below); the width is right - left + 1 rounded up to 8, at most the
 * source width and at least 0, the height top - bottom + 1. Each result row is a copy of width
 * pixels from the left column, running on into the next source row past the row end; bytes
 * from outside the source block (all of them for a source without data or pixel rows) are 0.
 * An empty width (right < left, or a source of width 0 or below) or a height of 0 or below
 * gives a record of those sizes with data null. Null for a null source or rectangle, bit
 * counts other than 8, 16 and 24, or when allocation fails. */
PXFX_API PXImage *PXImage_Crop(const PXImage *src, const PXRect *rect);
/* Quarter turn, result width rounded up to 8 columns; null on failure.
 * Result pixel (i, j) is source row j, column width - 1 - i; the padding columns (height and
 * beyond) are cleared to 0. 8, 16 and 24 bits only; null for a source without data.
 * The result is (height + 7) rounded down (toward minus infinity) to a multiple of 8 wide and
 * width high: when that asks for no block (a size of 0, or one negative) the result is null;
 * when both are negative it is a record of those sizes with a cleared block. */
PXFX_API PXImage *PXImage_Rotate90(const PXImage *src);
/* Half turn; null on failure. 8, 16 and 24 bits only; null for a source without data or of
 * an empty size, or exactly one negative size; both sizes negative give a record of those
 * sizes with a cleared block. */
PXFX_API PXImage *PXImage_Rotate180(const PXImage *src);
/* Three-quarter turn, result width rounded up to 8 columns; null on failure.
 * Result pixel (i, j) is source row height - 1 - j, column i; the padding columns are cleared
 * to 0. Sizes and degenerate sources as PXImage_Rotate90. */
PXFX_API PXImage *PXImage_Rotate270(const PXImage *src);
/* 2x enlargement with rounded averages; null on failure.
 * 24-bit images average each byte, 16-bit images whole little-endian samples. Null for a
 * source without data or of an empty size, or exactly one negative size; both sizes negative
 * give a record of twice those sizes with a cleared block. */
PXFX_API PXImage *PXImage_ZoomIn(const PXImage *src);
/* 2x reduction by decimation, width rounded up to 8 columns; null on failure.
 * Every result column x takes source column 2x held at the last column, the rounded-up ones
 * included. The result is (width / 2 + 7) rounded down (toward minus infinity) to a multiple
 * of 8 wide and height / 2 high (halves truncated). Null when that asks for no block: pictures
 * narrower or lower than 2 pixels, or exactly one negative result size. Both result sizes
 * negative give a record of those sizes with a cleared block, and so does a source without
 * data (its pixels read as 0). */
PXFX_API PXImage *PXImage_ZoomOut(const PXImage *src);
/* Scales a rectangle of a 32-bit image into another 32-bit image at (x, y). 1 or 0.
 * Byte plane by byte plane, source rows from (int)(y / scale + 0.5), column x, are gathered
 * w' = (int)(rect width / scale + 0.5) bytes a row into a plane read as source width x source
 * height and interpolated to the rectangle's size (conversions saturate, NaN gives 0).
 * Gathered positions outside the source block, and plane bytes the gather does not reach (all
 * of them when w' is below 1), read as 0; target rows run on into the next row past the row
 * end, and pixels past the target block are not written. A source without data or pixel rows
 * leaves nothing to interpolate: the rectangle is written with 0. A target without data or
 * pixel rows takes no writes (1). 0 for null records, x or y below 0, a rectangle width or
 * height of 0, bit counts other than 32, |scale| below 1e-13, a gather plane w' x h' or a
 * rectangle of 0 bytes or below (no block can be had) or beyond 2^31 - 1 bytes. A rectangle
 * with both sizes negative has nothing to write (1). dst is unchanged when the working memory
 * (the source's width x height bytes, 4 bytes per rectangle pixel, each at most 2^31 - 1
 * bytes) cannot be had. */
PXFX_API int32_t PXImage_ROI_Zoom(const PXImage *src, PXImage *dst, const PXRect *rect, double scale, int32_t x,
                                  int32_t y);
/* 1 when two 8-, 24- or 32-bit images differ by at most half a level on average.
 * The absolute differences are summed modulo 2^32. 16-bit images always give 0, as do null
 * records or data and differing sizes or bit counts. Images without pixel rows sum no bytes:
 * 1 when width x height x bytes per pixel is 0 or positive (both sizes negative), 0 when it is
 * negative or beyond 32 bits. */
PXFX_API int32_t PXImage_IsSameImage(const PXImage *a, const PXImage *b);
/* 1 when the point lies strictly inside the rectangle; 0 for null arguments and for empty
 * rectangles. */
PXFX_API int32_t px_PtInRect(const PXPoint *pt, const PXRect *rect);
/* Floor of the square root of n (0 <= n < 2^31); 0 for negative n. */
PXFX_API int32_t px_sqrt(int32_t n);
/* Stamping is not carried out; always 0. */
PXFX_API int32_t PXImage_Stamp(PXImage *img, const PXRect *rect, const PXPoint *pt);

/* ---- Exposure and white balance --------------------------------------------------- */

/* Percentile stretch with a 0.4 power curve, in place; 0 for bright or rejected images.
 * 0 for a null record or data. An image without pixel rows has empty histograms (low point 0):
 * 1, nothing changed.
 * 8-bit: 0 (unchanged) when the 0.5 % point is at 201 or above. 24-bit: such channels are left
 * alone, the others corrected, result 1. 16-bit: wrapping 16-bit counters, percentile levels
 * kept modulo 256, samples of 256 and above become 0; when the kept levels coincide the curve is
 * 0 at that level and 65535 elsewhere (infinite powers saturate). Other bit counts give 0. */
PXFX_API int32_t PXImage_AutoExposure(PXImage *img);
/* As PXImage_AutoExposure with a fixed 0.4 power curve for 8-bit images. */
PXFX_API int32_t PXImage_AutoExposure_1(PXImage *img);
/* White balance against the colour around a picked point, in place. 1 or 0.
 * 0 for a null record, point or data. An image without pixel rows gets no scratch plane for an
 * empty size or exactly one negative size (0); with both sizes negative nothing is mapped (1).
 * The 3 x 3 reference walk stops after three columns in each row, so points at or right of the
 * last column read that column repeatedly instead of never ending. 8-bit images take their
 * reference bytes at row * width + column * 3 + 1; such bytes beyond the block read as 0. No
 * working memory is kept for 8-bit images. 0 for a null point or bit counts other than 8, 24. */
PXFX_API int32_t PXImage_AutoWhiteBalance(PXImage *img, const PXPoint *pt);
/* Otsu threshold 0..254 of an 8-bit plane, or 120 for degenerate planes.
 * 120 also for a null plane or sizes that are not positive; scores that are not finite count
 * as saturated integers. */
PXFX_API int32_t ProbabilityDensityValue(const uint8_t *plane, int32_t width, int32_t height);
/* Inverts every byte of a 24-bit image (8 and 16 bits unchanged). 1 or 0.
 * 0 for a null record or data or other bit counts; images without pixel rows give 1 unchanged. */
PXFX_API int32_t PXImage_BlueEnhancement(PXImage *img);
/* Copies byte 1 of every 24- or 32-bit pixel into bytes 0, 1 and 2. 1 or 0.
 * Byte 3 of a 32-bit pixel keeps its value. An image without pixel rows gets no scratch copy
 * for an empty size or exactly one negative size (0); with both sizes negative nothing is
 * copied (1, unchanged). */
PXFX_API int32_t PXImage_GreenChannel(PXImage *img);

/* ---- Neighbourhood filters and binarisation ---------------------------------------- */

/*
 * The neighbourhood filters clamp rows and columns to the picture; 24-bit images clamp the byte
 * index 3 (x + dx) to the row and read three bytes from there, so right of the picture they read
 * the row's last byte and the next row's first two; on the last row those two read as 0.
 * Results are computed from the unchanged source and written in place. A null record or data
 * gives 0. For an image without pixel rows, bit counts the filter does not handle give 1; the
 * handled ones get no scratch image for an empty size or exactly one negative size (0), and
 * with both sizes negative nothing is computed (1, unchanged).
 */

/* Sharpens in place with a 3x3, 5x5 or 7x7 kernel chosen by strength (1..100). 1 or 0.
 * Below 40 (negative included): 3x3; 40..79: 5x5; 80..100: 7x7, whose rows start at source row
 * 49: result row r holds filtered source row r + 49 and the last 49 rows (all rows of pictures
 * up to 49 rows high) keep their content. Strengths above 100 return 1, image unchanged.
 * 16-bit images are filtered as whole samples clamped to 0..65535; other bit counts return 1
 * unchanged; 0 for strength 0 or when working memory is missing. */
PXFX_API int32_t PXImage_Sharpen(PXImage *img, int32_t strength);
/* Mean or median smoothing in place, chosen by strength. 1 or 0 (strength 0, missing
 * working memory); bit counts other than 8, 16 and 24 return 1 unchanged.
 * Below 20 (negative included): 3x3 mean; 20..39: 5x5 mean; 40..59: 7x7 mean; 60..79: 5x5
 * median; 80 and above: 7x7 median (element size^2 / 2 of the sorted window). */
PXFX_API int32_t PXImage_Smooth(PXImage *img, int32_t strength);
/* Sorts values[first..last] ascending in place (partition exchange).
 * The pivot is values[first]; the shorter side of each partition is sorted by recursion and the
 * longer one by iteration, so the stack depth stays logarithmic for any input. */
PXFX_API void px_ShellSort(int32_t *values, int32_t first, int32_t last);
/* 3x3 edge kernel, sum shifted right by 2, in place. 1 or 0.
 * Other bit counts than 8, 16 and 24 return 1 unchanged. */
PXFX_API int32_t PXImage_EdgeDetection(PXImage *img);
/* Otsu binarisation in place. 1 or 0 (null record or data, bit counts other than 8, 16, 24).
 * Without pixel rows: no grey plane for an empty size or exactly one negative size (0); both
 * sizes negative map nothing (1). */
PXFX_API int32_t PXImage_GrayToBinarization(PXImage *img);
/* New 24-bit copy of the frame with the photo shown through its dark window; null on failure.
 * The frame must be a 24-bit image of at least 718 x 564 pixels, else null. Window position
 * (r, c) takes photo pixel r * photo width + c (running on into the next photo row); positions
 * whose photo pixel lies past the photo's block keep the frame pixel, so a photo without data
 * or pixel rows gives a copy of the frame. */
PXFX_API PXImage *PXImage_Effect_Clip(const PXImage *photo, const PXImage *frame);
/* Two-tone paint effect in place; always 0.
 * Only the stretched byte-1 plane shapes the result, so only that plane is built; when it cannot
 * be allocated the image is left unchanged, as are images without data or pixel rows. */
PXFX_API int32_t PXImage_Effect_Paint(PXImage *img);
/* Contrast stretch of a gray plane in place; 1 if changed. 0 for sizes that are not positive. */
PXFX_API int32_t EffectPaint_GrayRowData(uint8_t *plane, int32_t width, int32_t height);
/* Contrast stretch of a blue plane in place; 1 if changed. 0 for sizes that are not positive. */
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
 * 8-bit image with a pixel block or a mask is given that is not an 8-bit
 * record. Images of an empty or negative size have nothing to shift (1); a
 * mask without a pixel block reads as 0 and one of an empty or negative size
 * leaves no area, so both select nothing (1, image unchanged). Records whose
 * rows overrun their block (pitch below a row, blocks over 2^31 - 1 bytes)
 * give 0. */
PXFX_API int32_t ColorFilter(Image *img, uint32_t colour, const Image *mask);
/* Tints a 24-bit image 45/255 of the way toward a colour (R bits 0-7, G 8-15,
 * B 16-23), optionally masked as ColorFilter. 1, or 0 when img is not a 24-bit
 * image with a pixel block or a given mask is not an 8-bit record; degenerate
 * images and masks as ColorFilter. */
PXFX_API int32_t ColorFilter24(Image *img, uint32_t colour, const Image *mask);
/* Circular-arc tone curve of an 8-bit image: level 129..255 brightens, 0..127
 * darkens (the mirrored curve). 1, or 0 for level 128, a level outside 0..255
 * or an image that is not 8-bit with a pixel block. Images of an empty or
 * negative size have nothing to map (1). */
PXFX_API int32_t ColorFilter1(Image *img, int32_t level);
/* Blend of identity and ZANTOFILTER (level 129..255) or ZANTOFILTERBK (level
 * 0..127) by |level - 128| / 127, rounded, on every sample of an 8-bit plane.
 * 1, or 0 for level 128, a level outside 0..255 or an image that is not 8-bit
 * with a pixel block. Images of an empty or negative size have nothing to
 * map (1). */
PXFX_API int32_t ColorFilter_zanto(Image *img, int32_t level);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_TOOLKIT_H */
