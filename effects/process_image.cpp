// The numbered effect dispatcher.
#include <pxfx/effects.h>

extern "C" uint32_t PX_ProcessImage(Image *src, Image **dst, uint32_t effect) {
    switch (effect) {
    case 0: return PX_IMG_Neon(src, dst);
    case 1: return PX_IMG_Emboss(src, dst);
    case 2: return PX_IMG_Photocopy(src, dst);
    case 3: return PX_IMG_Sketch(src, dst);
    default: return 0;
    }
}
