/*
 * pxfx: bit-exact image effects, deformations, portrait retouching, colour
 * tools, a packed-image toolkit and line detection, behind a plain C interface.
 * Include this header for everything, or a subsystem header for one part.
 */
#ifndef PXFX_PXFX_H
#define PXFX_PXFX_H

#include "color.h"
#include "core.h"
#include "deform.h"
#include "effects.h"
#include "lines.h"
#include "retouch.h"
#include "toolkit.h"

#endif /* PXFX_PXFX_H */
