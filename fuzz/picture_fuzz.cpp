// The tool's picture readers on arbitrary bytes: every format it recognises
// (PNG, JPEG, BMP with its run-length expansion, WebP, HEIF), then the colour
// profile and orientation steps. Seeds: the reader fixtures of the tests.
#include <cstddef>
#include <cstdint>
#include <string>

#include "image_io.hpp"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    pxio::ReadOptions options;
    options.maxPixels = 1u << 22; // pictures a few thousand pixels a side at most
    options.keepProfile = size % 2 == 0;
    Image *image = nullptr;
    std::string error;
    if (pxio::decode_picture(data, size, "input", options, &image, nullptr, &error)) free_Image(&image, 0);
    return 0;
}
