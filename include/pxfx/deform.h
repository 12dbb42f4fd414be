/*
 * pxfx geometric deformations: polar transforms around the image centre, a
 * concentric wave and a free-form warp driven by control-point pairs. All
 * follow the result-image rule described in effects.h.
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

/* Inverse polar mapping around the centre: mode 0 punch, 1 pinch, 2 swirl,
 * 3 cylinder, 4 or more bathroom glass; radius 0 means the half diagonal; a
 * factor of 0 means 1. Pixels outside the circle take source pixel (0, 0). 1 or 0. */
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

/* Concentric ripples of the given amplitude, fading to the farthest corner. 1 or 0. */
PXFX_API uint32_t Wave_Transform(Image *src, Image **dst, int32_t amplitude);
/* Fills a height map (rows of width rounded up to 4 entries) of integer wave
 * displacements around (cx, cy). Always 1. */
PXFX_API int32_t create_wave(int16_t *map, int32_t width, int32_t height, int32_t cx, int32_t cy, int32_t amplitude);
/* Moves each interior pixel by the neighbouring map values; cx and cy are unused. Always 1. */
PXFX_API int32_t render_wave(Image *src, Image *dst, const int16_t *map, int32_t cx, int32_t cy);

/* ---- Free-form warp --------------------------------------------------------------- */

/* Rigid moving-least-squares warp of src by `count` control pairs into *dst. 1 or 0. */
PXFX_API int32_t DeformationImage(Image *src, const DeformationPair *pairs, uint32_t count, Image **dst);
/* The warp itself, from src into dst of the same size and bit count, with hole filling. 1. */
PXFX_API int32_t DeformationFunc(Image *src, Image *dst, const DeformationPair *pairs, int32_t count);
/* Weighted centre (rounded) of `count` integer points (x, y pairs); (0, 0) when the weights vanish. */
PXFX_API PXPoint WeightedCentroid(const int32_t *points, const double *weights, int32_t count);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_DEFORM_H */
