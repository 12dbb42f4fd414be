// Colour-space conversions against golden hashes of an independent model
// (conversions_golden.py) and named values; Split and Combine against
// straightforward accessor versions; hue, saturation and lightness shifts:
// the plane maps, and the picture pass against the plane route (Split, shift
// one plane, Combine, copy).
#include "color/colorspace.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

Owned plane_route(const Image *src, const Image *existing, int amount, int component) {
    Slot h, s, l, a;
    EXPECT_EQ(Split(src, &h, &s, &l, &a, 1), 1);
    if (component == 0) BaseTran_Hue(h.get(), amount);
    if (component == 1 || component == 2) BaseTran_LS(component == 1 ? s.get() : l.get(), amount);
    Owned c(Combine(h.get(), s.get(), l.get(), a.get(), 1));
    if (existing == nullptr && c->bitCount == src->bitCount) return c;
    Owned out = existing ? clone(existing) : make(src->width, src->height, int32_t(src->bitCount));
    PX_Img_Copy(out.get(), c.get());
    return out;
}

using Conv = uint32_t (*)(uint32_t);
const Conv kConv[][2] = {
    {nullptr, nullptr}, {RGBtoHSL, HSLtoRGB}, {RGBtoYUV, YUVtoRGB}, {RGBtoYIQ, YIQtoRGB}, {RGBtoXYZ, XYZtoRGB}};

// Every third level of each byte, alpha varying: the grid of the model.
uint32_t grid_hash(Conv fn) {
    uint32_t h = 2166136261u, n = 0;
    for (uint32_t p = 0; p < 256; p += 3)
        for (uint32_t q = 0; q < 256; q += 3)
            for (uint32_t s = 0; s < 256; s += 3, ++n)
                h = (h ^ fn(p << 16 | q << 8 | s | ((n * 37) & 255) << 24)) * 16777619u;
    return h;
}

void reference_split(const Image *src, int mode, Owned planes[4]) {
    for (int i = 0; i < 4; ++i)
        planes[i] = make(src->width, src->height, 8);
    for (int y = 0; y < src->height; ++y)
        for (int x = 0; x < src->width; ++x) {
            uint32_t c = GetPixelColor(src, x, y);
            if (mode >= 1 && mode <= 4) c = kConv[mode][0](c);
            for (int i = 0; i < 4; ++i) // bytes 2, 1, 0, 3
                SetPixelIndex(planes[i].get(), x, y, int32_t((c >> (i == 3 ? 24 : 16 - 8 * i)) & 255));
        }
}

Owned reference_combine(const Image *p1, const Image *p2, const Image *p3, const Image *pa, int mode) {
    Owned out = make(p1->width, p1->height, pa ? 32 : 24);
    for (int y = 0; y < p1->height; ++y)
        for (int x = 0; x < p1->width; ++x) {
            uint32_t c = GetPixelIndex(p3, x, y) | GetPixelIndex(p2, x, y) << 8 | GetPixelIndex(p1, x, y) << 16 |
                         (pa ? uint32_t(GetPixelIndex(pa, x, y)) << 24 : 0u);
            SetPixelColor(out.get(), x, y, mode >= 1 && mode <= 4 ? kConv[mode][1](c) : c);
        }
    return out;
}

} // namespace

TEST(Conversions, MatchIndependentModel) {
    const std::pair<Conv, uint32_t> golden[] = {
        {RGBtoHSL, 0x4B6D48F4u}, {HSLtoRGB, 0x34B55525u}, {RGBtoYUV, 0xEF0D12C3u}, {YUVtoRGB, 0x3EBF2009u},
        {RGBtoYIQ, 0x2800EF40u}, {YIQtoRGB, 0x4E2A4BF7u}, {RGBtoXYZ, 0x2566B022u}, {XYZtoRGB, 0x4A055337u}};
    for (auto [fn, hash] : golden)
        EXPECT_EQ(grid_hash(fn), hash);
    for (int32_t d = 1; d <= 510; ++d)
        for (int32_t n = -131071; n < 131072; n += (n > -600 && n < 600) ? 1 : 89)
            ASSERT_EQ(pxfx::colour::div_small(n, d), n / d) << n << " / " << d;
    // HueToRGB: a falling span (never met by HSLtoRGB) and results wrap modulo 65536.
    EXPECT_EQ(HueToRGB(200, 10, 41), uint16_t(200 - (190 * 246 - 126) / 255));
    EXPECT_EQ(HueToRGB(0, 65535, 41), uint16_t((65535 * 246 + 126) / 255));
}

TEST(Planes, SplitAndCombineMatchAccessorVersionsSizeRulesAndSlots) {
    const int32_t sizes[][2] = {{1, 1}, {1, 5}, {5, 1}, {3, 2}, {7, 9}};
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : sizes)
            for (int mode : {0, 1, 2, 3, 4, 7}) {
                Owned src = random_image(w, h, bc, seed++), want[4];
                Slot p[4];
                ASSERT_EQ(Split(src.get(), &p[0], &p[1], &p[2], &p[3], mode), 1);
                reference_split(src.get(), mode, want);
                for (int i = 0; i < 4; ++i)
                    EXPECT_EQ(diff(p[i].get(), want[i].get()), "") << bc << " " << mode << " plane " << i;
                const Image *alpha = (h + mode) % 2 ? p[3].get() : nullptr; // with and without alpha
                Owned got(Combine(p[0].get(), p[1].get(), p[2].get(), alpha, mode));
                EXPECT_EQ(diff(got.get(), reference_combine(p[0].get(), p[1].get(), p[2].get(), alpha, mode).get()), "")
                    << bc << " " << mode;
            }
    Owned p1 = random_image(6, 5, 8, 1), low = random_image(6, 2, 8, 3);
    Owned tiny = random_image(2, 2, 8, 4), wide = random_image(6, 5, 24, 5);
    // A lower third plane and a small alpha plane repeat their edges; a 24-bit plane reads as 0.
    Owned got(Combine(p1.get(), wide.get(), low.get(), tiny.get(), 1));
    EXPECT_EQ(diff(got.get(), reference_combine(p1.get(), wide.get(), low.get(), tiny.get(), 1).get()), "");
    // A slot holding the source: the source is split first, then released.
    Slot s1, s2, s3;
    s1.image = clone(p1.get()).release();
    Owned want[4];
    reference_split(s1.get(), 2, want);
    ASSERT_EQ(Split(s1.get(), &s1, &s2, &s3, nullptr, 2), 1);
    EXPECT_EQ(diff(s1.get(), want[0].get()), "");
}

TEST(BaseTran, HueWrapsBy255AndLevelsClamp) {
    // {hue (1) or level (0), value, amount, result}: 265 - 255; -1 + 255; step
    // -255 / 100 = -2; the low byte of 2302 + 1; ...
    const int cases[][4] = {{1, 10, 200, 10},         {1, 254, 0, 254},  {1, 3, 99, 1},
                            {1, 7, 1000, 255},        {1, 0, 0, 0},      {0, 100, INT32_MIN, 0},
                            {0, 100, INT32_MAX, 255}, {0, 100, 150, 227}};
    for (auto [hue, value, amount, want] : cases) {
        Owned p = make(2, 1, 8);
        p->bits[0] = uint8_t(value);
        ASSERT_EQ((hue ? BaseTran_Hue : BaseTran_LS)(p.get(), amount), 1);
        EXPECT_EQ(p->bits[0], want) << value << " " << amount;
        EXPECT_EQ(p->bits[2], 255); // only the first width bytes of a row
    }
}

TEST(Transform, EqualsThePlaneRoute) {
    // The slot by amount: empty; an image of the source's size with 24 bits,
    // with 32 bits, with 32 bits in wider rows (its alpha kept); one of another
    // size and format, kept and filled; the source itself.
    const int kAmounts[] = {0, 37, 100, 163, 200, 251};
    uint32_t seed = 10;
    for (int32_t bc : kBitCounts)
        for (int component : {0, 1, 2, 5})
            for (int slot = 0; slot < 6; ++slot) {
                const int amount = kAmounts[slot];
                Owned src = random_image(7, 5, bc, seed++), other;
                if (slot == 1 || slot == 2) other = random_image(7, 5, slot == 1 ? 24 : 32, seed);
                if (slot == 3) other = random_image(5, 6, bc == 24 ? 32 : 24, seed);
                if (slot == 4) {
                    other = random_image(9, 5, 32, seed);
                    other->width = 7;
                }
                if (slot == 5) other = clone(src.get());
                const Owned want = plane_route(src.get(), other.get(), amount, component);
                Slot out;
                Image *kept = out.image = other.release();
                ASSERT_EQ(PX_IMG_Transform(slot == 5 ? kept : src.get(), &out, amount, component), 1);
                EXPECT_TRUE(kept == nullptr || out.get() == kept);
                ASSERT_EQ(diff(out.get(), want.get()), "") << bc << " c" << component << " slot " << slot;
            }
}
