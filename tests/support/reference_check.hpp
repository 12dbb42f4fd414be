// Straightforward accessor versions run beside the library on random
// pictures of every format and awkward size.
#pragma once

#include "support/test_images.hpp"

namespace pxtest {

// 130 x 5 takes rows past the 64-pixel blocks of the vector table lookups.
inline constexpr int32_t kAwkwardSizes[][2] = {{1, 1}, {1, 7},  {7, 1},   {2, 3},   {5, 5},
                                               {6, 4}, {13, 9}, {33, 17}, {64, 48}, {130, 5}};

// The picture that a per-pixel function makes of src, written pixel by pixel.
template <class Fn> Owned per_pixel(const Image *src, Fn fn) {
    Owned out = make(src->width, src->height, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < src->height; ++y)
        for (int32_t x = 0; x < src->width; ++x)
            SetPixelColor(out.get(), x, y, fn(GetPixelColor(src, x, y), x, y));
    return out;
}

// effect(src, slot) must return 1 and leave in the slot what reference(src) makes.
template <class Effect, class Reference> void expect_like_reference(Effect effect, Reference reference, uint32_t seed) {
    for (int32_t bc : kBitCounts)
        for (const auto &[w, h] : kAwkwardSizes) {
            Owned src = random_image(w, h, bc, seed++);
            Slot dst;
            ASSERT_EQ(effect(src.get(), &dst), 1u) << w << "x" << h << "@" << bc;
            EXPECT_EQ(diff(dst.get(), reference(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
}

// A point-wise effect must give, in every format, what its 32-bit pass gives
// for the colours that format reads.
template <class Effect> void expect_format_consistent(Effect effect, uint32_t seed) {
    expect_like_reference(
        effect,
        [&](const Image *src) {
            return per_pixel(src, [&](uint32_t c, int, int) {
                Owned one = filled(1, 1, 32, c);
                Slot out;
                effect(one.get(), &out);
                return GetPixelColor(out.get(), 0, 0);
            });
        },
        seed);
}

} // namespace pxtest
