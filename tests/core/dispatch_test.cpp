// Every kernel that has vector code gives the same bytes on every path: the
// plain loops, the best 16-byte target and the best target the processor
// has. The byte tables run at every pixel count around the vector sizes, the
// exported functions over the other kernels on random pictures of every bit
// count they take. Where the processor lacks a target the path falls back,
// and the runs compare equal copies.
#include "core/internal/byte_map.hpp"
#include "core/internal/cpu.hpp"
#include "core/internal/vector_kernels.hpp"
#include "toolkit/px_images.hpp"

using pxfx::cpu::Path;
using pxtest::Owned;
using testing::Message;

namespace {

constexpr Path kPaths[] = {Path::kPlain, Path::k128, Path::kBest};

// make() on each path in kPaths order; the path is left as it was.
template <class Make> auto on_every_path(Make make) {
    const Path was = pxfx::cpu::set_path(Path::kPlain);
    std::vector<decltype(make())> out;
    for (Path p : kPaths) {
        pxfx::cpu::set_path(p);
        out.push_back(make());
    }
    pxfx::cpu::set_path(was);
    return out;
}

// How a run differs from the plain one (empty when it does not): pictures by
// their pixels, lists and pairs part by part, anything else by ==.
std::string differs(const Owned &a, const Owned &b) { return pxtest::diff(a.get(), b.get()); }
template <class T> std::string differs(const T &a, const T &b) { return a == b ? "" : "other values"; }
template <class T> std::string differs(const std::vector<T> &a, const std::vector<T> &b) {
    for (size_t i = 0; i < a.size() && i < b.size(); ++i)
        if (std::string d = differs(a[i], b[i]); !d.empty()) return "item " + std::to_string(i) + ": " + d;
    return a.size() == b.size() ? "" : "other counts";
}
template <class A, class B> std::string differs(const std::pair<A, B> &a, const std::pair<A, B> &b) {
    return differs(a.first, b.first) + differs(a.second, b.second);
}

// make() gives on every path what it gives on the plain one.
template <class Make> void expect_same_on_every_path(const testing::Message &what, Make make) {
    const auto runs = on_every_path(make);
    for (size_t p = 1; p < runs.size(); ++p)
        EXPECT_EQ(differs(runs[p], runs[0]), "") << what << ", path " << p;
}

} // namespace

TEST(Dispatch, PathsNameTheirTargets) {
    const auto names = on_every_path([] { return std::string(pxfx::cpu::target_name()); });
    EXPECT_EQ(names[0], "scalar");
#ifndef PXFX_PORTABLE_ONLY
#if defined(__aarch64__) || defined(__ARM_NEON)
    // Phones: the NEON code runs on both vector paths.
    EXPECT_EQ(names[1], "NEON");
    EXPECT_EQ(names[2], "NEON");
#elif defined(__x86_64__)
    if (names[1] != "scalar") {
        EXPECT_TRUE(names[1] == "SSSE3" || names[1] == "SSE4") << names[1];
    }
#endif
#endif
    std::printf("paths: %s, %s, %s\n", names[0].c_str(), names[1].c_str(), names[2].c_str());
}

TEST(Dispatch, ByteTablesMatchThePlainLoop) {
    std::mt19937 rng(5);
    std::vector<uint8_t> tables(4 * 256);
    for (auto &v : tables)
        v = static_cast<uint8_t>(rng());
    enum Kind { kMap, kRaise, kLower };
    // A map set up for many pixels builds pair tables where they pay (one
    // per channel pattern, or one shared by equal tables) and then maps
    // short runs and their tails with them.
    for (size_t setUpFor : {size_t{0}, size_t{1} << 21})
        for (bool shared : {false, true})
            for (int channels : {1, 3, 4})
                for (Kind kind : {kMap, kRaise, kLower})
                    for (size_t pixels : {0, 1, 15, 16, 17, 31, 32, 33, 63, 64, 65, 127, 128, 129, 200, 1000}) {
                        if (channels == 1 && kind != kMap) continue;
                        const uint8_t *t[4];
                        for (int k = 0; k < 4; ++k)
                            t[k] = &tables[shared ? 0 : 256 * k];
                        const pxfx::ToneTables tone{t[0], t[1], t[2], kind == kLower};
                        const size_t total = setUpFor != 0 ? setUpFor : pixels;
                        auto run = [&](const uint8_t *from, uint8_t *to) {
                            if (kind == kMap)
                                pxfx::ByteMap(channels, t, total, from == to)(from, to, pixels);
                            else
                                pxfx::ByteMap(channels, tone, total)(from, to, pixels);
                        };
                        // The byte past the pixels stays as it was; in place gives the same.
                        std::vector<uint8_t> in(pixels * channels + 1);
                        for (auto &v : in)
                            v = static_cast<uint8_t>(rng());
                        const auto runs = on_every_path([&] {
                            std::vector<uint8_t> out(in.size(), static_cast<uint8_t>(~in.back())), inPlace = in;
                            run(in.data(), out.data());
                            run(inPlace.data(), inPlace.data());
                            return std::pair(out, inPlace);
                        });
                        const std::string where = std::to_string(channels) + " channels, kind " + std::to_string(kind) +
                                                  ", " + std::to_string(pixels) + " pixels, set up for " +
                                                  std::to_string(total) + (shared ? ", shared tables" : "");
                        for (size_t p = 1; p < runs.size(); ++p)
                            EXPECT_EQ(runs[p], runs[0]) << where << ", path " << p;
                        const auto &[out, inPlace] = runs[0];
                        EXPECT_EQ(out.back(), static_cast<uint8_t>(~in.back())) << where;
                        EXPECT_TRUE(std::equal(out.begin(), out.end() - 1, inPlace.begin())) << where << " in place";
                    }
}

TEST(Dispatch, PictureKernelsMatchThePlainCode) {
    for (int32_t bits : pxtest::kBitCounts) {
        const Owned src = pxtest::random_image(131, 9, bits, static_cast<uint32_t>(bits));
        auto effect = [&](auto run) {
            expect_same_on_every_path(Message() << bits << " bits", [&] {
                Image *out = nullptr;
                run(src.get(), &out);
                return Owned(out);
            });
        };
        effect([](Image *s, Image **d) { PX_IMG_Alter(s, d, 40, -30, 90, 2); });
        effect([](Image *s, Image **d) { PX_IMG_WARM_YELLOW(s, d); });
        effect([](Image *s, Image **d) { PX_IMG_COLD_PUPRLE(s, d); });
    }
}

// The resize at factors below 1, above 1 and not whole (1/2, 3/2, a spread
// past the byte shuffles' 16 bytes), widths that leave partial groups and
// vectors, rows shorter than 16 bytes; and the plane interpolation at scales
// whose weights leave 0..1 (negative, and large enough to clamp).
TEST(Dispatch, ResizeMatchesThePlainLoops) {
    constexpr std::pair<int32_t, int32_t> kSources[] = {{131, 9}, {40, 30}, {5, 3}};
    constexpr std::pair<int32_t, int32_t> kTargets[] = {{97, 5}, {300, 20}, {1, 3}, {1000, 11}, {37, 2}};
    for (int32_t bits : {8, 16, 24})
        for (const auto &[sw, sh] : kSources) {
            const pxtest::PX src = pxtest::px_random(sw, sh, bits, static_cast<uint32_t>(bits + sw));
            std::vector<std::pair<int32_t, int32_t>> sizes(std::begin(kTargets), std::end(kTargets));
            sizes.insert(sizes.end(), {{sw / 2, sh / 2}, {sw * 3 / 2, sh * 3 / 2}, {sw + 3, sh - 1}});
            const auto runs = on_every_path([&] {
                std::vector<std::vector<uint8_t>> out;
                for (const auto &[w, h] : sizes) {
                    const pxtest::PX resized(PXImage_Resize(src.get(), w, h));
                    out.push_back(pxtest::bytes(resized.get()));
                }
                if (bits == 8)
                    for (float scale : {-1.5f, 0.37f, 3.0f}) {
                        std::vector<uint8_t> plane(77 * 13);
                        EXPECT_EQ(DualLinearIntepol_KWB(src->data, sw, sh, plane.data(), 77, 13, scale), 1);
                        out.push_back(plane);
                    }
                return out;
            });
            for (size_t p = 1; p < runs.size(); ++p)
                for (size_t i = 0; i < runs[0].size(); ++i)
                    EXPECT_EQ(runs[p][i], runs[0][i])
                        << bits << " bits, " << sw << " x " << sh << ", " << i << ", path " << p;
        }
}

// The 2x zoom at every width up to past two vector steps (whose last pixel
// is held) at 8, 16 and 24 bits, with and without a row below.
TEST(Dispatch, ZoomInMatchesThePlainLoop) {
    for (int32_t bits : {8, 16, 24})
        for (int32_t width = 1; width <= 40; ++width)
            for (int32_t height : {1, 3}) {
                const pxtest::PX src = pxtest::px_random(width, height, bits, static_cast<uint32_t>(bits * width));
                const auto runs = on_every_path([&] {
                    const pxtest::PX zoomed(PXImage_ZoomIn(src.get()));
                    return pxtest::bytes(zoomed.get());
                });
                for (size_t p = 1; p < runs.size(); ++p)
                    EXPECT_EQ(runs[p], runs[0]) << bits << " bits, " << width << " x " << height << ", path " << p;
            }
}

// The vertical blend of resize over the whole range its contract allows:
// weights beyond 0..1 (up to 2^20) under rows that differ, whose sums leave
// 0..255 both ways; the bytes are the low ones of the truncations held at 0.
TEST(Dispatch, ResizeDownKeepsTheLowByte) {
    constexpr std::pair<float, float> kWeights[] = {
        {1.0f, 0.0f},  {0.5f, 0.5f},        {0.75f, 0.25f},        {1.6667f, -0.6667f},
        {-0.5f, 1.5f}, {-3749.0f, 3750.0f}, {16384.0f, -16383.0f}, {-1048575.0f, 1048576.0f}};
    std::mt19937 rng(23);
    std::vector<float> top(77), bottom(77);
    for (size_t i = 0; i < top.size(); ++i)
        top[i] = static_cast<float>(rng() % 2551) / 10.0f, bottom[i] = static_cast<float>(rng() % 2551) / 10.0f;
    const auto runs = on_every_path([&] {
        std::vector<uint8_t> out;
        for (const auto &[omw, w] : kWeights) {
            std::vector<uint8_t> row(top.size());
            const pxfx::vec::ResizeDown down = pxfx::vec::resize_down();
            for (size_t k = down != nullptr ? down(top.data(), bottom.data(), omw, w, row.size(), row.data()) : 0;
                 k < row.size(); ++k)
                row[k] = static_cast<uint8_t>(std::max(0, static_cast<int32_t>(omw * top[k] + w * bottom[k])));
            out.insert(out.end(), row.begin(), row.end());
        }
        return out;
    });
    for (size_t p = 1; p < runs.size(); ++p)
        EXPECT_EQ(runs[p], runs[0]) << "path " << p;
}

// The 5 x 5 median (PXImage_Smooth at 60..79) at widths around the vector
// sizes and across the strips the vector code works in, on noise and on
// pictures of few levels (many equal samples).
TEST(Dispatch, MedianMatchesThePlainNetwork) {
    std::mt19937 rng(11);
    for (int32_t bits : {8, 24})
        for (int32_t width : {1, 2, 3, 5, 15, 16, 17, 33, 64, 65, 700, 2049, 2100})
            for (int levels : {256, 3}) {
                pxtest::PX src = pxtest::px_random(width, 6, bits, rng());
                for (size_t i = 0; i < pxtest::px_size(src.get()); ++i)
                    src->data[i] = static_cast<uint8_t>(src->data[i] % levels);
                expect_same_on_every_path(Message() << bits << " bits, width " << width << ", levels " << levels, [&] {
                    const pxtest::PX smoothed = pxtest::px_clone(src.get());
                    EXPECT_EQ(PXImage_Smooth(smoothed.get(), 70), 1);
                    return pxtest::bytes(smoothed.get());
                });
            }
}

// Split and Combine in the modes with vector rows (HSL, YUV, YIQ), and the
// HSL transform, at every width up to past a 64-byte vector and past the
// transform's 1024-pixel pieces, on rows whose pitch is larger than they
// need: noise, and pictures of three levels (grays, channels that tie, both
// lightness halves); Combine also from noise planes.
TEST(Dispatch, PlaneRowsMatchThePlainCode) {
    constexpr uint8_t kLevels[] = {0, 128, 255};
    std::vector<int32_t> widths(70);
    std::iota(widths.begin(), widths.end(), 1);
    widths.push_back(2100);
    std::mt19937 rng(17);
    for (int32_t bits : {24, 32})
        for (int32_t width : widths)
            for (bool few : {false, true}) {
                const Owned held = pxtest::random_image(width + 9, 3, bits, rng());
                if (few)
                    for (size_t i = 0; i < size_t{held->pitch} * 3; ++i)
                        held->bits[i] = kLevels[held->bits[i] % 3];
                const Image src = pxtest::reshaped(held.get(), width, 3);
                const Owned noise = pxtest::random_image(width + 9, 9, 8, rng());
                Image planes[3];
                for (int i = 0; i < 3; ++i) {
                    planes[i] = pxtest::reshaped(noise.get(), width, 3);
                    planes[i].bits += size_t{noise->pitch} * 3 * i;
                }
                expect_same_on_every_path(Message() << bits << " bits, width " << width << ", few " << few, [&] {
                    std::vector<Owned> out;
                    for (int32_t mode : {1, 2, 3}) {
                        Image *p[4] = {};
                        EXPECT_EQ(Split(&src, &p[0], &p[1], &p[2], &p[3], mode), 1);
                        out.emplace_back(Combine(p[0], p[1], p[2], p[3], mode));
                        out.emplace_back(Combine(p[0], p[1], p[2], nullptr, mode));
                        out.emplace_back(Combine(&planes[0], &planes[1], &planes[2], &planes[0], mode));
                        for (Image *plane : p)
                            out.emplace_back(plane);
                    }
                    Image *moved = nullptr, *self = pxtest::clone(&src).release();
                    EXPECT_EQ(PX_IMG_Transform(&src, &moved, 40 + width, width % 3), 1);
                    EXPECT_EQ(PX_IMG_Transform(self, &self, 40 + width, width % 3), 1);
                    out.emplace_back(moved);
                    out.emplace_back(self);
                    return out;
                });
            }
}

// Photocopy's local means and tones, and auto gradation's rows, at every
// width around the vector sizes: photocopy on noise whose upper rows are
// nearly black (means of 0, ratios far apart); auto gradation on each format
// the vector rows take and one they leave to the plain loop.
TEST(Dispatch, PhotocopyAndAutoGradationMatchThePlainLoops) {
    for (int32_t bits : pxtest::kBitCounts)
        for (int32_t height : {1, 3, 5, 7, 11})
            for (int32_t width = 1; width <= 70; ++width) {
                const Owned src = pxtest::random_image(width, height, bits, static_cast<uint32_t>(width * 64 + bits));
                const Owned dark = pxtest::clone(src.get());
                for (size_t i = 0; i < std::min(4, height) * static_cast<size_t>(src->pitch); ++i)
                    dark->bits[i] >>= 6;
                expect_same_on_every_path(Message() << bits << " bits, " << width << " x " << height, [&] {
                    Image *photocopy = nullptr, *graded = nullptr;
                    EXPECT_EQ(PX_IMG_Photocopy(dark.get(), &photocopy), 1u);
                    EXPECT_EQ(ImageAutoGradationProcess(src.get(), &graded, 60), 1);
                    return std::pair(Owned(photocopy), Owned(graded));
                });
            }
}

// Oil's windows (16-bit sums up to radius 7) at widths across its row
// chunks, on noise and on stripes of three classes, whose counts tie.
TEST(Dispatch, OilMatchesThePlainLoop) {
    uint32_t seed = 3;
    for (int32_t bits : pxtest::kBitCounts)
        for (int32_t r : {1, 3, 7})
            for (int32_t width : {2 * r + 1, 2 * r + 9, 70, 140})
                for (bool stripes : {false, true}) {
                    const Owned src = pxtest::random_image(width, 2 * r + 4, bits, ++seed);
                    for (int32_t y = 0; stripes && y < src->height; ++y)
                        for (int32_t x = 0; x < width; ++x)
                            SetPixelColor(src.get(), x, y,
                                          (x % 3 == 0   ? 0x000000u
                                           : x % 3 == 1 ? 0x808080u
                                                        : 0xFFFFFFu));
                    expect_same_on_every_path(Message() << bits << " bits, r " << r << ", " << width << " wide", [&] {
                        Image *out = nullptr;
                        EXPECT_EQ(imOil(src.get(), &out, r), 1u);
                        return Owned(out);
                    });
                }
}

// The line filters' medians (selection networks in vectors where they run)
// at every width around the vector sizes.
TEST(Dispatch, LineMediansMatchTheHistograms) {
    std::mt19937 rng(21);
    for (int32_t height : {7, 11})
        for (int32_t width = 1; width <= 70; ++width)
            for (int levels : {256, 3}) {
                const Owned src = pxtest::random_image(width, height, 8, rng());
                for (int32_t y = 0; y < height; ++y)
                    for (int32_t x = 0; x < width; ++x)
                        src->bits[static_cast<size_t>(y) * src->pitch + x] %= levels;
                expect_same_on_every_path(Message() << width << " x " << height << ", levels " << levels, [&] {
                    Image *cross = nullptr, *box = nullptr;
                    EXPECT_EQ(MyFliter(src.get(), &cross) + MyFliter1(src.get(), &box), 2);
                    return std::pair(Owned(cross), Owned(box));
                });
            }
}

// The window filters (PXImage_Sharpen's three kernels, the mean smoothing
// of PXImage_Smooth, PXImage_EdgeDetection) at every width up to past two
// 32-byte vectors and across the strips of the box sums, on noise, whose
// sums leave 0..255 both ways: on pictures lower than the windows and on
// pictures past the 7 x 7 kernel's first row.
TEST(Dispatch, WindowFiltersMatchThePlainLoops) {
    std::mt19937 rng(13);
    std::vector<int32_t> widths = {345, 1030};
    for (int32_t width = 1; width <= 70; ++width)
        widths.push_back(width);
    for (int32_t bits : {8, 16, 24})
        for (int32_t width : widths)
            for (int32_t height : {1 + 2 * (width % 3), 51 + 2 * (width % 2)}) {
                const pxtest::PX src = pxtest::px_random(width, height, bits, rng());
                expect_same_on_every_path(Message() << bits << " bits, " << width << " x " << height, [&] {
                    std::vector<std::vector<uint8_t>> out;
                    for (int32_t strength : {20, 60, 90, -10, -30, -50, 0}) {
                        const pxtest::PX img = pxtest::px_clone(src.get());
                        PXImage *p = img.get();
                        EXPECT_EQ(strength > 0   ? PXImage_Sharpen(p, strength)
                                  : strength < 0 ? PXImage_Smooth(p, -strength)
                                                 : PXImage_EdgeDetection(p),
                                  1);
                        out.push_back(pxtest::bytes(p));
                    }
                    return out;
                });
            }
}

// Filter_fast at every width up to past four 16-byte and two 32-byte vectors
// of sums, odd heights, box sizes around those the vector sums take and a
// large one, in place and through the working image (a record narrower than
// its pitch), offsets that move the means both ways.
TEST(Dispatch, BoxMeansMatchThePlainLoops) {
    constexpr int32_t kSizes[] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 31};
    for (int32_t bits : {8, 24, 32})
        for (int32_t width = 1; width <= 70; ++width) {
            const int32_t height = 1 + 2 * (width % 4), offset = (width % 3 - 1) * 40;
            const Owned fresh = pxtest::random_image(width, height, bits, static_cast<uint32_t>(width * bits));
            const Owned wide = pxtest::random_image(width + 4, height, bits, static_cast<uint32_t>(width + bits));
            expect_same_on_every_path(Message() << bits << " bits, width " << width, [&] {
                std::vector<Owned> out;
                for (int32_t size : kSizes)
                    for (const Image *src : {fresh.get(), wide.get()}) {
                        out.push_back(pxtest::clone(src));
                        Image narrow = pxtest::reshaped(out.back().get(), width, height);
                        EXPECT_EQ(Filter_fast(&narrow, size, offset), 1);
                    }
                return out;
            });
        }
}
