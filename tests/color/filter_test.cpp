// Kernel convolution and box smoothing against a straightforward accessor
// version on random pictures of every format.
#include "color/box_filter.hpp"

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

struct Params {
    std::vector<int32_t> kernel;
    int32_t size, divisor, offset, gray;
};

const int32_t kSizes[][2] = {{1, 1}, {1, 7}, {7, 1}, {2, 3}, {5, 4}, {13, 9}};

// Mask byte y * pitch + x of the mask's block (past a row's end, the next
// row's) is 0; bytes beyond the block, or of a mask without one, are set.
bool masked_out(const Image *m, int32_t x, int32_t y) {
    const size_t at = size_t(y) * m->pitch + size_t(x);
    return m->bits && m->height > 0 && at < size_t(m->pitch) * size_t(m->height) && m->bits[at] == 0;
}

// Filter into d, pixel by pixel with the accessors (32-bit wrapping sums);
// 8-bit pictures as one channel with a mask, colour ones with the grey mix;
// box smoothing filters the alpha byte too.
void reference_filter(const Image *src, const Params &p, const Image *mask, Image *d, bool box = false) {
    int32_t w = d->width, h = d->height;
    if (mask && mask->bitCount == 8) w = std::min(w, mask->width), h = std::min(h, mask->height);
    const int32_t half = p.size / 2, last = p.size - half - 1, gray = d->bitCount == 8;
    for (int32_t y = 0; y < h && d->bitCount != 16; ++y)
        for (int32_t x = 0; x < w; ++x) {
            if (gray && mask && masked_out(mask, x, y)) {
                SetPixelIndex(d, x, y, GetPixelIndex(src, x, y));
                continue;
            }
            uint32_t s[4] = {0, 0, 0, 0}, c = GetPixelColor(d, x, y); // no taps: alpha kept
            for (int dy = -half; dy <= last; ++dy)
                for (int dx = -half; dx <= last; ++dx) {
                    c = gray ? GetPixelIndex(src, x + dx, y + dy) : GetPixelColor(src, x + dx, y + dy);
                    for (int i = 0; i < 3 + box; ++i)
                        s[i] += uint32_t(p.kernel[size_t((dy + half) * p.size + dx + half)]) * ((c >> (8 * i)) & 255);
                }
            const int64_t div = gray && p.divisor == 0 ? 1 : p.divisor; // the sums are signed
            for (uint32_t &v : s)
                v = uint32_t(std::clamp<int64_t>((div ? int32_t(v) / div : int32_t(v)) + p.offset, 0, 255));
            if (gray) SetPixelIndex(d, x, y, int32_t(s[0]));
            if (!gray && p.gray >= 1) s[0] = s[1] = s[2] = (s[0] + 2 * s[1] + s[2]) >> 2;
            if (!gray) SetPixelColor(d, x, y, s[0] | s[1] << 8 | s[2] << 16 | (box ? s[3] << 24 : c & 0xFF000000u));
        }
}

Params random_params(std::mt19937 &rng, int32_t size) {
    const int32_t divisors[] = {0, 1, 9, -3}, huge[] = {INT32_MIN, INT32_MAX, 0x40000000}; // huge: sums wrap
    Params p{{}, size, divisors[rng() % 4], int32_t(rng() % 60) - 20, int32_t(rng() % 3) - 1};
    for (int32_t i = 0; i < size * size; ++i)
        p.kernel.push_back(rng() % 3 == 0 ? 0 : rng() % 30 == 0 ? huge[rng() % 3] : int32_t(rng() % 21) - 8);
    return p;
}

int32_t run(Image *src, const Params &p, const Image *mask, Image *dst) {
    return Filter(src, p.kernel.empty() ? nullptr : p.kernel.data(), p.size, p.divisor, p.offset, mask, dst, p.gray);
}

// In place: the working image (white where nothing is written) is copied over the picture.
Owned in_place(const Image *src, const Params &p, const Image *mask, bool box = false) {
    Owned work = make(src->width, src->height, int32_t(src->bitCount)), out = clone(src);
    reference_filter(src, p, mask, work.get(), box);
    PX_Img_Copy(out.get(), work.get());
    return out;
}

Owned reference_box(const Image *src, int32_t size, int32_t offset) {
    return in_place(src, {std::vector<int32_t>(size_t(size) * size, 1), size, size * size, offset, 0}, nullptr, true);
}

} // namespace

TEST(Filter, MatchesAccessorVersionAliasingAndRefusals) {
    std::mt19937 rng(5);
    uint32_t seed = 1;
    for (int32_t sbc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int32_t size : {0, 1, 2, 3, 4, 5, 9}) { // size 0: no taps, the clamped offset
                const Params p = random_params(rng, size);
                Owned src = random_image(w, h, sbc, seed++);
                SCOPED_TRACE(std::to_string(sbc) + " bits " + std::to_string(w) + "x" + std::to_string(h));
                // Into a destination of every format, and of a larger size.
                for (int32_t dbc : kBitCounts) {
                    Owned dst = random_image(w + (dbc == sbc) * 3, h + (dbc == sbc), dbc, seed++),
                          want = clone(dst.get());
                    reference_filter(src.get(), p, nullptr, want.get());
                    ASSERT_EQ(run(src.get(), p, nullptr, dst.get()), 1);
                    ASSERT_EQ(diff(dst.get(), want.get()), "") << "to " << dbc << " bits, k" << size;
                }
                // In place, with masks: the working image (white outside the mask area) is copied back.
                const int32_t maskBits = int32_t(size % 3) * 8; // none, 8 or 16 bits
                Owned mask = maskBits ? random_image(w / 2 + 1, h + 1, maskBits, seed++) : nullptr;
                if (mask) std::fill(mask->bits, mask->bits + 3, uint8_t(0));
                Owned want = in_place(src.get(), p, mask.get());
                ASSERT_EQ(run(src.get(), p, mask.get(), nullptr), 1);
                ASSERT_EQ(diff(src.get(), want.get()), "") << "in place, mask " << maskBits << ", k" << size;
            }
    // Rows longer than one accumulation pass (1024 pixels): the box and a
    // weighted kernel (16-bit sums finished by a reciprocal), random ones.
    for (int32_t bc : {8, 24, 32})
        for (const Params &p :
             {Params{std::vector<int32_t>(9, 1), 3, 9, 0, 0}, Params{{1, 2, 1, 2, 5, 2, 1, 2, 1}, 3, 13, 0, 0},
              random_params(rng, 3), random_params(rng, 5)}) {
            Owned src = random_image(2100, 2, bc, seed++), dst = make(2100, 2, bc), want = make(2100, 2, bc);
            reference_filter(src.get(), p, nullptr, want.get());
            ASSERT_EQ(run(src.get(), p, nullptr, dst.get()), 1);
            ASSERT_EQ(diff(dst.get(), want.get()), "") << bc << " bits, long rows, k" << p.size;
        }
    // A destination sharing the source's pixels is filtered from a snapshot.
    const Params upLeft{{1, 0, 0, 0, 0, 0, 0, 0, 0}, 3, 1, 0, 0};
    Owned same = random_image(6, 5, 8, 4), shifted = make(6, 5, 8);
    reference_filter(same.get(), upLeft, nullptr, shifted.get());
    ASSERT_EQ(run(same.get(), upLeft, nullptr, same.get()), 1);
    EXPECT_EQ(diff(same.get(), shifted.get()), "");
    EXPECT_EQ(run(same.get(), {{}, 3, 1, 0, 0}, nullptr, nullptr) +
                  run(same.get(), {{1}, 50000, 1, 0, 0}, nullptr, nullptr),
              0);
}

// Sources of an empty size read as 0. An 8-bit mask limits the area to its
// size, also without pixels or of an empty size; for an 8-bit result every
// mask selects by its bytes (see masked_out). The kernel is read only where a
// pixel is filtered.
TEST(Filter, DegenerateSourcesMasksAndKernels) {
    std::vector<uint8_t> bytes(28 * 7);
    for (size_t i = 0; i < bytes.size(); ++i)
        bytes[i] = uint8_t(i % 3);
    Image emptyW{0, 7, 24, bytes.data(), 28, 0}, emptyH{9, -7, 24, bytes.data(), 28, 0};
    const Image hollowMask{4, 3, 8, nullptr, 4, 0}, flatMask{0, 5, 8, bytes.data(), 4, 0},
        narrowMask{2, 2, 16, bytes.data(), 4, 0}; // claims 8 bytes: rows 0 and 1 of a 6-wide result
    Owned src = random_image(9, 7, 24, 3);
    const Params p{{1, 2, 1, 2, 4, 2, 1, 2, 1}, 3, 16, 40, 0}, none{{}, 0, 1, 7, 0};
    const struct {
        Image *src;
        const Params &p;
        const Image *mask;
    } cases[] = {{&emptyW, p, nullptr},       {&emptyH, p, nullptr},     {&emptyW, none, nullptr},
                 {src.get(), p, &hollowMask}, {src.get(), p, &flatMask}, {src.get(), p, &narrowMask},
                 {&emptyH, p, &narrowMask}};
    uint32_t seed = 30;
    for (const auto &c : cases)
        for (int32_t dbc : {8, 24, 32}) {
            Owned dst = random_image(6, 5, dbc, seed++), want = clone(dst.get());
            reference_filter(c.src, c.p, c.mask, want.get());
            ASSERT_EQ(run(c.src, c.p, c.mask, dst.get()), 1) << seed;
            EXPECT_EQ(diff(dst.get(), want.get()), "") << seed;
        }
    // Nothing filtered in place: the white working image comes back whole.
    ASSERT_EQ(run(src.get(), p, &flatMask, nullptr), 1);
    EXPECT_TRUE(std::all_of(src->bits, src->bits + 28 * 7, [](uint8_t v) { return v == 255; }));
    const Image noPixels{9, 7, 24, nullptr, 28, 0};
    Owned dst = make(6, 5, 24);
    EXPECT_EQ(run(&emptyW, p, nullptr, nullptr) + run(const_cast<Image *>(&noPixels), p, nullptr, dst.get()), 0);
    EXPECT_EQ(Filter(src.get(), nullptr, 3, 1, 0, &flatMask, dst.get(), 0) +
                  Filter(src.get(), nullptr, 3, 1, 0, nullptr, make(6, 5, 16).get(), 0),
              2);
    EXPECT_EQ(Filter(src.get(), nullptr, 3, 1, 0, nullptr, dst.get(), 0), 0);
}

// The exported Gaussian table, read by apps: its bytes as generated.
TEST(MatrixX, ExportedTableKeepsItsBytes) {
    const auto *b = reinterpret_cast<const uint8_t *>(matrixX);
    uint64_t h = 1469598103934665603ull;
    for (size_t i = 0; i < sizeof matrixX; ++i)
        h = (h ^ b[i]) * 1099511628211ull;
    EXPECT_EQ(h, 0xb40cf590fb255a2aull);
}

TEST(FilterFast, MatchesFullBoxSumsAndRefusesBadSizesAsDoesSmooth) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int32_t size : {1, 2, 3, 4, 5, 8, 15}) {
                const int32_t offset = int32_t(seed % 3) * 25 - 25;
                Owned img = random_image(w, h, bc, seed++), want = reference_box(img.get(), size, offset);
                ASSERT_EQ(Filter_fast(img.get(), size, offset), 1);
                ASSERT_EQ(diff(img.get(), want.get()), "") << bc << " " << w << "x" << h << " size " << size;
            }
    // Large sizes (64-bit sums above 2901): the running sums against full sums.
    for (int32_t bc : {8, 24, 32})
        for (int32_t size : {31, 2901, 2902, 100000}) {
            Owned a = random_image(9, 7, bc, seed++), b = clone(a.get());
            ASSERT_EQ(pxfx::box_filter(a.get(), size, 3, true) + pxfx::box_filter(b.get(), size, 3, false), 2);
            EXPECT_EQ(diff(a.get(), b.get()), "") << bc << " size " << size;
        }
    Owned ramp = make(2, 1, 8); // 0 then 255
    ramp->bits[0] = 0;
    ASSERT_EQ(Filter_fast(ramp.get(), 4000, 0), 1); // columns -2000..1999: 1999 read 255
    EXPECT_EQ(ramp->bits[0], 255 * 1999 / 4000);
    Owned img = random_image(6, 5, 24, 3), before = clone(img.get());
    for (int32_t size : {0, INT32_MIN, pxfx::kMaxBoxSize + 1})
        EXPECT_EQ(Filter_fast(img.get(), size, 0), 0);
    EXPECT_EQ(diff(img.get(), before.get()), "");
    // A negative size sums empty boxes: every channel is the offset, clamped.
    ASSERT_EQ(Filter_fast(img.get(), -3, 77), 1);
    EXPECT_EQ(diff(img.get(), filled(6, 5, 24, 0x4D4D4D).get()), "");
    // The result is copied back as PX_Img_Copy copies the white working
    // image: with malloc_Image's pitch the whole block, padding made 255;
    // with another pitch the pixels only, a 32-bit image keeping its alpha.
    // Every path: in place with the kept rows, full sums, PX_IMG_Smooth in place
    // and into a new result, negative sizes, and the white 16-bit result.
    const std::function<int32_t(Image *, Slot &)> paths[] = {
        [](Image *im, Slot &) { return Filter_fast(im, 3, 0); },
        [](Image *im, Slot &) { return pxfx::box_filter(im, 3, 0, false); },
        [](Image *im, Slot &) { return PX_IMG_Smooth(im, nullptr, 30); },
        [](Image *im, Slot &out) { return PX_IMG_Smooth(im, &out, 30); },
        [](Image *im, Slot &) { return Filter_fast(im, -2, 9); }};
    for (int32_t bc : kBitCounts)
        for (const auto &path : paths) {
            Owned padded = random_image(5, 3, bc, seed++); // 8, 16, 24 bits: 3, 2, 1 padding bytes a row
            Slot out;
            ASSERT_EQ(path(padded.get(), out), 1);
            const Image *im = out.get() ? out.get() : padded.get();
            for (uint32_t y = 0, used = 5 * im->bitCount / 8; y < 3; ++y)
                for (uint32_t i = used; i < im->pitch; ++i)
                    EXPECT_EQ(im->bits[im->pitch * y + i], 255) << bc << " bits, row " << y;
        }
    Owned wide = random_image(4, 3, 32, 5), wideBefore = clone(wide.get());
    Image loose = *wide; // rows of 16 bytes read as three pixels: a pitch malloc_Image would not give
    loose.width = 3, loose.pitch = 16;
    Owned fresh = make(3, 3, 32), smoothed;
    for (int32_t y = 0; y < 3; ++y)
        std::memcpy(fresh->bits + 12 * y, wide->bits + 16 * y, 12);
    smoothed = reference_box(fresh.get(), 2, 9);
    ASSERT_EQ(Filter_fast(&loose, 2, 9), 1);
    for (int32_t y = 0; y < 3; ++y)
        for (int32_t i = 0; i < 16; ++i) {
            const uint8_t got = wide->bits[16 * y + i], old = wideBefore->bits[16 * y + i];
            EXPECT_EQ(got, i >= 12 || i % 4 == 3 ? old : smoothed->bits[12 * y + i]) << y << " " << i;
        }
    // PX_IMG_Smooth: a box of min(strength, 100) / 10, slots and in place.
    Owned src = random_image(9, 8, 32, 5), want = reference_box(src.get(), 10, 0);
    Slot out, gray;
    Image *kept = gray.image = malloc_Image(3, 3, 8); // an existing result is used as it stands
    ASSERT_EQ(PX_IMG_Smooth(src.get(), &out, 5) + PX_IMG_Smooth(src.get(), &gray, 30), 2);
    EXPECT_EQ(diff(out.get(), src.get()), ""); // size 0: a plain copy
    EXPECT_EQ(gray.get(), kept);
    ASSERT_EQ(PX_IMG_Smooth(src.get(), nullptr, 150), 1); // in place
    EXPECT_EQ(diff(src.get(), want.get()), "");
    // A source of an empty size: smoothed in place it is left as it is (1); a
    // new result of its size cannot be made (0).
    Image empty = reshaped(src.get(), 0, 8), *none = nullptr;
    EXPECT_EQ(PX_IMG_Smooth(&empty, nullptr, 50) + PX_IMG_Smooth(&empty, &none, 50) + Filter_fast(&empty, 3, 0), 1);
    EXPECT_EQ(none, nullptr);
    EXPECT_EQ(diff(src.get(), want.get()), "");
}
