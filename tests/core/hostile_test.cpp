// Hostile input beyond the registry's contracts: record creation, memory
// wrappers and integer math at their extremes.
#include "support/hostile.hpp"

using namespace pxtest::hostile;

TEST(Hostile, RecordsMemoryAndMath) {
    const int32_t ws[] = {0, 5, -5, 5, 100000, INT_MAX, INT_MAX, INT_MIN},
                  hs[] = {5, 0, 5, INT_MIN, 100000, 1, INT_MAX, 1};
    for (int32_t bc : {8, 32, INT_MIN})
        for (int i = 0; i < 8; ++i)
            EXPECT_EQ(malloc_Image(ws[i], hs[i], bc), nullptr) << ws[i] << "x" << hs[i] << "@" << bc;
    Image *none = nullptr;
    free_Image(nullptr, 0);
    free_Image(&none, 1);
    EXPECT_EQ(PX_malloc(0), nullptr);
    PX_free(nullptr);
    EXPECT_EQ(PX_memcpy(nullptr, nullptr, 0), nullptr);
    EXPECT_EQ(PX_memset(nullptr, 0, 0), nullptr);
    char text[] = "abcd";
    EXPECT_EQ(PX_memcpy(text, nullptr, 4), text);
    EXPECT_EQ(PX_memcpy(text, "xy", 0), text);
    EXPECT_EQ(PX_memset(text, 'z', 0), text);
    EXPECT_STREQ(text, "abcd");
    EXPECT_EQ(PX_memcpy(text, "xy", 2), text);
    EXPECT_EQ(PX_memset(text + 3, 0x100 + 'w', 1), text + 3); // the value's low byte
    EXPECT_STREQ(text, "xycw");
    for (int32_t v : kExtremes) {
        EXPECT_LE(xxgluSqrtFx(uint32_t(v)), 65536u);
        EXPECT_EQ(ltouc(v), std::clamp(v, 0, 255));
        EXPECT_LE(std::abs(int64_t(tsin(v))) + std::abs(int64_t(tcos(v))), 141422) << v;
        const int64_t r = PX_rand(v);
        EXPECT_TRUE(v == 0 ? r > -(int64_t(1) << 31) : std::abs(r) < std::abs(int64_t(v))) << v << ": " << r;
        for (int32_t u : kExtremes) {
            (void)Distance2D(v, u);
            (void)FastDistance2D(v, u);
            const int32_t angle = tatan2(v, u);
            EXPECT_TRUE(angle >= 0 && angle <= 360) << v << "," << u << ": " << angle;
        }
    }
}
