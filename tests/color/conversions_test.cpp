// Colour-space conversions against golden hashes of an independent model
// (conversions_golden.py), named values and round trips; Split and Combine
// against straightforward accessor versions.
#include <gtest/gtest.h>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

using Conv = uint32_t (*)(uint32_t);

// Every third level of each byte, alpha varying: the grid of the model.
uint32_t grid_hash(Conv fn) {
    uint32_t h = 2166136261u, n = 0;
    for (uint32_t p = 0; p < 256; p += 3)
        for (uint32_t q = 0; q < 256; q += 3)
            for (uint32_t s = 0; s < 256; s += 3, ++n)
                h = (h ^ fn(p << 16 | q << 8 | s | ((n * 37) & 255) << 24)) * 16777619u;
    return h;
}

const Conv kForward[] = {nullptr, RGBtoHSL, RGBtoYUV, RGBtoYIQ, RGBtoXYZ};
const Conv kBackward[] = {nullptr, HSLtoRGB, YUVtoRGB, YIQtoRGB, XYZtoRGB};

// Split written per pixel with the accessors.
void reference_split(const Image *src, int mode, Owned planes[4]) {
    for (int i = 0; i < 4; ++i)
        planes[i] = make(src->width, src->height, 8);
    for (int y = 0; y < src->height; ++y)
        for (int x = 0; x < src->width; ++x) {
            uint32_t c = GetPixelColor(src, x, y);
            if (mode >= 1 && mode <= 4) c = kForward[mode](c);
            for (int i = 0; i < 4; ++i)
                SetPixelIndex(planes[i].get(), x, y, int32_t((c >> (16 - 8 * i)) & 255) | int32_t(c >> 24) * (i == 3));
        }
}

Owned reference_combine(const Image *p1, const Image *p2, const Image *p3, const Image *pa, int mode) {
    Owned out = make(p1->width, p1->height, pa ? 32 : 24);
    for (int y = 0; y < p1->height; ++y)
        for (int x = 0; x < p1->width; ++x) {
            uint32_t c = GetPixelIndex(p3, x, y) | GetPixelIndex(p2, x, y) << 8 | GetPixelIndex(p1, x, y) << 16 |
                         (pa ? uint32_t(GetPixelIndex(pa, x, y)) << 24 : 0u);
            if (mode >= 1 && mode <= 4) c = kBackward[mode](c);
            SetPixelColor(out.get(), x, y, c);
        }
    return out;
}

const int32_t kSizes[][2] = {{1, 1}, {1, 5}, {5, 1}, {3, 2}, {7, 9}, {17, 4}};

} // namespace

TEST(Conversions, MatchIndependentModelOnGrid) {
    EXPECT_EQ(grid_hash(RGBtoHSL), 0x4B6D48F4u);
    EXPECT_EQ(grid_hash(HSLtoRGB), 0x34B55525u);
    EXPECT_EQ(grid_hash(RGBtoYUV), 0xEF0D12C3u);
    EXPECT_EQ(grid_hash(YUVtoRGB), 0x3EBF2009u);
    EXPECT_EQ(grid_hash(RGBtoYIQ), 0x2800EF40u);
    EXPECT_EQ(grid_hash(YIQtoRGB), 0x4E2A4BF7u);
    EXPECT_EQ(grid_hash(RGBtoXYZ), 0x2566B022u);
    EXPECT_EQ(grid_hash(XYZtoRGB), 0x4A055337u);
}

TEST(Conversions, NamedValues) {
    EXPECT_EQ(RGBtoHSL(0x00808080), 0x00AA0080u); // achromatic hue 170
    EXPECT_EQ(HSLtoRGB(0x00AA0080), 0x00808080u);
    EXPECT_EQ(RGBtoHSL(0x7FFF0000), 0x7F00FF80u); // red: hue 0, alpha kept
    EXPECT_EQ(RGBtoHSL(0x0000FF00), 0x0055FF80u);
    EXPECT_EQ(RGBtoHSL(0x000000FF), 0x00AAFF80u);
    EXPECT_EQ(RGBtoYUV(0x00FFFFFF), 0x00FF8080u);
    EXPECT_EQ(RGBtoXYZ(0xFFFFFFFF), 0xFFF2FFFFu); // largest values, nothing wraps
    EXPECT_EQ(XYZtoRGB(0x12000000), 0x12000000u);
    // HueToRGB: hue above 255 folds back by 255; results wrap modulo 65536.
    EXPECT_EQ(HueToRGB(10, 200, 256), HueToRGB(10, 200, 1));
    EXPECT_EQ(HueToRGB(10, 200, 100), 200);
    EXPECT_EQ(HueToRGB(10, 200, 170), 10);
    EXPECT_EQ(HueToRGB(10, 200, 169), 10 + (190 * 6 + 126) / 255);
    EXPECT_EQ(HueToRGB(10, 200, 41), 10 + (190 * 246 + 126) / 255);
    EXPECT_EQ(HueToRGB(200, 10, 41), uint16_t(200 - (190 * 246 - 126) / 255));
    EXPECT_EQ(HueToRGB(0, 65535, 41), uint16_t((65535 * 246 + 126) / 255));
}

TEST(Conversions, RoundTripsAndClamping) {
    for (uint32_t v = 0; v < 256; ++v) {
        const uint32_t gray = v * 0x010101u | 0x5A000000u;
        EXPECT_EQ(HSLtoRGB(RGBtoHSL(gray)), gray);
        EXPECT_EQ(RGBtoHSL(gray) >> 8 & 0xFFFF, 0xAA00u);
    }
    // Saturated colours come back with their low channels lifted by one.
    EXPECT_EQ(HSLtoRGB(RGBtoHSL(0x00FF0000)), 0x00FF0101u);
    EXPECT_EQ(HSLtoRGB(RGBtoHSL(0x000000FF)), 0x000101FFu);
    // Out-of-gamut inputs clamp channels at both ends (values of the model).
    EXPECT_EQ(YUVtoRGB(0x00FF00FF), 0x00FFD01Cu);
    EXPECT_EQ(YUVtoRGB(0x0000FF00), 0x00002FE0u);
    EXPECT_EQ(YIQtoRGB(0x00FFFF00), 0x00FFFF00u);
    EXPECT_EQ(XYZtoRGB(0x00FF0000), 0x00FF000Eu);
}

TEST(Planes, SplitAndCombineMatchAccessorVersions) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int mode : {0, 1, 2, 3, 4, 7}) {
                Owned src = random_image(w, h, bc, seed++);
                Slot p1, p2, p3, pa;
                ASSERT_EQ(Split(src.get(), &p1, &p2, &p3, &pa, mode), 1);
                Owned want[4];
                reference_split(src.get(), mode, want);
                EXPECT_EQ(diff(p1.get(), want[0].get()), "") << bc << " " << mode;
                EXPECT_EQ(diff(p2.get(), want[1].get()), "") << bc << " " << mode;
                EXPECT_EQ(diff(p3.get(), want[2].get()), "") << bc << " " << mode;
                EXPECT_EQ(diff(pa.get(), want[3].get()), "") << bc << " " << mode;
                for (const Image *alpha : {static_cast<const Image *>(pa.get()), static_cast<const Image *>(nullptr)}) {
                    Owned got(Combine(p1.get(), p2.get(), p3.get(), alpha, mode));
                    ASSERT_TRUE(got);
                    Owned ref = reference_combine(p1.get(), p2.get(), p3.get(), alpha, mode);
                    EXPECT_EQ(diff(got.get(), ref.get()), "") << bc << " " << mode;
                }
            }
}

TEST(Planes, RgbPlanesReproduceThePicture) {
    for (int32_t bc : {24, 32}) {
        Owned src = random_image(9, 5, bc, 77);
        Slot r, g, b, a;
        ASSERT_EQ(Split(src.get(), &r, &g, &b, bc == 32 ? &a : nullptr, 7), 1);
        EXPECT_EQ(GetPixelIndex(r.get(), 2, 3), (GetPixelColor(src.get(), 2, 3) >> 16) & 255);
        Owned back(Combine(r.get(), g.get(), b.get(), a.get(), 7));
        EXPECT_EQ(diff(back.get(), src.get()), "");
    }
}

TEST(Planes, CombineSizeRulesAndClamping) {
    Owned p1 = random_image(6, 5, 8, 1), narrow = random_image(5, 5, 8, 2), low = random_image(6, 2, 8, 3);
    Owned tiny = random_image(2, 2, 8, 4);
    EXPECT_EQ(Combine(p1.get(), narrow.get(), p1.get(), nullptr, 0), nullptr);
    EXPECT_EQ(Combine(p1.get(), p1.get(), narrow.get(), nullptr, 0), nullptr);
    EXPECT_EQ(Combine(p1.get(), low.get(), p1.get(), nullptr, 0), nullptr);
    EXPECT_EQ(Combine(p1.get(), nullptr, p1.get(), nullptr, 0), nullptr);
    EXPECT_EQ(Combine(nullptr, p1.get(), p1.get(), nullptr, 0), nullptr);
    // A lower third plane and a small alpha plane repeat their edges.
    Owned got(Combine(p1.get(), p1.get(), low.get(), tiny.get(), 1));
    ASSERT_TRUE(got);
    EXPECT_EQ(diff(got.get(), reference_combine(p1.get(), p1.get(), low.get(), tiny.get(), 1).get()), "");
    EXPECT_EQ(got->bitCount, 32u);
    // Planes of other bit counts read as GetPixelIndex reads them.
    Owned wide = random_image(6, 5, 24, 5);
    Owned odd(Combine(p1.get(), wide.get(), p1.get(), nullptr, 2));
    EXPECT_EQ(diff(odd.get(), reference_combine(p1.get(), wide.get(), p1.get(), nullptr, 2).get()), "");
}

TEST(Planes, SplitSlotsAreReplacedOrRefused) {
    Owned src = random_image(4, 3, 24, 9);
    Slot p1, p2, p3;
    Image *stale = malloc_Image(1, 1, 8);
    p1.image = stale;
    p2.image = stale;                                              // the same image in two slots is released once
    EXPECT_EQ(Split(src.get(), &p1, &p2, nullptr, nullptr, 1), 0); // partial set: untouched
    EXPECT_EQ(p1.get(), stale);
    EXPECT_EQ(Split(src.get(), &p1, &p1, &p3, nullptr, 1), 0);
    EXPECT_EQ(Split(src.get(), &p1, &p2, &p3, &p3, 1), 0);
    EXPECT_EQ(Split(nullptr, &p1, &p2, &p3, nullptr, 1), 0);
    ASSERT_EQ(Split(src.get(), &p1, &p2, &p3, nullptr, 1), 1);
    EXPECT_EQ(p1->width, 4);
    EXPECT_NE(p1.get(), p2.get());
    // A slot holding the source: the source is split first, then released.
    Slot own, q2, q3;
    own.image = clone(src.get()).release();
    Owned want[4];
    reference_split(own.get(), 2, want);
    ASSERT_EQ(Split(own.get(), &own, &q2, &q3, nullptr, 2), 1);
    EXPECT_EQ(diff(own.get(), want[0].get()), "");
}
