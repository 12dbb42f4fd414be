/*
 * pxfx artistic effects.
 *
 * Result-image rule shared by every effect taking `Image **dst`: a null slot or
 * a source without pixels gives 0 and touches nothing; an image already in the
 * slot with the source's bit count, height and width is reused as it stands
 * (pixels an effect does not write keep their values); any other image there is
 * released and replaced by malloc_Image(width, height, bitCount) (filled with
 * 255). The caller owns the result. A null source gives 0 in every effect of
 * this library. Source and result must be different images.
 */
#ifndef PXFX_EFFECTS_H
#define PXFX_EFFECTS_H

#include "core.h"

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Dispatcher, neon and emboss ------------------------------------------------ */

/* Runs effect 0 neon, 1 emboss, 2 photocopy or 3 sketch; 0 for other numbers. */
PXFX_API uint32_t PX_ProcessImage(Image *src, Image **dst, uint32_t effect);
/* Doubled per-channel gradient magnitude; the last row and column are not written. 1 or 0. */
PXFX_API uint32_t PX_IMG_Neon(Image *src, Image **dst);
/* Gray relief from the diagonal difference at distance 2; border copies green. 1 or 0. */
PXFX_API uint32_t PX_IMG_Emboss(Image *src, Image **dst);

/* ---- Photocopy and sketch --------------------------------------------------------- */

/* Local-contrast thresholding to a photocopy look, with the source's alpha. The
 * work buffer is released (this implementation does not keep it). 1 or 0. */
PXFX_API uint32_t PX_IMG_Photocopy(Image *src, Image **dst);
/* Pencil sketch: colour dodge of gray with its blurred negative, darkened along
 * edges; alpha 0. 1 or 0 (a work-buffer failure leaves the prepared result). */
PXFX_API uint32_t PX_IMG_Sketch(Image *src, Image **dst);
/* Pencil sketch without the edge term; alpha 0. 1 or 0. */
PXFX_API uint32_t PX_IMG_Sketch_1(Image *src, Image **dst);
/* Kernel sum at (col, row) of a byte plane, the kernel read column by column;
 * column `width` is read (the next row's first byte), so the plane must be
 * followed by at least one readable byte. */
PXFX_API int32_t temp_ex(const uint8_t *plane, int32_t width, int32_t height, const int32_t *kernel, int32_t size,
                         int32_t row, int32_t col);

/* ---- Colour tones ---------------------------------------------------------------- */

/* 255 - channel. 1 or 0. */
PXFX_API uint32_t PX_IMG_Negative(Image *src, Image **dst);
/* Warmer: red up a quarter, green down by new red / 8, blue down a sixteenth. 1 or 0. */
PXFX_API uint32_t PX_IMG_WARM_YELLOW(Image *src, Image **dst);
/* Cooler: red down a quarter, green up by new red / 16, blue up a quarter. 1 or 0. */
PXFX_API uint32_t PX_IMG_COLD_PUPRLE(Image *src, Image **dst);
/* Old-photograph tone tables (red clamped, green and blue wrapped). 1 or 0. */
PXFX_API uint32_t PX_IMG_Classical_Photograph(Image *src, Image **dst);
/* Gray tinted toward blue (mean + 20, mean, mean - 20). 1 or 0. */
PXFX_API uint32_t PX_IMG_Repristination(Image *src, Image **dst);
/* Rows darkened by 128 except every third row (2, 5, 8, ...). 1 or 0. */
PXFX_API uint32_t PX_IMG_Line(Image *src, Image **dst);
/* Only prepares the result image by the result-image rule; non-zero on success. */
PXFX_API uint32_t my(Image *src, Image **dst);

/* ---- Light and soft glow ---------------------------------------------------------- */

/* Scales red (channel 0), green (1), blue (2) or all three (other) by percent. 1 or 0. */
PXFX_API uint32_t PX_IMG_Light_Alter(Image *src, Image **dst, uint32_t percent, uint32_t channel);
/* Contrast about mid-gray by a percent through a 256-entry table. 1 or 0. */
PXFX_API uint32_t PX_IMG_Ballance(Image *src, Image **dst, int32_t contrast);
/* Soft glow: blurred, halved, contrast-raised copy screen-blended over the source. 1 or 0. */
PXFX_API uint32_t PX_IMG_Lambency(Image *src, Image **dst);

/* ---- Textures --------------------------------------------------------------------- */

/* Square blocks of n pixels, each the colour of its centre. 1 or 0 (0 for n < 1). */
PXFX_API uint32_t PX_IMG_Mosaic(Image *src, Image **dst, int32_t n);
/* Random jitter of up to range pixels from PX_rand. 1 or 0. */
PXFX_API uint32_t PX_IMG_Aquarelle(Image *src, Image **dst, int32_t range);
/* Oil painting: mean colour of the dominant intensity class in a (2r+1)^2 window. 1 or 0. */
PXFX_API uint32_t imOil(Image *src, Image **dst, int32_t r);
/* Posterised oil look from quantised hue and lightness planes into a new image in
 * *dst (an image already there is not released: pass an empty slot). 1 or 0. */
PXFX_API uint32_t imOil_1(Image *src, Image **dst);
/* Quantises an 8-bit plane in place to the most frequent value of each of
 * `levels` groups. 1 or 0. */
PXFX_API int32_t ColorCompress(Image *plane, int32_t levels);

/* ---- Channel shift with curve tables -------------------------------------------- */

/* Shifts red, green, blue by dR, dG, dB and, in modes 1-5 and the default mode,
 * passes them through curves blended from ZANTOFILTER / ZANTOFILTERBK. 1 or 0. */
PXFX_API uint32_t PX_IMG_Alter(Image *src, Image **dst, int32_t dR, int32_t dG, int32_t dB, uint32_t mode);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_EFFECTS_H */
