// Hostile input: null records and slots, records without pixels, extreme
// centres and radii. Every call must refuse or stay inside the picture (the
// sanitizer build checks the memory side).
#include <gtest/gtest.h>

#include <climits>

#include "retouch/reference.hpp"

using namespace pxtest;

TEST(Safety, NullRecordsAndSlotsAreRefused) {
    Owned pic = random_image(12, 9, 24, 1);
    Image empty = *pic;
    empty.bits = nullptr;
    Image *slot = nullptr;
    for (Image *bad : {static_cast<Image *>(nullptr), &empty}) {
        // Every result is 0 or 1, so a zero sum means all were refused.
        EXPECT_EQ(
            CreateFaceMaskImg(bad, &slot) + SmileDetect(bad, &slot, 0) + alg_Img_smooth_1(bad, &slot) +
                alg_Img_Skin(bad, &slot, 1) + LightUP(bad) + Best_Color(bad, 3) +
                ImageAutoGradationProcess(bad, &slot, 50) + ImageExposure(bad, &slot, 5) + MyOneKeyFliter(bad, &slot) +
                PointArea_Copy(bad, pic.get(), 3, 3, 3) + PointArea_Copy_Alph(pic.get(), bad, 3, 3, 3, 9) +
                PX_Mimic(bad, 0, 0, nullptr, 0, 0, 3, 3, 3, 1, &slot) +
                alg_Blending(bad, nullptr, 3, 3, PXTint{1, 2, 3}, 3, &slot) + alg_Img_Blending(bad, &slot) +
                alg_smooth(bad, 0, 3, 3, 3, 5, &slot) + EyesEnlarge(bad) + alg_QuHeiYanQuan(bad, 3, 3, 3, 20, &slot, 0),
            0);
        MoreLight(bad, 3, &slot);
        ImageAutoGradationProcess1(bad, &slot, 0, 1);
        thresholdBlur(0, 0, 3, 50, bad, &slot);
        EXPECT_EQ(slot, nullptr);
    }
    EXPECT_EQ(PX_Mimic(pic.get(), 0, 0, &empty, 0, 0, 3, 3, 3, 1, &slot), 0);
    EXPECT_EQ(getpos(nullptr, 5, 1), 5);
    EXPECT_EQ(PointArea_Copy(pic.get(), pic.get(), 5, 5, 0), 0);
}

TEST(Safety, ExtremeCentresAndRadiiStayInside) {
    const int32_t values[] = {INT_MIN, -70000, -1, 0, 5, 70000, INT_MAX};
    for (int32_t bc : {24, 32}) {
        Owned pic = random_image(13, 11, bc, 2), src = random_image(13, 11, bc, 3);
        Slot cache;
        for (int32_t c : values)
            for (int32_t r : values) {
                PointArea_Copy(pic.get(), src.get(), c, r, r);
                PointArea_Copy_Alph(pic.get(), src.get(), r, c, r, c);
                PX_Mimic(pic.get(), c, r, nullptr, r, c, c, c, r, 1, &cache);
                alg_Img_Eradicate(pic.get(), c, c, r);
                alg_Img_EyesEnlarge_ellipse(pic.get(), c, r, r);
                alg_Img_EyesEnlarge_circle(pic.get(), r, c, r);
                alg_Img_EyesMoreContrast_ellipse(pic.get(), c, 5, r, c);
                alg_Img_quheiyanquan_ellipse(pic.get(), c, r, r);
                alg_QuHeiYanQuan(pic.get(), c, r, r, 40, nullptr, 0);
            }
        // A source smaller than the picture is read only where it has pixels.
        Owned tiny = random_image(2, 2, 8, 4);
        EXPECT_EQ(PointArea_Copy(pic.get(), tiny.get(), 6, 5, 40), 1);
        EXPECT_EQ(PointArea_Copy_Alph(pic.get(), tiny.get(), 6, 5, 40, 3), 1);
    }
    Owned gray = random_image(9, 9, 8, 5);
    EXPECT_EQ(Best_Color(gray.get(), INT_MIN), 1);
    EXPECT_EQ(Best_Color(gray.get(), INT_MAX), 0);
    Slot out;
    MoreLight(gray.get(), INT_MIN, &out);
    thresholdBlur(INT_MIN, INT_MAX, INT_MIN, INT_MAX, gray.get(), &out);
    PXPoint pts[3];
    const PXPoint far[4] = {{INT_MIN, INT_MAX}, {INT_MAX, INT_MIN}, {INT_MIN, INT_MIN}, {INT_MAX, INT_MAX}};
    ComputeBezier(far, 3, pts);
    EXPECT_EQ(pts[0].x, INT_MIN);
}

TEST(Safety, HandFilledNibbleRecords) {
    // 4-bit records read their indices through the accessors and are never
    // written past their short rows.
    uint8_t block[8 * 5];
    for (size_t i = 0; i < sizeof block; ++i)
        block[i] = static_cast<uint8_t>(i * 37);
    Image nibbles{9, 5, 4, block, 8, 0};
    Slot mask, lifted;
    EXPECT_EQ(CreateFaceMaskImg(&nibbles, &mask), 1);
    MoreLight(&nibbles, 3, &lifted);
    EXPECT_EQ(lifted->bitCount, 8u);
    Owned pic = random_image(9, 5, 24, 1);
    EXPECT_EQ(PointArea_Copy(pic.get(), &nibbles, 4, 2, 30), 1);
    alg_Img_EyesEnlarge(&nibbles, 4, 2, 6, 1);
    alg_Img_quheiyanquan_ellipse(&nibbles, 4, 4, 10);
    EXPECT_EQ(EyesEnlarge(&nibbles), 1);
}
