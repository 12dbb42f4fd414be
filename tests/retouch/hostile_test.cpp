// Hostile input beyond the registry's contracts: point lists, curves and
// caches at their extremes, and sources of empty sizes.
#include "support/hostile.hpp"

using namespace pxtest::hostile;

namespace {

const int32_t xs[] = {0, 4, -9, INT_MAX}, ys[] = {3, INT_MIN, 2, 6};

} // namespace

TEST(Hostile, RetouchScalars) {
    auto pic = good<Image>(9, 7, 24, 1), none = good<Image>(9, 7, 24, 2);
    none->record.bits = nullptr;
    Image *slot = nullptr, *p = &pic->record;
    EXPECT_EQ(alg_QuHeiYanQuan_1(p, nullptr, ys, 2, 3, 9) + alg_QuHeiYanQuan_1(p, xs, nullptr, 2, 3, 9), 0);
    // A reference without pixels is copied as zeros into the clone's cache.
    ASSERT_EQ(PX_Mimic(p, 0, 0, &none->record, 0, 0, 3, 3, 0, 0, &slot), 1);
    EXPECT_TRUE(std::all_of(slot->bits, slot->bits + slot->pitch * 7, [](uint8_t v) { return v == 0; }));
    free_Image(&slot, 0);
    BuildTable(nullptr, 0.5f);
    MakeMapping(nullptr, 0.1f, 0.9f);
    const PXPoint far[4] = {{INT_MIN, INT_MAX}, {INT_MAX, INT_MIN}, {INT_MIN, INT_MIN}, {INT_MAX, INT_MAX}};
    PXPoint pts[3];
    for (int32_t v : kExtremes) {
        int32_t values[4] = {v, 1, INT_MAX, 0};
        const PXPoint o = PointOnCubicBezier(nullptr, nullptr, float(v));
        EXPECT_TRUE(Sort_largelow(nullptr, v) == nullptr && Sort_largelow(values, std::min(v, 4)) == values &&
                    getpos(nullptr, v, v) == v && (o.x | o.y) == 0);
        ComputeBezier(far, v, nullptr);
        ComputeBezier(nullptr, v, pts);
        PointOnCubicBezier(pts + 2, far, float(v));
        ComputeBezier(far, std::min(v, 3), pts);
    }
    EXPECT_EQ(pts[0].x, INT_MIN);
}

// Brushes on pictures of no columns (the registry's contracts pin the tools
// that report 1 for them), and a tint that cannot tint.
TEST(Hostile, RetouchEmptySizes) {
    pxtest::Owned pic = pxtest::random_image(9, 7, 24, 3), plane = pxtest::random_image(9, 7, 8, 4);
    Image flat = pxtest::reshaped(pic.get(), 0, 7);
    // A clone or lightening brush on an empty picture releases the cache it
    // cannot rebuild; a cache of the picture's size and level is used as it is.
    Image *cache = pxtest::make(4, 4, 24).release();
    EXPECT_EQ(PX_Mimic(&flat, 0, 0, nullptr, 0, 0, 1, 1, 1, 0, &cache), 0);
    EXPECT_EQ(cache, nullptr);
    Image kept = flat;
    kept.bits = nullptr;
    kept.tag = 40;
    Image *keptPtr = &kept;
    EXPECT_EQ(alg_QuHeiYanQuan(&flat, 0, 0, 2, 40, &keptPtr, 1), 1);
    EXPECT_EQ(keptPtr, &kept);
    // The whole-picture tint prepares its slot even for a picture it cannot tint.
    pxtest::Slot gray;
    EXPECT_EQ(alg_Img_Blending(plane.get(), &gray), 0);
    EXPECT_EQ(picture_bytes(gray.get()), picture_bytes(pxtest::make(9, 7, 8).get()));
}
