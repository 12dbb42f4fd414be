// Fuzzes the image core: record creation and release, pixel access on
// hand-made records, copies between records of different shapes, the memory
// and file services (inside a private temporary directory), BMP output and
// the integer math.
#include <unistd.h>

#include <string>

#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

// A private directory for the file functions, removed at exit.
const char *temp_dir() {
    static char name[] = "/tmp/pxfx_fuzz_core_XXXXXX";
    static const bool made = [] {
        if (mkdtemp(name) == nullptr) std::abort();
        std::atexit([] { rmdir(name); });
        return true;
    }();
    (void)made;
    return name;
}

// Sizes for malloc_Image: small ones, or ones whose block cannot fit.
int32_t image_side(Input &in) {
    switch (in.byte() % 12) {
    case 0: return INT_MIN;
    case 1: return INT_MAX;
    case 2: return -in.range(1, 100);
    case 3: return 0;
    case 4: return 46341 + in.range(0, 100000);
    default: return in.range(1, 64);
    }
}

void pixels(Input &in) {
    ImageGuard im{make_image(in)};
    for (int32_t k = in.range(1, 8); k > 0; --k) {
        const int32_t x = in.param(-2, 66), y = in.param(-2, 66);
        switch (in.byte() % 5) {
        case 0: GetPixelIndex(im.img, x, y); break;
        case 1: GetPixelColor(im.img, x, y); break;
        case 2: GetPixelGray(im.img, x, y); break;
        case 3: SetPixelIndex(im.img, x, y, in.param(0, 255)); break;
        default: SetPixelColor(im.img, x, y, in.u32()); break;
        }
    }
    GetPixelColor(in.one_in(16) ? nullptr : im.img, 0, 0);
}

void copies(Input &in) {
    ImageGuard src{make_image(in)};
    ImageGuard dst{make_partner(in, src.img)};
    if (in.one_in(2))
        PX_Img_Copy(in.one_in(16) ? nullptr : dst.img, src.img);
    else
        PX_Img_CopyAlpha(dst.img, in.one_in(16) ? nullptr : src.img);
}

void records(Input &in) {
    const int32_t w = image_side(in), h = image_side(in);
    Image *im = malloc_Image(w, h, in.param(0, 32));
    free_Image(&im, in.one_in(2) ? 1 : 0);
    free_Image(&im, 0);
    free_Image(nullptr, 0);
}

void memory(Input &in) {
    const size_t n = static_cast<size_t>(in.range(0, 256));
    auto *a = static_cast<uint8_t *>(PX_malloc(n));
    auto *b = static_cast<uint8_t *>(PX_malloc(n));
    if (a != nullptr && b != nullptr) {
        PX_memset(a, in.i32(), n);
        PX_memcpy(b, a, n);
    }
    PX_free(a);
    PX_free(b);
}

void files(Input &in) {
    const std::string dir = temp_dir();
    // A name of fuzzed length and letters below the temporary directory, some
    // past the 256-byte limit.
    std::string name = dir + "/";
    for (int32_t k = in.range(1, 300); k > 0; --k)
        name.push_back(static_cast<char>('a' + in.byte() % 26));
    std::vector<char> copy(name.size() + 1);
    PX_GetFileName(copy.data(), name.c_str());

    ImageGuard im{make_image(in)};
    if (saveBmp(copy.data(), im.img) == 1) {
        int32_t size = -1;
        unsigned char *block = PX_ReadMemFile(copy.data(), &size);
        PX_ReleaseMemFile(block);
        FILE *f = PX_fopen(copy.data(), "rb");
        if (f != nullptr) {
            uint8_t buffer[64];
            PX_fseek(f, in.range(-8, 80), in.range(0, 2));
            PX_ftell(f);
            PX_fread(buffer, 1, sizeof buffer, f);
            PX_fclose(f);
        }
        unlink(copy.data());
    }
    const std::string out = dir + "/w";
    FILE *f = PX_fopen(out.c_str(), "wb");
    if (f != nullptr) {
        const uint8_t bytes[16] = {};
        PX_fwrite(bytes, 1, in.range(0, 16), f);
        PX_fclose(f);
        unlink(out.c_str());
    }
    PX_ReadMemFile(nullptr, nullptr);
    PX_fopen(nullptr, "rb");
}

void math(Input &in) {
    const int32_t a = in.param(-100000, 100000), b = in.param(-100000, 100000);
    xxgluSqrtFx(in.u32());
    Distance2D(a, b);
    FastDistance2D(a, b);
    tsin(in.param(-720, 720));
    tcos(in.param(-720, 720));
    // tatan2's inputs are bounded by its contract: |y| <= 21474, x^2 + y^2 < 2^32.
    tatan2(in.range(-21474, 21474), in.range(-60000, 60000));
    PX_rand(in.param(0, 1000));
    ltouc(in.i32());
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    switch (in.byte() % 6) {
    case 0: pixels(in); break;
    case 1: copies(in); break;
    case 2: records(in); break;
    case 3: memory(in); break;
    case 4: files(in); break;
    default: math(in); break;
    }
    return 0;
}
