// Image record: creation rules, accessor clamping and formats, copies.
#include <gtest/gtest.h>

#include <climits>
#include <cstring>

#include "support/test_images.hpp"

using namespace pxtest;

TEST(ImageRecord, PitchAndStoredBitCount) {
    struct Case {
        int32_t w, bc;
        uint32_t storedBc, pitch;
    } cases[] = {{10, 4, 8, 12}, {1, 24, 24, 4}, {3, 32, 32, 12}, {3, 16, 16, 8}, {5, 12, 8, 8},
                 {5, 0, 8, 8},   {4, 8, 8, 4},   {7, 24, 24, 24}, {1, 1, 8, 4}};
    for (const Case &c : cases) {
        Owned im = make(c.w, 3, c.bc);
        ASSERT_TRUE(im) << c.w << "@" << c.bc;
        EXPECT_EQ(im->bitCount, c.storedBc) << c.w << "@" << c.bc;
        EXPECT_EQ(im->pitch, c.pitch) << c.w << "@" << c.bc;
        EXPECT_EQ(im->tag, 0u);
        for (size_t i = 0; i < size_t(im->pitch) * 3; ++i)
            ASSERT_EQ(im->bits[i], 255);
    }
}

TEST(ImageRecord, RefusesEmptyNegativeAndOversizedRequests) {
    EXPECT_EQ(malloc_Image(0, 5, 24), nullptr);
    EXPECT_EQ(malloc_Image(5, 0, 24), nullptr);
    EXPECT_EQ(malloc_Image(-5, 5, 24), nullptr);
    EXPECT_EQ(malloc_Image(5, INT32_MIN, 8), nullptr);
    EXPECT_EQ(malloc_Image(100000, 100000, 32), nullptr);
    EXPECT_EQ(malloc_Image(INT32_MAX, 1, 32), nullptr);
    EXPECT_EQ(malloc_Image(INT32_MAX, INT32_MAX, 8), nullptr);
}

TEST(ImageRecord, FreeKeepsOrDropsTheRecord) {
    Image *im = malloc_Image(4, 4, 24);
    free_Image(&im, 1);
    ASSERT_NE(im, nullptr);
    EXPECT_EQ(im->bits, nullptr);
    EXPECT_EQ(im->width, 4);
    EXPECT_EQ(GetPixelColor(im, 0, 0), 0u);
    SetPixelColor(im, 0, 0, 0x123456);
    free_Image(&im, 1);
    free_Image(&im, 0);
    EXPECT_EQ(im, nullptr);
    free_Image(&im, 0);
    free_Image(nullptr, 0);
}

TEST(PixelAccess, NewImagesReadWhiteAndOpaque) {
    for (int32_t bc : {8, 24, 32})
        EXPECT_EQ(GetPixelColor(make(3, 3, bc).get(), 1, 1), 0xFFFFFFFFu) << bc;
    // 16 bits: all-ones word reads with zero low bits and alpha 0.
    EXPECT_EQ(GetPixelColor(make(3, 3, 16).get(), 1, 1), 0x00F8FCF8u);
}

TEST(PixelAccess, ReadersClampWritersReject) {
    Owned im = random_image(5, 4, 24, 1);
    EXPECT_EQ(GetPixelColor(im.get(), -5, 4 + 3), GetPixelColor(im.get(), 0, 3));
    EXPECT_EQ(GetPixelColor(im.get(), 99, -1), GetPixelColor(im.get(), 4, 0));
    EXPECT_EQ(GetPixelGray(im.get(), -1, -1), GetPixelGray(im.get(), 0, 0));
    Owned before = clone(im.get());
    for (auto [x, y] : {std::pair{5, 0}, {-1, 0}, {0, 4}, {0, -1}})
        SetPixelColor(im.get(), x, y, 0);
    for (auto [x, y] : {std::pair{5, 0}, {-1, 0}, {0, 4}})
        SetPixelIndex(im.get(), x, y, 0);
    EXPECT_EQ(diff(im.get(), before.get()), "");
}

TEST(PixelAccess, ChannelLayoutPerFormat) {
    const uint32_t c = 0x80123456; // A 0x80, R 0x12, G 0x34, B 0x56
    Owned i32 = make(2, 1, 32), i24 = make(2, 1, 24), i16 = make(2, 1, 16), i8 = make(2, 1, 8);
    SetPixelColor(i32.get(), 1, 0, c);
    SetPixelColor(i24.get(), 1, 0, c);
    SetPixelColor(i16.get(), 1, 0, 0x00FFFFFF);
    SetPixelColor(i8.get(), 1, 0, c);
    EXPECT_EQ(std::memcmp(i32->bits + 4, "\x56\x34\x12\x80", 4), 0);
    EXPECT_EQ(GetPixelColor(i32.get(), 1, 0), c);
    EXPECT_EQ(std::memcmp(i24->bits + 3, "\x56\x34\x12", 3), 0);
    EXPECT_EQ(GetPixelColor(i24.get(), 1, 0), 0xFF123456u);
    EXPECT_EQ(GetPixelColor(i16.get(), 1, 0), 0x00F8FCF8u); // B 248, G 252, R 248, A 0
    EXPECT_EQ(i8->bits[1], 0x34);                           // the green byte
    EXPECT_EQ(GetPixelColor(i8.get(), 1, 0), 0xFF343434u);
    EXPECT_EQ(GetPixelGray(i24.get(), 1, 0), (306 * 0x12 + 601 * 0x34 + 117 * 0x56) >> 10);

    // 16-bit word order: blue in the high bits, red in the low bits.
    Owned w = make(1, 1, 16);
    SetPixelColor(w.get(), 0, 0, 0x00F80000); // red only
    EXPECT_EQ(w->bits[0], 0x1F);
    EXPECT_EQ(w->bits[1], 0x00);
    SetPixelColor(w.get(), 0, 0, 0x000000F8); // blue only
    EXPECT_EQ(w->bits[0], 0x00);
    EXPECT_EQ(w->bits[1], 0xF8);
}

TEST(PixelAccess, PackedIndexFormats) {
    uint8_t nibbles[4] = {0xA5, 0x3C, 0, 0};
    Image four = {4, 1, 4, nibbles, 4, 0};
    EXPECT_EQ(GetPixelIndex(&four, 0, 0), 0xA);
    EXPECT_EQ(GetPixelIndex(&four, 1, 0), 0x5);
    EXPECT_EQ(GetPixelIndex(&four, 3, 0), 0xC);
    SetPixelIndex(&four, 2, 0, 0x17);
    EXPECT_EQ(nibbles[1], 0x7C);
    EXPECT_EQ(GetPixelColor(&four, 2, 0), 0xFF070707u);

    uint8_t bits[4] = {0x81, 0, 0, 0};
    Image one = {8, 1, 1, bits, 4, 0};
    EXPECT_EQ(GetPixelIndex(&one, 0, 0), 1);
    EXPECT_EQ(GetPixelIndex(&one, 1, 0), 0);
    EXPECT_EQ(GetPixelIndex(&one, 7, 0), 1);
    SetPixelColor(&one, 1, 0, 0x00000100); // green 1 -> bit set
    EXPECT_EQ(bits[0], 0xC1);

    uint8_t odd[4] = {1, 2, 3, 4};
    Image twelve = {1, 1, 12, odd, 4, 0};
    EXPECT_EQ(GetPixelColor(&twelve, 0, 0), 0xFF000000u); // opaque black
    SetPixelColor(&twelve, 0, 0, 0);
    EXPECT_EQ(odd[0], 1);
}

TEST(PixelAccess, HandMadeRecordsWithBadGeometryHaveNoPixels) {
    uint8_t buf[16] = {};
    Image narrow = {4, 2, 24, buf, 8, 0}; // pitch smaller than a row
    Image empty = {0, 2, 8, buf, 4, 0};
    Image negative = {-3, 2, 8, buf, 4, 0};
    for (Image *im : {&narrow, &empty, &negative}) {
        EXPECT_EQ(GetPixelColor(im, 0, 0), 0u);
        EXPECT_EQ(GetPixelIndex(im, 0, 0), 0);
        SetPixelColor(im, 0, 0, 0x00FFFFFF);
        SetPixelIndex(im, 0, 0, 7);
    }
    for (uint8_t b : buf)
        EXPECT_EQ(b, 0);
    EXPECT_EQ(GetPixelColor(nullptr, 0, 0), 0u);
}

TEST(ImageCopy, FastPathCopiesBlockWhenLayoutsAgree) {
    // Widths 5 and 7 at 8 bits both have pitch 8: the block is copied whole,
    // padding included.
    Owned src = random_image(5, 3, 8, 2);
    Owned dst = make(7, 3, 8);
    ASSERT_EQ(PX_Img_Copy(dst.get(), src.get()), 1);
    EXPECT_EQ(std::memcmp(dst->bits, src->bits, 8 * 3), 0);
}

TEST(ImageCopy, ConvertingPathClampsAndKeepsDestinationAlpha) {
    Owned src = random_image(3, 2, 24, 3);
    Owned dst = random_image(5, 4, 32, 4);
    Owned alphaBefore = clone(dst.get());
    ASSERT_EQ(PX_Img_Copy(dst.get(), src.get()), 1);
    for (int32_t y = 0; y < 4; ++y)
        for (int32_t x = 0; x < 5; ++x) {
            const uint32_t want = GetPixelColor(src.get(), x, y) & 0xFFFFFF;
            const uint32_t got = GetPixelColor(dst.get(), x, y);
            EXPECT_EQ(got & 0xFFFFFF, want) << x << "," << y;
            EXPECT_EQ(got >> 24, GetPixelColor(alphaBefore.get(), x, y) >> 24);
        }
    // Into 8 bits: the green byte; into 16 bits: the packed word.
    Owned gray = make(3, 2, 8), word = make(3, 2, 16);
    PX_Img_Copy(gray.get(), src.get());
    PX_Img_Copy(word.get(), src.get());
    for (int32_t x = 0; x < 3; ++x) {
        const uint32_t c = GetPixelColor(src.get(), x, 1);
        EXPECT_EQ(GetPixelIndex(gray.get(), x, 1), (c >> 8) & 255);
        Owned one = make(1, 1, 16);
        SetPixelColor(one.get(), 0, 0, c);
        EXPECT_EQ(GetPixelColor(word.get(), x, 1), GetPixelColor(one.get(), 0, 0));
    }
    EXPECT_EQ(PX_Img_Copy(nullptr, src.get()), 0);
    EXPECT_EQ(PX_Img_Copy(dst.get(), nullptr), 0);
}

TEST(ImageCopy, AlphaCopyNeedsTwoEqualThirtyTwoBitImages) {
    Owned a = random_image(4, 3, 32, 5), b = random_image(4, 3, 32, 6);
    Owned before = clone(b.get());
    ASSERT_EQ(PX_Img_CopyAlpha(b.get(), a.get()), 1);
    for (int32_t y = 0; y < 3; ++y)
        for (int32_t x = 0; x < 4; ++x) {
            EXPECT_EQ(GetPixelColor(b.get(), x, y) >> 24, GetPixelColor(a.get(), x, y) >> 24);
            EXPECT_EQ(GetPixelColor(b.get(), x, y) & 0xFFFFFF, GetPixelColor(before.get(), x, y) & 0xFFFFFF);
        }
    EXPECT_EQ(PX_Img_CopyAlpha(b.get(), make(4, 3, 24).get()), 0);
    EXPECT_EQ(PX_Img_CopyAlpha(b.get(), make(4, 2, 32).get()), 0);
    EXPECT_EQ(PX_Img_CopyAlpha(b.get(), make(3, 3, 32).get()), 0);
}
