/*
 * pxfx line detection on an 8-bit luma plane: straightening along a detected
 * boundary, band thresholding, line-band marking, and the rank, edge and
 * resampling helpers around them.
 *
 * Result delivery of MyEdge, MyFliter, MyFliter1 and RecognizeYUV: with out
 * null the result replaces the input's pixels; with *out null the new image is
 * handed over (caller frees it); otherwise it is copied into *out.
 * Interval lists are arrays of (start, end) pairs of int32_t, 2 values each.
 */
#ifndef PXFX_LINES_H
#define PXFX_LINES_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* Straightens the plane along its detected boundary and band-binarises it. 1 or 0. */
PXFX_API int32_t RecognizeYUV(Image *img, Image **out);
/* RecognizeYUV when img is not null. */
PXFX_API void ImgDecode(Image *img, Image **out);
/* Vertical linear resampling by factor (2..49), then RecognizeYUV on it; new image or null. */
PXFX_API Image *MyResample2(Image *img, int32_t factor);
/* Band thresholding in bands of 37 rows, dot removal and line marking. 1 or 0. */
PXFX_API int32_t BinImg(Image *img, Image **out);
/* Marks line bands of a binarised plane with band codes, in place. 1 or 0. */
PXFX_API int32_t DetectLines(Image *img);
/* Otsu threshold 60..255 of a 256-bin histogram, 255 when the spread is small. */
PXFX_API int32_t GetMaxHtoThrod2(const uint32_t hist[256], int32_t total);
/* Longest run of equal labels (with its deliberate quirks); first/last may be null. */
PXFX_API int32_t CheckMaxSame(const int32_t *labels, int32_t n, int32_t *first, int32_t *last);
/* Merges intervals closer than minGap and drops short ones in place; returns the count kept. */
PXFX_API int32_t CombineMinSpace(int32_t *intervals, int32_t n, int32_t minGap);
/* Finds the interval of a sorted list overlapping [*start, *end]; 1 when it covers half. */
PXFX_API int32_t CheckLapOver(const int32_t *intervals, int32_t n, int32_t *start, int32_t *end);
/* Vertical edge marker at distance 2 rows. 1 or 0. */
PXFX_API int32_t MyEdge(Image *img, Image **out);
/* Cross-shaped median (5 vertical, 15 horizontal). 1 or 0. */
PXFX_API int32_t MyFliter(Image *img, Image **out);
/* 5 x 5 median. 1 or 0. */
PXFX_API int32_t MyFliter1(Image *img, Image **out);
/* Swaps bytes 0 and 2 of every 24- or 32-bit pixel. 1, or 0 for no pixels. */
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
