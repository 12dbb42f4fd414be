// Memory wrappers, whole-file reading and BMP output.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

class FilesTest : public ::testing::Test {
  protected:
    std::string dir;
    void SetUp() override {
        char tmpl[] = "/tmp/pxfx_files_XXXXXX";
        ASSERT_NE(mkdtemp(tmpl), nullptr);
        dir = tmpl;
    }
    void TearDown() override { (void)std::system(("rm -rf " + dir).c_str()); }
    std::string path(const char *name) const { return dir + "/" + name; }
    static void write(const std::string &p, const std::string &bytes) {
        FILE *f = std::fopen(p.c_str(), "wb");
        std::fwrite(bytes.data(), 1, bytes.size(), f);
        std::fclose(f);
    }
    static std::vector<uint8_t> read(const std::string &p) {
        std::vector<uint8_t> v;
        FILE *f = std::fopen(p.c_str(), "rb");
        if (f == nullptr) return v;
        int c;
        while ((c = std::fgetc(f)) != EOF)
            v.push_back(static_cast<uint8_t>(c));
        std::fclose(f);
        return v;
    }
    static uint32_t le32(const std::vector<uint8_t> &v, size_t at) {
        return v[at] | v[at + 1] << 8 | v[at + 2] << 16 | uint32_t(v[at + 3]) << 24;
    }
};

} // namespace

TEST(Memory, ZeroSizeAndNull) {
    EXPECT_EQ(PX_malloc(0), nullptr);
    PX_free(nullptr);
    PX_ReleaseMemFile(nullptr);
    char a[4] = "abc", b[4] = {};
    EXPECT_EQ(PX_memcpy(b, a, 4), b);
    EXPECT_STREQ(b, "abc");
    PX_memset(b, 'x', 2);
    EXPECT_EQ(std::string(b), "xxc");
    char name[32];
    EXPECT_EQ(PX_GetFileName(name, "dir/file.ext"), 1);
    EXPECT_STREQ(name, "dir/file.ext");
}

TEST_F(FilesTest, ReadMemFileAppendsThreeZeroBytes) {
    write(path("five"), "hello");
    int32_t size = -1;
    unsigned char *block = PX_ReadMemFile(path("five").c_str(), &size);
    ASSERT_NE(block, nullptr);
    EXPECT_EQ(size, 5);
    EXPECT_EQ(std::memcmp(block, "hello\0\0\0", 8), 0);
    PX_ReleaseMemFile(block);
}

TEST_F(FilesTest, ReadMemFileFailures) {
    int32_t size = 1234;
    EXPECT_EQ(PX_ReadMemFile(path("missing").c_str(), &size), nullptr);
    EXPECT_EQ(size, 1234); // untouched when the file cannot be opened
    write(path("empty"), "");
    EXPECT_EQ(PX_ReadMemFile(path("empty").c_str(), &size), nullptr);
    EXPECT_EQ(size, 0);
    EXPECT_EQ(PX_ReadMemFile(dir.c_str(), &size), nullptr); // a directory
    EXPECT_EQ(PX_ReadMemFile(nullptr, &size), nullptr);
}

TEST_F(FilesTest, FopenRefusesLongNames) {
    const std::string longName = dir + "/" + std::string(300, 'a');
    EXPECT_EQ(PX_fopen(longName.c_str(), "wb"), nullptr);
    const std::string edge = std::string(255, 'b');
    FILE *f = PX_fopen(("/tmp/" + edge.substr(5)).c_str(), "wb"); // 255 bytes: accepted
    ASSERT_NE(f, nullptr);
    PX_fclose(f);
    std::remove(("/tmp/" + edge.substr(5)).c_str());
    EXPECT_EQ(PX_fopen(nullptr, "rb"), nullptr);
}

TEST_F(FilesTest, SaveBmp24BitWritesPaddedRowsAsStored) {
    Owned im = random_image(3, 2, 24, 7);
    ASSERT_EQ(saveBmp(path("a.bmp").c_str(), im.get()), 1);
    std::vector<uint8_t> v = read(path("a.bmp"));
    ASSERT_EQ(v.size(), 78u);
    EXPECT_EQ(v[0], 'B');
    EXPECT_EQ(v[1], 'M');
    EXPECT_EQ(le32(v, 2), 78u);
    EXPECT_EQ(le32(v, 10), 54u);
    EXPECT_EQ(le32(v, 14), 40u);
    EXPECT_EQ(le32(v, 18), 3u);
    EXPECT_EQ(le32(v, 22), 2u);
    EXPECT_EQ(v[26] | v[27] << 8, 1);
    EXPECT_EQ(v[28] | v[29] << 8, 24);
    EXPECT_EQ(le32(v, 30), 0u);
    EXPECT_EQ(le32(v, 34), 24u);
    for (size_t i = 38; i < 54; ++i)
        EXPECT_EQ(v[i], 0) << i;
    EXPECT_EQ(std::memcmp(v.data() + 54, im->bits, 24), 0); // padding bytes included
}

TEST_F(FilesTest, SaveBmp8BitHasGrayPalette) {
    Owned im = random_image(3, 2, 8, 8);
    ASSERT_EQ(saveBmp(path("g.bmp").c_str(), im.get()), 1);
    std::vector<uint8_t> v = read(path("g.bmp"));
    ASSERT_EQ(v.size(), 1078u + 8u);
    EXPECT_EQ(le32(v, 2), 1086u);
    EXPECT_EQ(le32(v, 10), 1078u);
    EXPECT_EQ(v[28], 8);
    for (uint32_t i = 0; i < 256; ++i)
        EXPECT_EQ(le32(v, 54 + 4 * i), i | i << 8 | i << 16) << i;
    EXPECT_EQ(std::memcmp(v.data() + 1078, im->bits, 8), 0);
}

TEST_F(FilesTest, SaveBmpFailures) {
    Owned im = make(2, 2, 32);
    EXPECT_EQ(saveBmp(path("none/x.bmp").c_str(), im.get()), 0);
    EXPECT_EQ(saveBmp((dir + "/" + std::string(300, 'c')).c_str(), im.get()), 0);
    EXPECT_EQ(saveBmp(path("n.bmp").c_str(), nullptr), 0);
    Image *hollow = malloc_Image(2, 2, 24);
    free_Image(&hollow, 1);
    EXPECT_EQ(saveBmp(path("h.bmp").c_str(), hollow), 0);
    free_Image(&hollow, 0);
    struct stat st;
    EXPECT_NE(stat(path("h.bmp").c_str(), &st), 0);
    ASSERT_EQ(saveBmp(path("c.bmp").c_str(), im.get()), 1);
    EXPECT_EQ(read(path("c.bmp")).size(), 54u + 16u);
}

TEST(Fixtures, BundledPicturesLoadAndRoundTripThroughSaveBmp) {
    Owned portrait = load_fixture("portrait-128.bmp");
    ASSERT_TRUE(portrait);
    EXPECT_EQ(portrait->width, 128);
    EXPECT_EQ(portrait->height, 128);
    EXPECT_EQ(portrait->bitCount, 24u);
    Owned coffee = load_fixture("coffee-100x66.bmp");
    ASSERT_TRUE(coffee);
    EXPECT_EQ(coffee->width, 100);
    EXPECT_FALSE(load_fixture("missing.bmp"));
}
