// Every kernel that carries a vector copy gives the same bytes with the plain
// code forced and with the best copy the processor has: the byte tables at
// every pixel count around the vector block sizes, and the exported functions
// over those kernels on random pictures of every bit count. On a processor
// without the vector instructions both runs take the plain code.
#include <gtest/gtest.h>
#include <pxfx/pxfx.h>

#include <random>
#include <utility>
#include <vector>

#include "core/internal/byte_map.hpp"
#include "core/internal/cpu.hpp"
#include "support/test_images.hpp"
#include "toolkit/px_images.hpp"

using pxtest::Owned;

namespace {

// make() with the plain code forced, then with the best copy; the switch is
// left as it was.
template <class Make> auto plain_and_best(Make make) {
    const bool was = pxfx::cpu::force_plain(true);
    auto plain = make();
    pxfx::cpu::force_plain(false);
    auto best = make();
    pxfx::cpu::force_plain(was);
    return std::pair(std::move(plain), std::move(best));
}

} // namespace

TEST(Dispatch, ByteTablesMatchThePlainLoop) {
    std::mt19937 rng(5);
    std::vector<uint8_t> tables(4 * 256);
    for (auto &v : tables)
        v = static_cast<uint8_t>(rng());
    const uint8_t *t[4] = {&tables[0], &tables[256], &tables[512], &tables[768]};
    enum Kind { kMap, kRaise, kLower };
    for (int channels : {1, 3, 4})
        for (Kind kind : {kMap, kRaise, kLower})
            for (size_t pixels : {0, 1, 15, 16, 17, 63, 64, 65, 127, 128, 129, 200, 1000}) {
                if (channels == 1 && kind != kMap) continue;
                const pxfx::ToneTables tone{t[0], t[1], t[2], kind == kLower};
                auto run = [&](const uint8_t *from, uint8_t *to) {
                    if (kind == kMap)
                        pxfx::map_bytes(from, to, pixels, channels, t);
                    else
                        pxfx::tone_bytes(from, to, pixels, channels, tone);
                };
                // One byte past the pixels stays as it was; in place gives the same.
                std::vector<uint8_t> in(pixels * channels + 1);
                for (auto &v : in)
                    v = static_cast<uint8_t>(rng());
                const auto [plain, best] = plain_and_best([&] {
                    std::vector<uint8_t> out(in.size(), in.back()), inPlace = in;
                    run(in.data(), out.data());
                    run(inPlace.data(), inPlace.data());
                    return std::pair(out, inPlace);
                });
                EXPECT_EQ(best, plain) << channels << " channels, kind " << kind << ", " << pixels << " pixels";
                EXPECT_EQ(plain.second, plain.first) << channels << " channels, " << pixels << " pixels in place";
            }
}

TEST(Dispatch, PictureKernelsMatchThePlainCode) {
    for (int32_t bits : pxtest::kBitCounts) {
        const Owned src = pxtest::random_image(131, 9, bits, static_cast<uint32_t>(bits));
        auto effect = [&](auto run) {
            return plain_and_best([&] {
                Image *out = nullptr;
                run(src.get(), &out);
                return Owned(out);
            });
        };
        const std::pair<Owned, Owned> results[] = {
            effect([](Image *s, Image **d) { PX_IMG_Alter(s, d, 40, -30, 90, 2); }),
            effect([](Image *s, Image **d) { PX_IMG_WARM_YELLOW(s, d); }),
            effect([](Image *s, Image **d) { PX_IMG_COLD_PUPRLE(s, d); }),
        };
        for (const auto &[plain, best] : results)
            EXPECT_EQ(pxtest::diff(best.get(), plain.get()), "") << bits << " bits";
        for (int32_t mode = 0; mode <= 4; ++mode) {
            const auto [plain, best] = plain_and_best([&] {
                std::vector<Owned> out;
                Image *p[4] = {};
                EXPECT_EQ(Split(src.get(), &p[0], &p[1], &p[2], &p[3], mode), 1);
                out.emplace_back(Combine(p[0], p[1], p[2], p[3], mode));
                out.emplace_back(Combine(p[0], p[1], p[2], nullptr, mode));
                for (Image *plane : p)
                    out.emplace_back(plane);
                return out;
            });
            for (size_t i = 0; i < plain.size(); ++i)
                EXPECT_EQ(pxtest::diff(best[i].get(), plain[i].get()), "")
                    << bits << " bits, mode " << mode << ", " << i;
        }
    }
    for (int32_t bits : {8, 16, 24}) {
        const pxtest::PX src = pxtest::px_random(131, 9, bits, static_cast<uint32_t>(bits));
        const auto [plain, best] = plain_and_best([&] {
            std::vector<std::vector<uint8_t>> out;
            for (const auto &[w, h] : {std::pair(97, 5), std::pair(300, 20)}) {
                const pxtest::PX resized(PXImage_Resize(src.get(), w, h));
                out.push_back(pxtest::bytes(resized.get()));
            }
            const pxtest::PX smoothed = pxtest::px_clone(src.get());
            EXPECT_EQ(PXImage_Smooth(smoothed.get(), 70), 1); // the 5 x 5 median
            out.push_back(pxtest::bytes(smoothed.get()));
            return out;
        });
        EXPECT_EQ(best, plain) << bits << " bits";
    }
}
