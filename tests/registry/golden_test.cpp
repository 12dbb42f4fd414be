// Identical results everywhere: every operation of the table, at every bit
// count it accepts, runs on fixed pictures and the hashes of its outputs must
// equal the checked-in golden file, on x86-64, arm64 and 32-bit ARM alike.
// PXFX_UPDATE_GOLDEN=1 rewrites the file (only after a deliberate change).
#include <map>
#include <sstream>

#include "operations.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

const char *kGoldenFile = PXFX_TEST_DATA_DIR "/golden-hashes.txt";

// FNV-1a over the size, the bit count and the pixel bytes of every row
// (padding excluded).
std::string hash(const Image *im) {
    if (im == nullptr) return "failed";
    uint64_t h = 1469598103934665603ull;
    auto mix = [&h](uint8_t b) { h = (h ^ b) * 1099511628211ull; };
    for (uint32_t v : {uint32_t(im->width), uint32_t(im->height), im->bitCount})
        for (int s = 0; s < 32; s += 8)
            mix(uint8_t(v >> s));
    const size_t rowBytes = (size_t(im->width) * im->bitCount + 7) / 8;
    for (int32_t y = 0; y < im->height; ++y)
        for (size_t i = 0; i < rowBytes; ++i)
            mix(im->bits[size_t(y) * im->pitch + i]);
    char out[17];
    std::snprintf(out, sizeof out, "%016llx", static_cast<unsigned long long>(h));
    return out;
}

// A smooth picture with edges and a varying alpha: gradients, a disc and noise.
Owned scene(int32_t w, int32_t h) {
    Owned im = make(w, h, 32);
    uint32_t noise = 12345;
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            noise = noise * 1103515245u + 12345u;
            const int32_t dx = x - w / 2, dy = y - h / 2;
            const bool disc = dx * dx + dy * dy < (w * w) / 9;
            const uint32_t r = uint32_t(x * 255 / w), g = uint32_t(y * 255 / h), b = disc ? 40u : 200u;
            const uint32_t a = uint32_t(255 - (x + y) % 64);
            SetPixelColor(im.get(), x, y, ((b + (noise >> 28)) & 255) | g << 8 | r << 16 | a << 24);
        }
    return im;
}

std::map<std::string, std::string> compute() {
    std::map<std::string, Owned> inputs;
    inputs["random"] = random_image(29, 19, 32, 2024);
    inputs["scene"] = scene(150, 100);
    inputs["portrait"] = load_fixture("portrait-128.bmp");
    std::map<std::string, std::string> hashes;
    for (const pxop::Operation &op : pxop::operations()) {
        for (uint32_t bits : {8u, 16u, 24u, 32u}) {
            if (!(op.formats & pxop::format_of(bits))) continue;
            for (const auto &[name, picture] : inputs) {
                Owned in(pxop::convert_to(picture.get(), bits));
                srand48(7); // operations that draw random numbers see the same stream
                Owned out(op.run(in.get(), pxop::default_args(op)));
                hashes[std::string(op.name) + " " + std::to_string(bits) + " " + name] = hash(out.get());
            }
        }
    }
    return hashes;
}

} // namespace

TEST(Golden, EveryOperationHashesAsRecorded) {
    ASSERT_TRUE(load_fixture("portrait-128.bmp"));
    const std::map<std::string, std::string> got = compute();
    if (const char *update = std::getenv("PXFX_UPDATE_GOLDEN"); update != nullptr && *update == '1') {
        std::ofstream out(kGoldenFile);
        out << "# operation bits input hash -- written by PXFX_UPDATE_GOLDEN=1 pxfx_tests_registry\n";
        for (const auto &[key, h] : got)
            out << key << " " << h << "\n";
        ASSERT_TRUE(out.good());
        GTEST_SKIP() << "golden file rewritten";
    }
    std::ifstream in(kGoldenFile);
    ASSERT_TRUE(in.good()) << "no golden file; create it with PXFX_UPDATE_GOLDEN=1";
    std::map<std::string, std::string> want;
    for (std::string line; std::getline(in, line);) {
        if (line.empty() || line[0] == '#') continue;
        const size_t cut = line.find_last_of(' ');
        want[line.substr(0, cut)] = line.substr(cut + 1);
    }
    for (const auto &[key, h] : got) {
        const auto it = want.find(key);
        if (it == want.end())
            ADD_FAILURE() << "no golden hash for " << key;
        else
            EXPECT_EQ(h, it->second) << key;
    }
    for (const auto &[key, h] : want)
        EXPECT_TRUE(got.count(key)) << "operation gone: " << key;
}
