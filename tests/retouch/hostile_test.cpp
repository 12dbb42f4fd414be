// Hostile input for every retouching function.
#include <climits>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

const std::vector<int32_t> any = {8, 16, 24, 32, 0, 1, 4, 12, 48}, rgb = {24, 32};
const int32_t xs[] = {0, 4, -9, INT_MAX}, ys[] = {3, INT_MIN, 2, 6};

// Functions changing their picture, with an optional slot or none, and
// functions returning nothing (failure kNoResult).
Contract<Image> no_slot(const char *name, std::vector<int32_t> formats, int64_t (*f)(C &), int64_t failure = 0) {
    return {name, formats, f, failure, 1, {}, false};
}
// An entry that works on the named degenerate records instead of refusing them.
Contract<Image> accepting(Contract<Image> c, std::vector<std::string> names) {
    c.accepts = std::move(names);
    return c;
}
const std::vector<std::string> kNoPixels = {"null pixels"};
// Pastes of a second picture of any size and bit count.
Contract<Image> paste(const char *name, int32_t (*f)(Image *, Image *, int32_t)) {
    return {name, any, [f](C &c) -> int64_t { return f(c.a, c.b, c.p); }, 0, 2, {}, false};
}

} // namespace

TEST(Hostile, Retouching) {
    // The smoothing leaves its prepared result in the slot when it fails for
    // want of memory; a source without pixels reads as 0 and gets a result.
    Contract<Image> spots{"alg_Img_smooth_1", any, [](C &c) { return alg_Img_smooth_1(c.a, c.slot); }},
        lightened{"alg_Img_smooth", any, [](C &c) { return alg_Img_smooth(c.a, c.slot), 0; }, kNoResult},
        skin{"alg_Img_Skin", any, [](C &c) { return alg_Img_Skin(c.a, c.slot, c.p); }, 1},
        smile{"SmileDetect", any, [](C &c) { return SmileDetect(c.a, c.slot, c.p); }, 1},
        tinted = no_slot("alg_Img_Blending", rgb, [](C &c) -> int64_t { return alg_Img_Blending(c.a, c.slot); });
    for (auto *c : {&spots, &lightened, &skin, &tinted})
        c->keeps_result_on_failure = true;
    smile.falls_back_on_failure = true; // the slot is prepared before the mask
    // Every picture it cannot tint still gets a prepared result slot.
    tinted.accepts = {"null pixels", "bit count 0",  "bit count 1",  "bit count 4",
                      "bit count 8", "bit count 12", "bit count 16", "bit count 48"};
    const std::vector<std::string> empty = {"zero width", "negative height", "INT_MIN width"},
                                   pasteAccepts = {"null pixels",
                                                   "zero width",
                                                   "negative height",
                                                   "INT_MIN width",
                                                   "second: null pixels",
                                                   "second: zero width",
                                                   "second: negative height",
                                                   "second: INT_MIN width",
                                                   "second: pitch below a row",
                                                   "second: zero pitch"};
    std::vector<std::string> noPixelsOrRows = empty;
    noPixelsOrRows.push_back("null pixels");
    check_contracts<Image>({
        accepting(spots, kNoPixels),
        accepting(lightened, kNoPixels),
        accepting(skin, kNoPixels),
        {"CreateFaceMaskImg", any, [](C &c) { return CreateFaceMaskImg(c.a, c.slot); }},
        accepting(smile, kNoPixels),
        accepting({"MoreLight", any, [](C &c) { return MoreLight(c.a, c.p, c.slot), 0; }, kNoResult}, kNoPixels),
        accepting(
            {"ImageAutoGradationProcess", any, [](C &c) { return ImageAutoGradationProcess(c.a, c.slot, c.p); }, 1},
            kNoPixels),
        accepting({"ImageAutoGradationProcess1", any,
                   [](C &c) { return ImageAutoGradationProcess1(c.a, c.slot, c.p, c.p), 0; }, kNoResult},
                  kNoPixels),
        {"ImageExposure", any, [](C &c) { return ImageExposure(c.a, c.slot, c.p); }},
        accepting(
            {"thresholdBlur", any, [](C &c) { return thresholdBlur(c.p, c.p, c.p, c.p, c.a, c.slot), 0; }, kNoResult},
            kNoPixels),
        {"PX_Mimic", any, [](C &c) { return PX_Mimic(c.a, c.p, c.p, nullptr, 0, 0, c.p, c.p, c.p, 1, c.slot); }},
        accepting(no_slot("LightUP", any, [](C &c) -> int64_t { return LightUP(c.a); }), noPixelsOrRows),
        accepting(no_slot("Best_Color", {8}, [](C &c) -> int64_t { return Best_Color(c.a, c.p); }), empty),
        no_slot("MyOneKeyFliter", {8}, [](C &c) -> int64_t { return MyOneKeyFliter(c.a, c.slot); }),
        no_slot("MyOneKeyFliter in place", {8}, [](C &c) -> int64_t { return MyOneKeyFliter(c.a, nullptr); }),
        accepting(paste("PointArea_Copy", [](auto a, auto b, int32_t p) { return PointArea_Copy(a, b, p, p, p); }),
                  pasteAccepts),
        accepting(paste("PointArea_Copy_Alph",
                        [](auto a, auto b, int32_t p) { return PointArea_Copy_Alph(a, b, p, p, p, p); }),
                  pasteAccepts),
        no_slot("alg_Blending", rgb,
                [](C &c) -> int64_t {
                    return alg_Blending(c.a, nullptr, c.p, c.p, {201, 90, 30}, c.p, c.slot);
                }),
        tinted,
        no_slot("alg_Img_Blending in place", rgb, [](C &c) -> int64_t { return alg_Img_Blending(c.a, nullptr); }),
        no_slot("alg_smooth", rgb, [](C &c) -> int64_t { return alg_smooth(c.a, 0, c.p, c.p, c.p, c.p, c.slot); }),
        no_slot("alg_QuHeiYanQuan", rgb,
                [](C &c) -> int64_t { return alg_QuHeiYanQuan(c.a, c.p, c.p, c.p, c.p, c.slot, 1); }),
        no_slot("alg_QuHeiYanQuan_1", rgb,
                [](C &c) -> int64_t { return alg_QuHeiYanQuan_1(c.a, xs, ys, 4, c.p, c.p); }),
        no_slot("EyesEnlarge", any, [](C &c) -> int64_t { return EyesEnlarge(c.a); }),
        no_slot(
            "alg_Img_Eradicate", any, [](C &c) -> int64_t { return alg_Img_Eradicate(c.a, c.p, c.p, c.p), 0; },
            kNoResult),
        no_slot(
            "alg_Img_EyesEnlarge", any,
            [](C &c) -> int64_t {
                alg_Img_EyesEnlarge_ellipse(c.a, c.p, 3, c.p);
                alg_Img_EyesEnlarge_circle(c.a, 3, c.p, c.p);
                return alg_Img_EyesEnlarge(c.a, c.p, c.p, c.p, c.p), 0;
            },
            kNoResult),
        no_slot(
            "alg_Img_EyesMoreContrast_ellipse", any,
            [](C &c) -> int64_t { return alg_Img_EyesMoreContrast_ellipse(c.a, c.p, 3, c.p, c.p), 0; }, kNoResult),
        no_slot(
            "alg_Img_quheiyanquan_ellipse", any,
            [](C &c) -> int64_t { return alg_Img_quheiyanquan_ellipse(c.a, c.p, c.p, c.p), 0; }, kNoResult),
    });
}

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

// A source without a pixel block reads as 0, so every tool that prepares a
// slot from it makes what it makes of an all-zero block of that size; the
// skin mask alone is not made (the slot stays a new, white image).
TEST(Hostile, RetouchSourcesWithoutPixels) {
    using Tool = std::function<int64_t(const Image *, Image **)>;
    const std::pair<const char *, Tool> tools[] = {
        {"alg_Img_smooth_1", [](auto s, auto d) { return alg_Img_smooth_1(s, d); }},
        {"alg_Img_smooth", [](auto s, auto d) { return alg_Img_smooth(s, d), 0; }},
        {"alg_Img_Skin", [](auto s, auto d) { return alg_Img_Skin(s, d, 1); }},
        {"MoreLight", [](auto s, auto d) { return MoreLight(s, 3, d), 0; }},
        {"ImageAutoGradationProcess", [](auto s, auto d) { return ImageAutoGradationProcess(s, d, 60); }},
        {"ImageAutoGradationProcess1", [](auto s, auto d) { return ImageAutoGradationProcess1(s, d, 0, 1), 0; }},
        {"thresholdBlur", [](auto s, auto d) { return thresholdBlur(0, 0, 3, 70, s, d), 0; }},
    };
    for (int32_t bc : pxtest::kBitCounts) {
        pxtest::Owned zeros = pxtest::make(9, 7, bc);
        std::fill(zeros->bits, zeros->bits + zeros->pitch * 7, 0);
        Image hollow = *zeros;
        hollow.bits = nullptr;
        for (const auto &[name, tool] : tools) {
            pxtest::Slot fromHollow, fromZeros;
            ASSERT_EQ(tool(&hollow, &fromHollow), tool(zeros.get(), &fromZeros)) << name << " " << bc;
            ASSERT_NE(fromHollow.get(), nullptr) << name << " " << bc;
            EXPECT_EQ(picture_bytes(fromHollow.get()), picture_bytes(fromZeros.get())) << name << " " << bc;
        }
        pxtest::Slot mask;
        ASSERT_EQ(SmileDetect(&hollow, &mask, 0), 1);
        EXPECT_EQ(picture_bytes(mask.get()), picture_bytes(pxtest::make(9, 7, bc).get())) << bc;
        EXPECT_EQ(LightUP(&hollow), 1);
    }
}

// Empty sizes run no pixel loop: the slot rule still replaces a mismatching
// image (malloc_Image gives none for the empty size), the in-place tools
// succeed, and the tools that always report 1 do so also for null arguments.
TEST(Hostile, RetouchEmptySizes) {
    pxtest::Owned pic = pxtest::random_image(9, 7, 24, 3);
    Image flat = *pic;
    flat.width = 0;
    for (auto tool : {+[](const Image *s, Image **d) { return SmileDetect(s, d, 0); },
                      +[](const Image *s, Image **d) { return ImageAutoGradationProcess(s, d, 50); },
                      +[](const Image *s, Image **d) { return alg_Img_Skin(s, d, 0); }}) {
        Image *slot = pxtest::make(4, 4, 24).release();
        EXPECT_EQ(tool(&flat, &slot), 1);
        EXPECT_EQ(slot, nullptr);
        EXPECT_EQ(tool(nullptr, &slot) + tool(pic.get(), nullptr), 2);
    }
    Image *slot = pxtest::make(4, 4, 24).release();
    EXPECT_EQ(alg_Img_smooth_1(&flat, &slot), 0); // the spot map of no pixels cannot be made
    EXPECT_EQ(slot, nullptr);
    pxtest::Owned plane = pxtest::random_image(9, 7, 8, 4);
    Image noRows = *plane;
    noRows.height = -1;
    EXPECT_EQ(Best_Color(&noRows, 3) + LightUP(&noRows) + PointArea_Copy(&noRows, pic.get(), 2, 2, 3), 3);
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
