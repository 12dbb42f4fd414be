// Applies the pencil-sketch effect to a PNG picture and writes the result.
//   pxfx-sketch IN.png OUT.png
#include <pxfx/pxfx.h>

#include <cstdio>
#include <string>

#include "image_io.hpp"

int main(int argc, char **argv) {
    if (argc != 3) {
        std::fprintf(stderr, "usage: %s IN.png OUT.png\n", argv[0]);
        return 2;
    }
    std::string error;
    Image *src = pxio::read_png(argv[1], &error);
    if (src == nullptr) {
        std::fprintf(stderr, "%s\n", error.c_str());
        return 1;
    }
    Image *dst = nullptr;
    int status = 0;
    if (PX_ProcessImage(src, &dst, 3) != 1) {
        std::fprintf(stderr, "sketch failed\n");
        status = 1;
    } else if (!pxio::write_png(argv[2], dst, &error)) {
        std::fprintf(stderr, "%s\n", error.c_str());
        status = 1;
    } else {
        std::printf("wrote %s (%dx%d)\n", argv[2], dst->width, dst->height);
    }
    free_Image(&dst, 0);
    free_Image(&src, 0);
    return status;
}
