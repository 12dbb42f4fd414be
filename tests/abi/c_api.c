/* The public interface used from plain C99. */
#include <pxfx/pxfx.h>

#include <stdio.h>

int main(void) {
    Image *src = malloc_Image(8, 6, 24);
    Image *dst = NULL;
    uint32_t ok;
    if (src == NULL) return 1;
    SetPixelColor(src, 3, 2, 0x00336699u);
    if (GetPixelColor(src, 3, 2) != 0xFF336699u) return 2;
    ok = PX_ProcessImage(src, &dst, 3);
    if (ok != 1 || dst == NULL || dst->width != 8 || dst->bitCount != 24) return 3;
    if (PX_ProcessImage(src, &dst, 4) != 0) return 4;
    if (xxgluSqrtFx(7) != 3 || tatan2(100, 100) != 45) return 5;
    free_Image(&dst, 0);
    free_Image(&src, 0);
    if (src != NULL) return 6;
    puts("c_api: ok");
    return 0;
}
