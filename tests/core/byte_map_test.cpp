// The vector table lookups against the plain loop: every pixel count around
// the vector block sizes, in place and into another buffer, 1-, 3- and 4-byte
// pixels, tables that use all 256 entries; plain maps and tone maps.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "core/internal/byte_map.hpp"

TEST(ByteMap, VectorPathsMatchThePlainLoop) {
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
                auto run = [&](bool portable, const uint8_t *from, uint8_t *to) {
                    if (kind == kMap)
                        (portable ? pxfx::map_bytes_portable : pxfx::map_bytes)(from, to, pixels, channels, t);
                    else
                        (portable ? pxfx::tone_bytes_portable : pxfx::tone_bytes)(from, to, pixels, channels, tone);
                };
                // One byte past the pixels stays as it was.
                std::vector<uint8_t> in(pixels * channels + 1);
                for (auto &v : in)
                    v = static_cast<uint8_t>(rng());
                std::vector<uint8_t> want(in.size(), in.back()), got = want, inPlace = in;
                run(true, in.data(), want.data());
                run(false, in.data(), got.data());
                run(false, inPlace.data(), inPlace.data());
                EXPECT_EQ(got, want) << channels << " channels, kind " << kind << ", " << pixels << " pixels";
                EXPECT_EQ(inPlace, want) << channels << " channels, kind " << kind << ", " << pixels << " pixels";
            }
}
