// Picture files in and out: every fixture of tests/data/pictures (made by
// scripts/make-picture-fixtures.py) decodes to the pixels its generator gave
// it, metadata reaches the outputs, and broken or oversized files fail with a
// message.
#include <libexif/exif-data.h>

#include <filesystem>

#include <jpeglib.h>

#include "image_io.hpp"
#include "support/test_images.hpp"
#include "tools/temp_dir.hpp"

namespace fs = std::filesystem;
using namespace pxtest;

namespace {

const fs::path kPictures = fs::path(PXFX_TEST_DATA_DIR) / "pictures";

Owned read(const fs::path &file, const pxio::ReadOptions &options = {}, pxio::Metadata *meta = nullptr) {
    Image *im = nullptr;
    std::string error;
    EXPECT_TRUE(pxio::read_picture(file.string(), options, &im, meta, &error)) << error;
    return Owned(im);
}

// Largest difference of any channel (alpha included, 255 for pictures
// without) between two pictures of one size; 256 when the sizes differ.
int max_difference(const Image *a, const Image *b) {
    if (a == nullptr || b == nullptr || a->width != b->width || a->height != b->height) return 256;
    int most = 0;
    for (int32_t y = 0; y < a->height; ++y)
        for (int32_t x = 0; x < a->width; ++x) {
            const uint32_t ca = GetPixelColor(a, x, y) | (a->bitCount == 32 ? 0 : 0xFF000000u),
                           cb = GetPixelColor(b, x, y) | (b->bitCount == 32 ? 0 : 0xFF000000u);
            for (int s = 0; s < 32; s += 8)
                most = std::max(most, std::abs(int((ca >> s) & 255) - int((cb >> s) & 255)));
        }
    return most;
}

// Make and orientation entries of an EXIF block ("" and 0 when absent).
std::pair<std::string, int> make_and_orientation(const std::vector<uint8_t> &exif) {
    ExifData *ed = exif_data_new_from_data(exif.data(), static_cast<unsigned int>(exif.size()));
    if (ed == nullptr) return {"", 0};
    char make[64] = {};
    if (ExifEntry *e = exif_content_get_entry(ed->ifd[EXIF_IFD_0], EXIF_TAG_MAKE)) exif_entry_get_value(e, make, 64);
    int orientation = 0;
    if (ExifEntry *e = exif_content_get_entry(ed->ifd[EXIF_IFD_0], EXIF_TAG_ORIENTATION))
        orientation = exif_get_short(e->data, exif_data_get_byte_order(ed));
    exif_data_unref(ed);
    return {make, orientation};
}

using PictureFiles = InTempDir;

} // namespace

TEST_F(PictureFiles, EveryKindDecodesToItsExpectedPixels) {
    // Every EXIF orientation of a PNG turns to the upright picture.
    for (int k = 1; k <= 8; ++k) {
        const std::string file = "orientation-" + std::to_string(k) + ".png";
        EXPECT_EQ(max_difference(read(kPictures / file).get(), read(kPictures / "upright.png").get()), 0) << file;
    }
    const struct {
        const char *file, *expected;
        int tolerance;
    } cases[] = {{"orientation-3.jpg", "orientation-3.expected.png", 0},
                 {"orientation-6.jpg", "orientation-6.expected.png", 0},
                 {"orientation-6.webp", "upright.png", 0},
                 {"cmyk.jpg", "cmyk.expected.png", 0},
                 {"adobe-rgb.png", "adobe-rgb.expected.png", 1},
                 {"adobe-rgb.jpg", "adobe-rgb-jpg.expected.png", 1},
                 {"rgb16.png", "rgb16.expected.png", 0},
                 {"rgb16-gamma.png", "rgb16.expected.png", 0},
                 {"palette8.bmp", "bmp-palette8.expected.png", 0},
                 {"rle8.bmp", "bmp-palette8.expected.png", 0},
                 {"palette4.bmp", "bmp-palette4.expected.png", 0},
                 {"rle4.bmp", "bmp-palette4.expected.png", 0},
                 {"palette1.bmp", "bmp-palette1.expected.png", 0},
                 {"bitfields565.bmp", "bmp-565.expected.png", 0},
                 {"top-down.bmp", "upright.png", 0},
                 {"no-alpha32.bmp", "upright.png", 0},
                 {"alpha32.bmp", "bmp-alpha32.expected.png", 0},
                 {"alpha.webp", "bmp-alpha32.expected.png", 0},
                 {"coffee.heic", "upright.png", 12}};
    for (const auto &c : cases) {
        Owned got = read(kPictures / c.file), want = read(kPictures / c.expected);
        EXPECT_LE(max_difference(got.get(), want.get()), c.tolerance) << c.file;
    }
}

TEST_F(PictureFiles, ProfilesAreConvertedOrKeptAndNeverMislabelled) {
    pxio::Metadata converted, kept;
    Owned asRgb = read(kPictures / "adobe-rgb.png", {}, &converted);
    pxio::ReadOptions keep;
    keep.keepProfile = true;
    Owned asStored = read(kPictures / "adobe-rgb.png", keep, &kept);
    EXPECT_TRUE(converted.icc.empty());
    ASSERT_FALSE(kept.icc.empty());
    EXPECT_EQ(max_difference(asStored.get(), read(kPictures / "upright.png").get()), 0);
    // The kept profile goes out with the unconverted pixels, and reads back
    // to the converted picture.
    for (const char *out : {"kept.png", "kept.jpg", "kept.webp"}) {
        std::string error;
        ASSERT_TRUE(pxio::write_picture((dir / out).string(), asStored.get(), kept, {}, &error)) << error;
        pxio::Metadata back;
        Owned again = read(dir / out, keep, &back);
        EXPECT_EQ(back.icc, kept.icc) << out;
        EXPECT_LE(max_difference(read(dir / out).get(), asRgb.get()), std::string(out) == "kept.png" ? 1 : 24) << out;
    }
}

TEST_F(PictureFiles, YcckJpegReadsLikeItsInks) {
    // Flat 16 x 16 blocks of known inks, stored as YCCK, read back as sRGB by
    // R = (255 - C)(255 - K) / 255 within the JPEG loss.
    const uint8_t inks[4][4] = {{0, 0, 0, 0}, {200, 30, 90, 10}, {20, 180, 60, 120}, {255, 255, 255, 255}};
    const fs::path file = dir / "ycck.jpg";
    FILE *f = std::fopen(file.c_str(), "wb");
    ASSERT_NE(f, nullptr);
    jpeg_compress_struct info{};
    jpeg_error_mgr err;
    info.err = jpeg_std_error(&err);
    jpeg_create_compress(&info);
    jpeg_stdio_dest(&info, f);
    info.image_width = 64, info.image_height = 16, info.input_components = 4, info.in_color_space = JCS_CMYK;
    jpeg_set_defaults(&info);
    jpeg_set_colorspace(&info, JCS_YCCK);
    jpeg_set_quality(&info, 100, TRUE);
    jpeg_start_compress(&info, TRUE);
    std::vector<uint8_t> row(64 * 4);
    for (int x = 0; x < 64; ++x)
        for (int i = 0; i < 4; ++i)
            row[4 * x + i] = static_cast<uint8_t>(255 - inks[x / 16][i]); // stored inverted, with Adobe's marker
    std::vector<JSAMPROW> rows(16, row.data());
    jpeg_write_scanlines(&info, rows.data(), 16);
    jpeg_finish_compress(&info);
    jpeg_destroy_compress(&info);
    std::fclose(f);
    Owned got = read(file);
    ASSERT_TRUE(got);
    for (int b = 0; b < 4; ++b) {
        const uint32_t c = GetPixelColor(got.get(), b * 16 + 8, 8);
        for (int ch = 0; ch < 3; ++ch) {
            const int want = ((255 - inks[b][2 - ch]) * (255 - inks[b][3]) + 127) / 255;
            EXPECT_NEAR(int((c >> (8 * ch)) & 255), want, 3) << "block " << b << " channel " << ch;
        }
    }
}

TEST_F(PictureFiles, ExifTravelsWithOrientationResetUnlessStripped) {
    pxio::Metadata meta;
    Owned upright = read(kPictures / "orientation-6.jpg", {}, &meta);
    EXPECT_EQ(make_and_orientation(meta.exif), (std::pair<std::string, int>{"pxfx fixture camera", 1}));
    for (const char *out : {"e.jpg", "e.png", "e.webp"}) {
        std::string error;
        ASSERT_TRUE(pxio::write_picture((dir / out).string(), upright.get(), meta, {}, &error)) << error;
        pxio::Metadata back;
        Owned again = read(dir / out, {}, &back);
        EXPECT_EQ(make_and_orientation(back.exif), (std::pair<std::string, int>{"pxfx fixture camera", 1})) << out;
        EXPECT_EQ(again->width, 48) << out; // read back, it is not turned a second time
        pxio::WriteOptions strip;
        strip.strip = true;
        ASSERT_TRUE(pxio::write_picture((dir / out).string(), upright.get(), meta, strip, &error)) << error;
        Owned bare = read(dir / out, {}, &back);
        EXPECT_TRUE(back.exif.empty()) << out;
    }
}

TEST_F(PictureFiles, TransparencyIsFlattenedOntoTheBackgroundInJpeg) {
    Owned rgba = filled(32, 16, 32, 0x000000FFu); // transparent blue
    for (int32_t x = 16; x < 32; ++x)
        for (int32_t y = 0; y < 16; ++y)
            SetPixelColor(rgba.get(), x, y, 0x80FF0000u); // half-covering red
    for (uint32_t background : {0xFFFFFFu, 0x000000u}) {
        pxio::WriteOptions options;
        options.background = background;
        std::string error;
        ASSERT_TRUE(pxio::write_picture((dir / "flat.jpg").string(), rgba.get(), {}, options, &error)) << error;
        Owned flat = read(dir / "flat.jpg");
        const uint32_t left = GetPixelColor(flat.get(), 4, 8), right = GetPixelColor(flat.get(), 27, 8);
        const int bg = background ? 255 : 0, red = (255 * 128 + bg * 127 + 127) / 255, rest = bg * 127 / 255;
        for (int ch = 0; ch < 3; ++ch)
            EXPECT_NEAR(int((left >> (8 * ch)) & 255), bg, 3) << ch;
        EXPECT_NEAR(int((right >> 16) & 255), red, 3);
        EXPECT_NEAR(int(right & 255), rest, 3);
    }
}

TEST_F(PictureFiles, BrokenAndOversizedFilesFailWithAMessage) {
    for (const char *name :
         {"upright.png", "orientation-3.jpg", "palette8.bmp", "rle8.bmp", "alpha.webp", "coffee.heic"}) {
        const std::vector<uint8_t> whole = file_bytes(kPictures / name);
        for (size_t keep : {whole.size() / 2, whole.size() * 9 / 10}) {
            const fs::path cut = dir / (std::string("cut-") + name);
            std::ofstream(cut, std::ios::binary).write(reinterpret_cast<const char *>(whole.data()), long(keep));
            Image *im = nullptr;
            std::string error;
            EXPECT_FALSE(pxio::read_picture(cut.string(), {}, &im, nullptr, &error)) << name << " cut at " << keep;
            EXPECT_NE(error.find(cut.string()), std::string::npos) << error;
            free_Image(&im, 0);
        }
        pxio::ReadOptions small;
        small.maxPixels = 1000; // the fixtures have 1536
        Image *im = nullptr;
        std::string error;
        EXPECT_FALSE(pxio::read_picture((kPictures / name).string(), small, &im, nullptr, &error)) << name;
        EXPECT_NE(error.find("--max-pixels"), std::string::npos) << error;
    }
}
