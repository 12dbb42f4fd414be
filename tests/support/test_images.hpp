// Helpers shared by the test programs: owned images, seeded random pictures
// and pixel comparisons; with the headers every test file uses.
#pragma once

#include <gtest/gtest.h>
#include <pxfx/pxfx.h>

#include <algorithm>
#include <array>
#include <climits>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <functional>
#include <iterator>
#include <memory>
#include <numeric>
#include <random>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace pxtest {

struct ImageDeleter {
    void operator()(Image *im) const { free_Image(&im, 0); }
};
using Owned = std::unique_ptr<Image, ImageDeleter>;

// A new image (filled with 255 by malloc_Image).
Owned make(int32_t width, int32_t height, int32_t bitCount);

// A new image whose every byte (padding included) comes from a seeded stream.
Owned random_image(int32_t width, int32_t height, int32_t bitCount, uint32_t seed);

// A new image filled with one packed colour through SetPixelColor.
Owned filled(int32_t width, int32_t height, int32_t bitCount, uint32_t colour);

// An independent deep copy (same pitch, same bytes).
Owned clone(const Image *src);

// Empty string when the two images have the same size, bit count and pixel
// bytes (padding ignored); otherwise a description of the first difference.
std::string diff(const Image *a, const Image *b);

// The bytes of a file (none when it cannot be read).
inline std::vector<uint8_t> file_bytes(const std::string &path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

// A picture from tests/data (a 24-bit BMP as saveBmp writes it), or null.
Owned load_fixture(const std::string &name);

// Slot helper: releases whatever the slot holds when it goes out of scope.
struct Slot {
    Image *image = nullptr;
    Slot() = default;
    Slot(const Slot &) = delete;
    Slot &operator=(const Slot &) = delete;
    ~Slot() { free_Image(&image, 0); }
    Image **operator&() { return &image; }
    Image *operator->() const { return image; }
    Image *get() const { return image; }
};

// A record over held's pixels (or none) that claims another size.
inline Image reshaped(const Image *held, int32_t w, int32_t h, bool pixels = true) {
    Image r = *held;
    r.width = w, r.height = h;
    if (!pixels) r.bits = nullptr;
    return r;
}

// The shape of a result picture, as a contract pins it (pxop::Accepted).
template <class R> std::string shape_of(const R *im) {
    if (im == nullptr) return "null";
    const uint8_t *pixels;
    size_t bytes;
    int32_t bits;
    if constexpr (std::is_same_v<R, Image>) {
        pixels = im->bits, bits = int32_t(im->bitCount);
        bytes = size_t(im->pitch) * size_t(std::llabs(im->height));
    } else {
        pixels = im->data, bits = im->bitcount;
        bytes = size_t(std::llabs(int64_t(im->width) * im->height)) * size_t(std::max(bits / 8, 0));
    }
    const std::string s = std::to_string(im->width) + "x" + std::to_string(im->height) + "x" + std::to_string(bits);
    if (pixels == nullptr) return s + " none";
    for (const uint8_t fill : {0, 255})
        if (std::all_of(pixels, pixels + bytes, [fill](uint8_t b) { return b == fill; }))
            return s + (fill ? " white" : " zeros");
    return s + " pixels";
}

// A channel of a packed colour (blue at shift 0), and a colour of channels.
constexpr int chan(uint32_t c, int shift) { return static_cast<int>((c >> shift) & 255); }
constexpr uint32_t rgba(int b, int g, int r, int a) {
    return uint32_t(b) | uint32_t(g) << 8 | uint32_t(r) << 16 | uint32_t(a) << 24;
}

// The bit counts every Image function must handle.
inline constexpr int32_t kBitCounts[] = {8, 16, 24, 32};

} // namespace pxtest
