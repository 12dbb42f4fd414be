// Image record: creation rules, accessors against the stored bytes, copies.
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

// The colour of (x, y) decoded straight from the bytes of each format.
uint32_t decode(const Image *im, int32_t x, int32_t y) {
    const uint8_t *p = im->bits + size_t(y) * im->pitch + size_t(x) * (im->bitCount / 8);
    const uint32_t w = p[0] | p[1] << 8; // 16 bits: blue high, red low
    switch (im->bitCount) {
    case 8: return 0xFF000000u | p[0] * 0x010101u;
    case 16: return (w >> 11) << 3 | ((w >> 5) & 63) << 10 | (w & 31) << 19;
    case 24: return 0xFF000000u | p[0] | p[1] << 8 | p[2] << 16;
    default: return p[0] | p[1] << 8 | p[2] << 16 | uint32_t(p[3]) << 24;
    }
}

} // namespace

TEST(ImageRecord, PitchAndStoredBitCount) {
    const int32_t cases[][4] = {{10, 4, 8, 12}, {1, 24, 24, 4}, {3, 32, 32, 12}, {3, 16, 16, 8},
                                {5, 12, 8, 8},  {5, 0, 8, 8},   {7, 24, 24, 24}, {1, 1, 8, 4}}; // w, bc -> bc, pitch
    for (auto [w, bc, storedBc, pitch] : cases) {
        Owned im = make(w, 3, bc);
        ASSERT_TRUE(im) << w << "@" << bc;
        EXPECT_EQ(int32_t(im->bitCount) << 16 | int32_t(im->pitch) << 8 | int32_t(im->tag), storedBc << 16 | pitch << 8)
            << w << "@" << bc;
        for (size_t i = 0; i < size_t(im->pitch) * 3; ++i)
            ASSERT_EQ(im->bits[i], 255);
    }
}

TEST(PixelAccess, ReadersClampWritersRejectAndBothFollowTheBytes) {
    std::mt19937 rng(3);
    for (int32_t bc : kBitCounts) {
        Owned im = random_image(5, 4, bc, uint32_t(bc));
        Owned before = clone(im.get());
        for (int32_t y = -2; y < 6; ++y)
            for (int32_t x = -2; x < 7; ++x) {
                ASSERT_EQ(GetPixelColor(im.get(), x, y), decode(im.get(), std::clamp(x, 0, 4), std::clamp(y, 0, 3)))
                    << bc << " " << x << "," << y;
                if (x < 0 || y < 0 || x > 4 || y > 3)
                    SetPixelColor(im.get(), x, y, 0), SetPixelIndex(im.get(), x, y, 0);
            }
        EXPECT_EQ(diff(im.get(), before.get()), "") << bc;
        const uint32_t c = GetPixelColor(im.get(), 4, 3); // gray weights: 306 R, 601 G, 117 B
        EXPECT_EQ(GetPixelGray(im.get(), 9, 9), (306 * (c >> 16 & 255) + 601 * (c >> 8 & 255) + 117 * (c & 255)) >> 10);
        for (int i = 0; i < 50; ++i) {
            const uint32_t c = rng(), g = (c >> 8) & 255;
            const uint32_t want[] = {0xFF000000u | g * 0x010101u, c & 0x00F8FCF8u, c | 0xFF000000u, c};
            SetPixelColor(im.get(), i % 5, i % 4, c);
            ASSERT_EQ(decode(im.get(), i % 5, i % 4), want[bc / 8 - 1]) << bc << std::hex << " " << c;
        }
    }
}

TEST(PixelAccess, PackedIndexAndUnreadableFormats) {
    uint8_t nibbles[4] = {0xA5, 0x3C, 0, 0}, bits[4] = {0x81, 0, 0, 0}, odd[4] = {1, 2, 3, 4};
    Image four = {4, 1, 4, nibbles, 4, 0}, one = {8, 1, 1, bits, 4, 0}, twelve = {1, 1, 12, odd, 4, 0};
    EXPECT_EQ(GetPixelIndex(&four, 0, 0) << 8 | GetPixelIndex(&four, 1, 0) << 4 | GetPixelIndex(&four, 3, 0), 0xA5C);
    SetPixelIndex(&four, 2, 0, 0x17);
    EXPECT_EQ(nibbles[1], 0x7C);
    EXPECT_EQ(GetPixelColor(&four, 2, 0), 0xFF070707u);
    EXPECT_EQ(GetPixelIndex(&one, 0, 0) << 2 | GetPixelIndex(&one, 1, 0) << 1 | GetPixelIndex(&one, 7, 0), 5);
    SetPixelColor(&one, 1, 0, 0x00000100); // green 1 -> bit set
    EXPECT_EQ(bits[0], 0xC1);
    EXPECT_EQ(GetPixelColor(&twelve, 0, 0), 0xFF000000u); // opaque black, writes ignored
    SetPixelColor(&twelve, 0, 0, 0);
    EXPECT_EQ(odd[0], 1);
}

TEST(ImageCopy, ConvertsClampsAndKeepsDestinationAlpha) {
    for (int32_t sbc : kBitCounts)
        for (int32_t dbc : kBitCounts) {
            Owned src = random_image(3, 2, sbc, 3), dst = random_image(5, 4, dbc, 4);
            Owned before = clone(dst.get());
            ASSERT_EQ(PX_Img_Copy(dst.get(), src.get()), 1);
            for (int32_t y = 0; y < 4; ++y)
                for (int32_t x = 0; x < 5; ++x) {
                    Owned one = make(1, 1, dbc);
                    SetPixelColor(one.get(), 0, 0, GetPixelColor(src.get(), x, y));
                    uint32_t want = GetPixelColor(one.get(), 0, 0);
                    if (dbc == 32) want = (want & 0xFFFFFF) | (GetPixelColor(before.get(), x, y) & 0xFF000000);
                    ASSERT_EQ(GetPixelColor(dst.get(), x, y), want) << sbc << "->" << dbc << " " << x << "," << y;
                }
        }
    // Widths 5 and 7 at 8 bits share pitch 8: the block is copied whole, padding included.
    Owned src = random_image(5, 3, 8, 2), dst = make(7, 3, 8);
    ASSERT_EQ(PX_Img_Copy(dst.get(), src.get()), 1);
    EXPECT_EQ(std::memcmp(dst->bits, src->bits, 8 * 3), 0);
    // The alpha copy needs two 32-bit images of one size.
    Owned a = random_image(4, 3, 32, 5), b = random_image(4, 3, 32, 6), want = clone(b.get());
    for (size_t i = 3; i < 48; i += 4)
        want->bits[i] = a->bits[i];
    ASSERT_EQ(PX_Img_CopyAlpha(b.get(), a.get()), 1);
    EXPECT_EQ(diff(b.get(), want.get()), "");
    Image flat{0, 3, 32, nullptr, 0, 0}; // two pictures of no pixels: nothing to copy
    EXPECT_EQ(PX_Img_CopyAlpha(&flat, &flat), 1);
}
