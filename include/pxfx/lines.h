/*
 * pxfx line detection on an 8-bit luma plane: straightening along a detected
 * boundary, band thresholding, line-band marking, and the rank, edge and
 * resampling helpers around them.
 *
 * Result delivery of MyEdge, MyFliter, MyFliter1 and RecognizeYUV: the result
 * is built in a new image of the input's size; with out null it is copied
 * into the input (PX_Img_Copy, which writes nothing into a record without
 * pixels); with *out null the new image is handed over (caller frees it);
 * otherwise it is copied into *out with PX_Img_Copy, converting and clamping
 * when the size or bit count differ and writing nothing into a record without
 * pixels. 1 in every case.
 * Interval lists are arrays of (start, end) pairs of int32_t, 2 values each.
 * Every image function here refuses (0, or null) a null image, any bit count
 * other than 8 (except RGB_Reverse), and a record whose rows overrun its block
 * (pitch below a row, block over 2^31 - 1 bytes). A record without pixels or
 * of an empty or negative size is refused only where the function would read
 * or write its pixels or cannot make its new image (malloc_Image makes none
 * of an empty size); each function below says what it does otherwise. All
 * fail with 0 (null) when memory runs out; working memory is released on
 * every path.
 */
#ifndef PXFX_LINES_H
#define PXFX_LINES_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Straightens the plane along its detected boundary and band-binarises it. 1 or 0.
 * A record without pixels is refused (0). Planes narrower than 121 or lower
 * than 13 pixels are refused (0): the boundary's mean level is taken over
 * columns 65 .. width - 56, none below 121 columns (a division by zero), and
 * below 13 rows the sample strips (rows 10 .. height - 3) walk no row, so
 * that mean would always read rows height .. height + 5. Rows that the
 * boundary refinement would read below the picture read as its last row; a
 * straightened column whose source row lies above the picture reads row 0. */
PXFX_API int32_t RecognizeYUV(Image *img, Image **out);
/* RecognizeYUV when img is not null. */
PXFX_API void ImgDecode(Image *img, Image **out);
/* Vertical linear resampling by factor (2..49), then RecognizeYUV on it; new image or null.
 * The last row, which lies exactly on the last source row, is a copy of it.
 * When RecognizeYUV refuses the resampled plane for its size it is returned
 * as it is; when RecognizeYUV runs out of memory the result is null. A plane
 * of one row gives a copy of it, and of a record without pixels a new plane
 * of one row of 255; a taller record without pixels gives null, as do empty
 * or negative sizes and a new height above 2^31 - 1. */
PXFX_API Image *MyResample2(Image *img, int32_t factor);
/* Band thresholding in bands of 37 rows, dot removal and line marking. 1 or 0.
 * With out not null the slot's image is released and replaced by a new plane
 * that receives the work (the input when that allocation fails); a slot that
 * already holds img works in place instead. The scratch memory of the line
 * marking is obtained first: when it cannot be had, 0 with nothing touched.
 * A plane of width 0 or less has nothing to work on: 1, the slot's image
 * released and *out null (no plane of that size can be made). Refused (0,
 * nothing touched): a record without pixels and with columns, a height of 0
 * or less (the line marking's scratch would have a negative size), and a
 * width below INT32_MIN + 10 (width - 10 overflows). */
PXFX_API int32_t BinImg(Image *img, Image **out);
/* Marks line bands of a binarised plane with band codes, in place. 1 or 0.
 * It marks columns 0 .. width - 11 of rows 0 .. height - 2: a plane of one
 * row or of width 10 or less (0 and negative included) has nothing to mark
 * and gives 1 untouched, with or without pixels. Refused (0): a wider and
 * taller record without pixels, a height of 0 or less (the scratch of
 * height - 1 words per list would have a negative size), and a width below
 * INT32_MIN + 10. Returns 0, leaving the plane unchanged, when its scratch
 * memory cannot be had. */
PXFX_API int32_t DetectLines(Image *img);
/* Otsu threshold 60..255 of a 256-bin histogram, 255 when the spread is small.
 * total 0 means the sum of the counts. The sum and the running count are
 * 32-bit values and level x count products are formed modulo 2^32, as plain
 * 32-bit arithmetic gives (this matters only past 2^31 samples, or past
 * 2^32 / 255 at one level); a mark the running count never reaches counts as
 * level 256. A null histogram, or a total (given or summed) of 0 or less,
 * gives 255. */
PXFX_API int32_t GetMaxHtoThrod2(const uint32_t hist[256], int32_t total);
/* Longest run of equal labels (with its deliberate quirks); first/last may be null.
 * The first label's value is the first run's start index; a value outside
 * 0..n-1 starts it at index 0. first/last are written only when both are
 * given. Null labels or n < 2 give 0. */
PXFX_API int32_t CheckMaxSame(const int32_t *labels, int32_t n, int32_t *first, int32_t *last);
/* Merges intervals closer than minGap and drops short ones in place; returns the count kept.
 * Lengths and gaps are exact for any values. Null list or n < 1 give 0. */
PXFX_API int32_t CombineMinSpace(int32_t *intervals, int32_t n, int32_t minGap);
/* Finds the interval of a sorted list overlapping [*start, *end]; 1 when it covers half.
 * An interval reaching past *end from at or before it is taken at once (1);
 * otherwise the one beyond *end with the largest overlap (the nearest, as the
 * overlaps there are negative) is reported, 1 when that overlap is at least
 * half the query. An interval starting at *end and ending by it stops the
 * walk. Overlaps and lengths are exact for any values. Null start or end: 0, nothing
 * written; a null list or n < 1: *start = *end = 0, result 0. */
PXFX_API int32_t CheckLapOver(const int32_t *intervals, int32_t n, int32_t *start, int32_t *end);
/* Vertical edge marker at distance 2 rows. 1 or 0. Pixels it does not visit
 * (first and last column, last two rows) are 255. A plane narrower or lower
 * than 3 pixels is not read: its result is all 255, with or without pixels;
 * a larger record without pixels is refused (0), as are empty and negative
 * sizes (no result image can be made). */
PXFX_API int32_t MyEdge(Image *img, Image **out);
/* Cross-shaped median (5 vertical, 15 horizontal) of rows 3 .. height - 4 and
 * columns 7 .. width - 9; other pixels of the result are 255. 1 or 0. A plane
 * narrower than 16 columns is not read: its result is all 255 (1), with or
 * without pixels and at any height. Wider ones fill their column histograms
 * from rows 0..4: lower than 5 rows, or without pixels, they are refused (0).
 * Empty and negative sizes are refused (no result image can be made). */
PXFX_API int32_t MyFliter(Image *img, Image **out);
/* 5 x 5 median of rows 3 .. height - 4 and columns 2 .. width - 5; other
 * pixels are 255. 1 or 0. A plane narrower than 7 columns is not read: its
 * result is all 255 (1), with or without pixels and at any height. Wider
 * ones fill their column histograms from rows 0..4: lower than 5 rows, or
 * without pixels, they are refused (0). Empty and negative sizes are refused
 * (no result image can be made). */
PXFX_API int32_t MyFliter1(Image *img, Image **out);
/* Swaps bytes 0 and 2 of every 24- or 32-bit pixel; other bit counts stay as
 * they are. 1, also for empty and negative sizes (nothing to swap); 0 for a
 * null image, a record without pixels, or one whose rows overrun its block. */
PXFX_API int32_t RGB_Reverse(Image *img);
/* Empty entry point kept for compatibility. */
PXFX_API void ImgLineDecode(void);
/* Empty entry point kept for compatibility. */
PXFX_API void CheckAvailableBlock(void);
/* Empty entry point kept for compatibility. */
PXFX_API void RebuildImg(void);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_LINES_H */
