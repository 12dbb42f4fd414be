// The channel mapper against its per-pixel definition: load the colour
// through the accessors, map blue, green and red, keep alpha, store it. Every
// bit count the accessors know, into a record of the same or another bit
// count and in place, with padded rows and a different map on each of three
// rows (which changes the 16-bit field tables from row to row).
#include "core/internal/channel_map.hpp"
#include "support/test_images.hpp"

using pxtest::Owned;

TEST(ChannelMap, MatchesThePerPixelDefinition) {
    std::mt19937 rng(11);
    std::vector<uint8_t> tables(9 * 256);
    for (auto &v : tables)
        v = static_cast<uint8_t>(rng());
    pxfx::ChannelMap maps[3];
    for (int k = 0; k < 3; ++k)
        maps[k] = {&tables[768 * k], &tables[768 * k + 256], &tables[768 * k + 512]};
    auto pick = [&](int32_t y) { return &maps[y % 3]; };
    const int32_t w = 67, h = 7;
    for (int32_t bits : {1, 4, 8, 16, 24, 32})
        for (int32_t outBits : {bits, 8, 32}) {
            const Owned src = pxtest::random_image(w, h, bits, static_cast<uint32_t>(bits));
            const Owned want = pxtest::make(w, h, outBits), got = pxtest::make(w, h, outBits);
            for (int32_t y = 0; y < h; ++y)
                for (int32_t x = 0; x < w; ++x) {
                    const uint32_t c = GetPixelColor(src.get(), x, y);
                    const pxfx::ChannelMap &m = *pick(y);
                    SetPixelColor(want.get(), x, y,
                                  pxfx::pack(m.b[pxfx::blue_of(c)], m.g[pxfx::green_of(c)], m.r[pxfx::red_of(c)],
                                             pxfx::alpha_of(c)));
                }
            pxfx::map_channel_rows(*pxfx::view_of(src.get()), *pxfx::view_of(got.get()), pick);
            EXPECT_EQ(pxtest::diff(got.get(), want.get()), "") << bits << " to " << outBits << " bits";
            if (outBits != bits) continue;
            const Owned inPlace = pxtest::clone(src.get());
            pxfx::map_channel_rows(*pxfx::view_of(inPlace.get()), *pxfx::view_of(inPlace.get()), pick);
            EXPECT_EQ(pxtest::diff(inPlace.get(), want.get()), "") << bits << " bits in place";
        }
}
