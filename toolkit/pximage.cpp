// The PXImage record's release, the similarity test and the small geometric
// helpers: point in rectangle, integer square root and the stamp stub.
#include <pxfx/toolkit.h>

#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

extern "C" {

void PXImage_Free(PXImage *img) {
    if (img == nullptr) return;
    PX_free(img->data);
    PX_free(img);
}

int32_t PXImage_IsSameImage(const PXImage *a, const PXImage *b) {
    if (a == nullptr || b == nullptr || a->width != b->width || a->height != b->height) return 0;
    if (a->data == nullptr || b->data == nullptr || a->bitcount != b->bitcount) return 0;
    if (a->bitcount != 8 && a->bitcount != 24 && a->bitcount != 32) return 0;
    // Both records have the same sizes and bit count, so checking one covers
    // both, and either both have views or neither.
    if (!px_rows_inside(a)) return 0;
    // Without pixel rows the sum is over no bytes: 0, and the result is 1
    // exactly when the byte count N (signed, from the sizes) is not negative.
    // A count beyond 32 bits is refused.
    const std::optional<View> va = view_of(a), vb = view_of(b);
    if (!va || !vb) {
        const int64_t count = block_size(a->width, a->height, px_bytes(a->bitcount));
        return count != kNoSize && count >= 0 ? 1 : 0;
    }
    const size_t n = va->block_bytes();
    const uint8_t *p = va->bits, *q = vb->bits;
    // The sum wraps modulo 2^32 by design; chunks keep the inner sum in 32
    // bits for vectorisation without changing the wrapped total.
    uint32_t sum = 0;
    for (size_t i = 0; i < n;) {
        const size_t end = n - i > 65536 ? i + 65536 : n;
        uint32_t part = 0;
        for (; i < end; ++i)
            part += static_cast<uint32_t>(p[i] > q[i] ? p[i] - q[i] : q[i] - p[i]);
        sum += part;
    }
    const auto excess = static_cast<int32_t>(2u * sum - static_cast<uint32_t>(n));
    return excess <= 0 ? 1 : 0;
}

int32_t px_PtInRect(const PXPoint *pt, const PXRect *rect) {
    if (rect == nullptr || pt == nullptr) return 0;
    return rect->left < pt->x && pt->x < rect->right && rect->bottom < pt->y && pt->y < rect->top ? 1 : 0;
}

int32_t px_sqrt(int32_t n) {
    int64_t root = 0, rem = n;
    for (int32_t k = 15; k >= 0; --k) {
        const int64_t trial = (2 * root + (int64_t{1} << k)) << k;
        if (rem >= trial) {
            rem -= trial;
            root += int64_t{1} << k;
        }
    }
    return static_cast<int32_t>(root);
}

// Stamping is not carried out: every call reports that nothing was done.
int32_t PXImage_Stamp(PXImage *, const PXRect *, const PXPoint *) { return 0; }

} // extern "C"
