// Neon, emboss and the dispatcher, checked against straightforward accessor
// versions on random pictures of every format, plus the result-image rule.
#include <gtest/gtest.h>

#include <cstdlib>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

int ch(uint32_t c, int shift) { return static_cast<int>((c >> shift) & 255); }

Owned reference_neon(const Image *src) {
    Owned out = make(src->width, src->height, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < src->height - 1; ++y)
        for (int32_t x = 0; x < src->width - 1; ++x) {
            const uint32_t c = GetPixelColor(src, x, y), r = GetPixelColor(src, x + 1, y),
                           d = GetPixelColor(src, x, y + 1);
            uint32_t o = c & 0xFF000000u;
            for (int s : {0, 8, 16}) {
                const int dx = ch(c, s) - ch(r, s), dy = ch(c, s) - ch(d, s);
                o |= uint32_t(ltouc(int32_t(2 * xxgluSqrtFx(uint32_t(dx * dx + dy * dy))))) << s;
            }
            SetPixelColor(out.get(), x, y, o);
        }
    return out;
}

Owned reference_emboss(const Image *src) {
    const int32_t w = src->width, h = src->height;
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            uint32_t v;
            if (x < 2 || y < 2 || x == w - 2 || y == h - 2) {
                v = uint32_t(ch(GetPixelColor(src, x, y), 8));
            } else {
                const uint32_t a = GetPixelColor(src, x - 2, y - 2), b = GetPixelColor(src, x + 2, y + 2);
                const int d3[3] = {ch(a, 0) - ch(b, 0), ch(a, 16) - ch(b, 16), ch(a, 8) - ch(b, 8)};
                int hi = d3[0], lo = d3[0];
                for (int d : d3)
                    hi = std::max(hi, d), lo = std::min(lo, d);
                const int e = 2 * (std::abs(lo) < std::abs(hi) ? hi : lo);
                v = e > 128 ? 255 : (e <= -128 ? 0 : uint32_t(e + 127));
            }
            SetPixelColor(out.get(), x, y, 0xFF000000u | v << 16 | v << 8 | v);
        }
    return out;
}

const int32_t kSizes[][2] = {{1, 1}, {1, 6}, {6, 1}, {2, 2}, {3, 3}, {4, 5}, {5, 4}, {13, 7}, {37, 23}};

} // namespace

TEST(Neon, MatchesAccessorVersionOnEveryFormat) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes) {
            Owned src = random_image(w, h, bc, seed++);
            Slot dst;
            ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
            EXPECT_EQ(diff(dst.get(), reference_neon(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
}

TEST(Emboss, MatchesAccessorVersionOnEveryFormat) {
    uint32_t seed = 100;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes) {
            Owned src = random_image(w, h, bc, seed++);
            Slot dst;
            ASSERT_EQ(PX_IMG_Emboss(src.get(), &dst), 1u);
            EXPECT_EQ(diff(dst.get(), reference_emboss(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
}

TEST(Emboss, FlatPictureAndSaturation) {
    Owned flat = filled(8, 8, 24, 0x00405060);
    Slot dst;
    ASSERT_EQ(PX_IMG_Emboss(flat.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 4, 4), 0xFF7F7F7Fu); // interior: 127
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 4), 0xFF505050u); // border: green
    EXPECT_EQ(GetPixelColor(dst.get(), 6, 4), 0xFF505050u); // x = width - 2
    EXPECT_EQ(GetPixelColor(dst.get(), 7, 4), 0xFF7F7F7Fu); // x = width - 1 is not border

    Owned step = filled(8, 8, 24, 0x00404040);
    SetPixelColor(step.get(), 2, 2, 0x00808080); // a - b = +64 at (4, 4)
    SetPixelColor(step.get(), 3, 3, 0x00000000); // a - b = -64 at (5, 5)
    ASSERT_EQ(PX_IMG_Emboss(step.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 4, 4) & 255, 255u);
    EXPECT_EQ(GetPixelColor(dst.get(), 5, 5) & 255, 0u);
}

TEST(ResultRule, ReuseReplaceAndRefuse) {
    Owned src = random_image(6, 4, 32, 9);
    Slot dst;
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    // Neon never writes the last row and column: a new result keeps them white.
    EXPECT_EQ(GetPixelColor(dst.get(), 5, 2), 0xFFFFFFFFu);
    EXPECT_EQ(GetPixelColor(dst.get(), 2, 3), 0xFFFFFFFFu);
    // A fitting result is reused as it stands.
    Image *first = dst.get();
    SetPixelColor(first, 5, 3, 0x01020304);
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    EXPECT_EQ(dst.get(), first);
    EXPECT_EQ(GetPixelColor(dst.get(), 5, 3), 0x01020304u);
    // Any other size or bit count is replaced.
    Slot other;
    other.image = malloc_Image(6, 4, 24);
    ASSERT_EQ(PX_IMG_Emboss(src.get(), &other), 1u);
    EXPECT_EQ(other->bitCount, 32u);
    // Refusals touch nothing.
    EXPECT_EQ(PX_IMG_Neon(src.get(), nullptr), 0u);
    EXPECT_EQ(PX_IMG_Neon(nullptr, &dst), 0u);
    EXPECT_EQ(PX_IMG_Emboss(nullptr, &dst), 0u);
    EXPECT_EQ(dst.get(), first);
    Image hollow = *src;
    hollow.bits = nullptr;
    EXPECT_EQ(PX_IMG_Neon(&hollow, &dst), 0u);
    EXPECT_EQ(dst.get(), first);
    // A slot image without pixels is replaced rather than written through.
    free_Image(&dst.image, 1);
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    EXPECT_NE(dst->bits, nullptr);
}

TEST(Dispatcher, NumbersSelectTheFourEffects) {
    Owned src = random_image(9, 7, 24, 12);
    uint32_t (*direct[4])(Image *, Image **) = {PX_IMG_Neon, PX_IMG_Emboss, PX_IMG_Photocopy, PX_IMG_Sketch};
    for (uint32_t e = 0; e < 4; ++e) {
        Slot a, b;
        ASSERT_EQ(PX_ProcessImage(src.get(), &a, e), 1u);
        ASSERT_EQ(direct[e](src.get(), &b), 1u);
        EXPECT_EQ(diff(a.get(), b.get()), "") << e;
    }
    Slot none;
    EXPECT_EQ(PX_ProcessImage(src.get(), &none, 4), 0u);
    EXPECT_EQ(PX_ProcessImage(src.get(), &none, 0xFFFFFFFFu), 0u);
    EXPECT_EQ(none.get(), nullptr);
}
