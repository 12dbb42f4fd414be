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
 *
 * Degenerate records: a reused image without pixels is drawn into by nothing
 * (1). A source of an empty size (with a pixel block) gets 0 when no result of
 * its size can be made; with a matching record in the slot, which is reused,
 * an effect returns what its steps give: 1 with nothing drawn, unless it says
 * otherwise below (a work buffer whose size comes out as 0 or less cannot be
 * had).
 *
 * Sources of any bit count are accepted unless an effect says otherwise: they
 * are read as GetPixelColor reads them (bit counts other than 1, 4, 8, 16, 24
 * and 32 read as opaque black), and a new result has the bit count that
 * malloc_Image gives for the source's (8 for 1, 4, 12, ...).
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
 * work buffer is released (this implementation does not keep it). 1 or 0; a
 * source of an empty size whose work buffer, 5 x stride x height + 8000 bytes
 * (the stride being the width rounded up to a multiple of 4), comes out as 0
 * or less (an INT_MIN width, say) gives 0 with the result released, as when
 * the buffer cannot be had. */
PXFX_API uint32_t PX_IMG_Photocopy(Image *src, Image **dst);
/* Pencil sketch: colour dodge of gray with its blurred negative, darkened along
 * edges; alpha 0. 1 or 0 (a work-buffer failure leaves the prepared result).
 * The work buffer is 4 x width x height bytes: a source of an empty size gives
 * 0 (the reused result kept), unless both sizes are negative (1). */
PXFX_API uint32_t PX_IMG_Sketch(Image *src, Image **dst);
/* Pencil sketch without the edge term; alpha 0. As PX_IMG_Sketch, with a work
 * buffer of 3 x width x height bytes. */
PXFX_API uint32_t PX_IMG_Sketch_1(Image *src, Image **dst);
/* Kernel sum at (col, row) of a byte plane, the kernel read column by column;
 * column `width` is read (the next row's first byte), so the plane must be
 * followed by at least one readable byte. */
PXFX_API int32_t temp_ex(const uint8_t *plane, int32_t width, int32_t height, const int32_t *kernel, int32_t size,
                         int32_t row, int32_t col);

/* ---- Colour tones ---------------------------------------------------------------- */

/* 255 - channel; alpha kept. 1 or 0. */
PXFX_API uint32_t PX_IMG_Negative(Image *src, Image **dst);
/* Warmer: red up a quarter, green down by new red / 8, blue down a sixteenth. 1 or 0. */
PXFX_API uint32_t PX_IMG_WARM_YELLOW(Image *src, Image **dst);
/* Cooler: red down a quarter, green up by new red / 16, blue up a quarter. 1 or 0. */
PXFX_API uint32_t PX_IMG_COLD_PUPRLE(Image *src, Image **dst);
/* Old-photograph tone tables: each channel plus its table entry, red clamped
 * to 255, green and blue modulo 256; alpha kept. 1 or 0. */
PXFX_API uint32_t PX_IMG_Classical_Photograph(Image *src, Image **dst);
/* Gray tinted toward blue (mean + 20, mean, mean - 20). 1 or 0. */
PXFX_API uint32_t PX_IMG_Repristination(Image *src, Image **dst);
/* Rows darkened by 128 except every third row (2, 5, 8, ...). 1 or 0. */
PXFX_API uint32_t PX_IMG_Line(Image *src, Image **dst);
/* Only prepares the result image by the result-image rule; 1 on success, 0 on
 * failure (null source or slot, no pixels, allocation failure). */
PXFX_API uint32_t my(Image *src, Image **dst);

/* ---- Light and soft glow ---------------------------------------------------------- */

/* Scales red (channel 0), green (1), blue (2) or all three (other) by percent:
 * (percent * v) / 100 capped at 255, the product formed exactly (no 32-bit
 * wrap for huge percentages). Percent 100 copies the source with PX_Img_Copy;
 * percent 0 clears every byte of the result (alpha and padding included).
 * Both work on whole blocks: a reused result of an empty size is copied into
 * or cleared over the block it claims (pitch x height bytes, none for a height
 * below 1). 1 or 0. */
PXFX_API uint32_t PX_IMG_Light_Alter(Image *src, Image **dst, uint32_t percent, uint32_t channel);
/* Contrast about mid-gray by a percent through a 256-entry table:
 * trunc((v - 128) * f + 128) clamped, f = (contrast + 100) / 100, all in
 * single precision (contrast + 100 formed without overflow): contrast 5 takes
 * 188 to 191, 228 to 233, 248 to 254. Contrast 0 copies the pixel block byte
 * for byte (only as many bytes as both blocks hold, blocks of records of an
 * empty size included: pitch x height bytes, none for a height below 1). 1 or
 * 0. */
PXFX_API uint32_t PX_IMG_Ballance(Image *src, Image **dst, int32_t contrast);
/* Soft glow: a 1-2-1 Gaussian blur of the source (Filter) taken to half
 * brightness and +5 % contrast as PX_IMG_Light_Alter and PX_IMG_Ballance
 * would, then screen-blended over the source; alpha is the source's. The
 * halving and contrast steps are applied in the same pass as the blend (with
 * the rounding of the intermediate format), so the only working image is the
 * blurred one, released on every path. The blur is made before the result
 * slot is touched: when its memory cannot be had, 0 with nothing changed (so
 * always for a source of an empty size). 1 or 0. */
PXFX_API uint32_t PX_IMG_Lambency(Image *src, Image **dst);

/* ---- Textures --------------------------------------------------------------------- */

/* Square blocks of n pixels, each the colour of its centre; partial blocks at
 * the right and bottom sample halfway between the nominal centre and the
 * edge. Any n >= 1 works (a block larger than the picture is one block). No
 * working buffer is made, but its size decides: after the result rule, 0 (the
 * prepared result kept) when n is 0 or the row of block colours,
 * (width + n - 1) / n entries, has none (a width of 0 or less). A negative n
 * leaves entries only for a picture one pixel wide: its pixel in row y takes
 * the colour at (n / 2, y0 + n / 2), clamped, y0 being y rounded down to a
 * multiple of -n. 1 or 0. */
PXFX_API uint32_t PX_IMG_Mosaic(Image *src, Image **dst, int32_t n);
/* Random jitter: pixel (x, y) takes the colour at (x + a, y + b), clamped to
 * the picture, with a = PX_rand(range) then b = PX_rand(range) drawn per pixel
 * in that order and a set to 0 when either is negative. Any range works (0 and
 * negative values included; offsets are added without overflow). 1 or 0. */
PXFX_API uint32_t PX_IMG_Aquarelle(Image *src, Image **dst, int32_t range);
/* Oil painting: mean colour of the dominant intensity class in a (2r+1)^2
 * window; pixels closer than r to an edge are copied. Interior pixels keep the
 * source pixel's alpha. r < 0 (no window to start from), 2r >= width or
 * 2r >= height (so any empty size) give 0 with the prepared (unwritten) result
 * left in the slot.
 * Needs 32 sums per column of working memory (r > 0); if that cannot be had,
 * 0 with the prepared result in the slot. 1 or 0. */
PXFX_API uint32_t imOil(Image *src, Image **dst, int32_t r);
/* Posterised oil look: HSL planes with hue in 3 and lightness in 12 groups
 * (ColorCompress), joined into a new 24-bit (32-bit with the source's alpha)
 * image in *dst. An image already there is not released: pass an empty slot.
 * 24- and 32-bit sources only; 0 for other sources, a null slot or a failed
 * split; 1 otherwise, with *dst null if the joined image could not be made.
 * The planes are released on every path. */
PXFX_API uint32_t imOil_1(Image *src, Image **dst);
/* Quantises an 8-bit plane in place: values fall in groups of ceil(256 / levels)
 * and each maps to its group's most frequent value (the lowest on a tie).
 * 1; 0 for a plane that is null, without a pixel block or not 8-bit, whose rows
 * overrun its block, and for levels < 1. A plane of an empty size has nothing to
 * quantise (1). */
PXFX_API int32_t ColorCompress(Image *plane, int32_t levels);

/* ---- Channel shift with curve tables -------------------------------------------- */

/* Shifts red, green, blue by dR, dG, dB and, in modes 1-5 and the default mode
 * (any mode above 5), passes them through curves blended from ZANTOFILTER /
 * ZANTOFILTERBK; alpha kept. Shifts are not clamped: beyond +-127 the curves
 * leave 0..255 and keep their low 8 bits, and sums and products wrap modulo
 * 2^32 as 32-bit arithmetic does (so INT_MAX added to a channel above 0 clamps
 * to 0). 1 or 0. */
PXFX_API uint32_t PX_IMG_Alter(Image *src, Image **dst, int32_t dR, int32_t dG, int32_t dB, uint32_t mode);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_EFFECTS_H */
