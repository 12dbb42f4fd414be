// Integer math: square root, distances, table trigonometry, random sign rule,
// multiply-shift division.
#include "core/internal/math.hpp"
#include "support/test_images.hpp"

namespace {

// No integer lies within 1e-6 of a half-integer root, so double rounding is exact.
uint32_t rounded_root(uint32_t x) { return static_cast<uint32_t>(std::lround(std::sqrt(static_cast<double>(x)))); }

// tatan2 by its definition: nearest sine-table entry to |y| / r, by quadrant.
int32_t reference_atan2(int32_t y, int32_t x) {
    if (x == 0) return y >= 0 ? 90 : 270;
    if (y == 0) return x > 0 ? 0 : 180;
    const uint32_t r = rounded_root(static_cast<uint32_t>(y * y + x * x));
    const int64_t s = static_cast<int64_t>(std::abs(y)) * 100000 / r;
    int32_t k = 0;
    for (int32_t i = 1; i <= 90; ++i)
        if (std::llabs(tsin(i) - s) < std::llabs(tsin(k) - s)) k = i;
    if (y > 0) return x > 0 ? k : 180 - k;
    return x < 0 ? 180 + k : 360 - k;
}

} // namespace

TEST(IntegerMath, RootRoundsToNearest) {
    EXPECT_EQ(xxgluSqrtFx(4294967295u), 65536u);
    std::mt19937 rng(11);
    for (uint32_t x = 0; x < 200000; ++x) {
        ASSERT_EQ(xxgluSqrtFx(x), rounded_root(x)) << x;
        const uint32_t big = rng();
        ASSERT_EQ(xxgluSqrtFx(big), rounded_root(big)) << big;
    }
}

TEST(IntegerMath, Distances) {
    EXPECT_EQ(Distance2D(-3, -4), 5u);
    EXPECT_EQ(Distance2D(65536, 0), 0u); // the squared length wraps modulo 2^32
    EXPECT_EQ(FastDistance2D(3, 4), 6);
    EXPECT_EQ(FastDistance2D(-100, 0), 100);
    EXPECT_EQ(FastDistance2D(100, -100), 200 - 50 - 25 + 6);
}

TEST(IntegerMath, TableTrigonometry) {
    for (int32_t a = -1080; a <= 1080; ++a) {
        EXPECT_EQ(tsin(a), std::lround(std::sin(a * M_PI / 180.0) * 100000)) << a;
        EXPECT_EQ(tcos(a), std::lround(std::cos(a * M_PI / 180.0) * 100000)) << a;
    }
    EXPECT_EQ(tsin(INT32_MIN), tsin(INT32_MIN % 360 + 360));
    EXPECT_EQ(tatan2(1, 1), 90); // rounded root of 2 is 1
    EXPECT_EQ(tatan2(-1, 1000), 360);
    for (int32_t y = -1000; y <= 1000; y += std::abs(y) < 25 ? 1 : 37)
        for (int32_t x = -1000; x <= 1000; x += std::abs(x) < 25 ? 1 : 29)
            ASSERT_EQ(tatan2(y, x), reference_atan2(y, x)) << y << "," << x;
}

TEST(IntegerMath, RandomSignRuleOverTheLibcStream) {
    unsigned short state[3] = {0x330E, 1234, 0}; // the stream srand48(1234) starts
    srand48(1234);
    for (int i = 0; i < 900; ++i) {
        const int32_t n = i % 9 - 2;
        const long r = n == 0 ? nrand48(state) : nrand48(state) % n;
        ASSERT_EQ(PX_rand(n), (nrand48(state) & 1) ? r : -r) << i;
    }
}

// The multiply-shift divisions are exact over the ranges they are used on;
// a quotient goes wrong first just below a multiple of the divisor.
TEST(IntegerMath, MultiplyShiftDivisionsAreExact) {
    for (uint32_t n = 2; n <= 129; ++n) {
        const pxfx::ByteSumDivisor d = pxfx::byte_sum_divisor(n);
        for (uint32_t s = 0; s <= 255 * n; ++s)
            ASSERT_EQ(((s * d.m) >> 16) >> d.p, s / n) << s << " / " << n;
    }
    for (uint32_t n = 1; n <= 4096; ++n) {
        const pxfx::ExactDivisor d = pxfx::exact_divisor(n);
        for (uint32_t q = 1; q <= 255; ++q)
            ASSERT_TRUE(d.divide(q * n - 1) == q - 1 && d.divide(q * n) == q) << q << " * " << n;
    }
}
