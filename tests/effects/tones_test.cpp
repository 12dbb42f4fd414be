// Channel shift, channel scaling, contrast and the soft glow: hand-computed
// pixels for the formulas at parameters beside the golden hashes' (which pin
// the tones without parameters), references where a short one exists, every
// format, the result-image rule.
#include "support/reference_check.hpp"
#include "support/slot_rule.hpp"

using namespace pxtest;

namespace {

// Curve of `mode` for shift d at index i, low 8 bits (|d| small enough here
// that no sum leaves 32 bits).
int curve(uint32_t mode, int d, int i) {
    const uint8_t *t = mode == 1 || mode == 4 ? ZANTOFILTERBK : ZANTOFILTER;
    if (mode == 0) return i;
    if (mode == 3 || mode == 4) return t[i];
    if (mode == 5) t = d > 0 ? ZANTOFILTER : ZANTOFILTERBK;
    if (mode > 5) t = d < 0 ? ZANTOFILTER : ZANTOFILTERBK;
    const int w = std::abs(d);
    return ((127 - w) * i + w * t[i] + 63) / 127 & 255;
}

// The glow as the chain of whole images: blur, halve, raise contrast, then a
// screen blend written pixel by pixel.
Owned ref_lambency(const Image *src) {
    const int32_t k[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
    Owned t1 = make(src->width, src->height, static_cast<int32_t>(src->bitCount));
    Filter(const_cast<Image *>(src), k, 3, 16, 0, nullptr, t1.get(), 0);
    Slot t2, t3;
    PX_IMG_Light_Alter(t1.get(), &t2, 50, 4);
    PX_IMG_Ballance(t2.get(), &t3, 5);
    return per_pixel(src, [&](uint32_t a, int x, int y) {
        const uint32_t b = GetPixelColor(t3.get(), x, y);
        for (int s : {0, 8, 16}) {
            const int v = std::min(chan(a, s) + chan(b, s) - ((chan(a, s) * chan(b, s)) >> 8), 255);
            a = (a & ~(255u << s)) | uint32_t(v) << s;
        }
        return a;
    });
}

} // namespace

TEST(Tones, HandComputedPixelsInEveryFormat) {
    const auto light = [](uint32_t p, uint32_t ch) { return bind_slot(PX_IMG_Light_Alter, p, ch); };
    const auto contrast = [](int32_t c) { return bind_slot(PX_IMG_Ballance, c); };
    const uint32_t in = rgba(10, 200, 30, 77);
    const struct {
        SlotCall effect;
        uint32_t in, out;
    } cases[] = {
        {light(50, 0), in, rgba(10, 200, 15, 77)},
        {light(200, 1), in, rgba(10, 255, 30, 77)},
        {light(37, 2), in, rgba(3, 200, 30, 77)},
        {light(150, 7), in, rgba(15, 255, 45, 77)},
        {light(100, 2), in, in},
        {light(0xFFFFFFFFu, 1), in, rgba(10, 255, 30, 77)}, // no wrap
        {contrast(5), rgba(0, 255, 128, 1), rgba(0, 255, 128, 1)},
        {contrast(5), rgba(188, 100, 228, 1), rgba(191, 98, 233, 1)}, // 60 * 1.05f = 62.9999962, + 128 in float
        {contrast(5), rgba(248, 127, 129, 1), rgba(254, 126, 129, 1)},
        {contrast(-100), rgba(3, 200, 255, 1), rgba(128, 128, 128, 1)},
    };
    for (const auto &c : cases) {
        Owned one = filled(2, 2, 32, c.in);
        Slot dst;
        ASSERT_EQ(c.effect(one.get(), &dst), 1u);
        EXPECT_EQ(GetPixelColor(dst.get(), 1, 1), c.out) << std::hex << c.in;
        expect_format_consistent(c.effect, c.out);
    }
}

TEST(Alter, EveryModeMatchesPerPixelCurvesAndExtremeShiftsWrap) {
    const int shifts[][3] = {{0, 0, 0}, {127, -127, 40}, {-5, 90, -60}, {200, -300, 128}};
    uint32_t seed = 1;
    for (uint32_t mode : {0u, 1u, 2u, 3u, 4u, 5u, 6u, 100u, 0xFFFFFFFFu})
        for (const auto &shift : shifts) {
            const int dR = shift[0], dG = shift[1], dB = shift[2];
            const auto at = [&](int d, uint32_t c, int sh) { return curve(mode, d, ltouc(chan(c, sh) + d)); };
            const auto ref = [&](const Image *s) {
                return per_pixel(s, [&](uint32_t c, int, int) {
                    return rgba(at(dB, c, 0), at(dG, c, 8), at(dR, c, 16), chan(c, 24));
                });
            };
            expect_like_reference([&](Image *s, Image **d) { return PX_IMG_Alter(s, d, dR, dG, dB, mode); }, ref,
                                  seed += 50);
        }
    Owned px = filled(2, 1, 24, rgba(10, 20, 30, 255));
    SetPixelColor(px.get(), 1, 0, rgba(0, 0, 0, 255));
    Slot dst;
    // Sums wrap as 32-bit sums: 0 + INT_MAX clamps to 255, 10 + INT_MAX wraps negative to 0.
    ASSERT_EQ(PX_IMG_Alter(px.get(), &dst, INT32_MAX, INT32_MAX, INT32_MAX, 0), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(0, 0, 0, 255));
    EXPECT_EQ(GetPixelColor(dst.get(), 1, 0), rgba(255, 255, 255, 255));
}

TEST(LightAndContrast, BlockCopiesAndClears) {
    Owned src = random_image(5, 3, 24, 8);
    Slot dst;
    ASSERT_EQ(PX_IMG_Ballance(src.get(), &dst, 0), 1u); // block bytes, padding included
    EXPECT_EQ(std::memcmp(dst->bits, src->bits, src->pitch * 3), 0);
    ASSERT_EQ(PX_IMG_Light_Alter(src.get(), &dst, 0, 1), 1u); // every byte cleared
    EXPECT_EQ(std::vector<uint8_t>(dst->bits, dst->bits + dst->pitch * 3), std::vector<uint8_t>(dst->pitch * 3));
}

TEST(Lambency, MatchesTheImageChain) {
    expect_like_reference(PX_IMG_Lambency, ref_lambency, 1);
    // A hand-made 4-bit record: the working image and a new result are 8-bit.
    std::vector<uint8_t> nibbles(4 * 5);
    std::iota(nibbles.begin(), nibbles.end(), uint8_t(0x3A));
    Image packed{7, 5, 4, nibbles.data(), 4, 0};
    Slot dst;
    ASSERT_EQ(PX_IMG_Lambency(&packed, &dst), 1u);
    EXPECT_EQ(diff(dst.get(), ref_lambency(&packed).get()), "");
}
