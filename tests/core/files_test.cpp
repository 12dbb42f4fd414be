// Whole-file reading, name limits and BMP output.

#include <sys/stat.h>
#include <unistd.h>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

const std::string dir = ::testing::TempDir();
std::string path(const char *name) { return dir + "pxfx_files_" + name; }

uint32_t le32(const std::vector<uint8_t> &v, size_t at) {
    return v[at] | v[at + 1] << 8 | v[at + 2] << 16 | uint32_t(v[at + 3]) << 24;
}

} // namespace

TEST(Files, ReadMemFileAppendsThreeZeroBytesOrFails) {
    std::ofstream(path("five")) << "hello";
    std::ofstream(path("empty")).flush();
    int32_t size = -1;
    unsigned char *block = PX_ReadMemFile(path("five").c_str(), &size);
    ASSERT_NE(block, nullptr);
    EXPECT_EQ(size, 5);
    EXPECT_EQ(std::memcmp(block, "hello\0\0\0", 8), 0);
    PX_ReleaseMemFile(block);
    PX_ReleaseMemFile(nullptr);
    size = 1234;
    EXPECT_EQ(PX_ReadMemFile(path("missing").c_str(), &size), nullptr);
    EXPECT_EQ(size, 1234); // untouched when the file cannot be opened
    EXPECT_EQ(PX_ReadMemFile(path("empty").c_str(), &size), nullptr);
    EXPECT_EQ(size, 0);
    EXPECT_EQ(PX_ReadMemFile(dir.c_str(), &size), nullptr); // a directory
    EXPECT_EQ(PX_ReadMemFile(nullptr, &size), nullptr);
    EXPECT_EQ(PX_fopen(nullptr, "rb"), nullptr);
    const std::string edge = "/tmp/" + std::string(250, 'b'); // 255 bytes are accepted, 256 refused
    FILE *f = PX_fopen(edge.c_str(), "wb+");
    ASSERT_NE(f, nullptr);
    // The stream services pass through: write, seek, tell, read back.
    char got[4] = {};
    EXPECT_EQ(PX_fwrite("abcdef", 1, 6, f), 6u);
    EXPECT_EQ(PX_fseek(f, -4, SEEK_END), 0);
    EXPECT_EQ(PX_ftell(f), 2);
    EXPECT_EQ(PX_fread(got, 1, 4, f), 4u);
    EXPECT_EQ(std::memcmp(got, "cdef", 4), 0);
    EXPECT_EQ(PX_fread(got, 1, 4, f), 0u);
    EXPECT_NE(PX_fseek(f, -7, SEEK_END), 0);
    EXPECT_EQ(PX_fclose(f), 0);
    EXPECT_EQ(PX_fopen((edge + "b").c_str(), "wb"), nullptr);
    for (const std::string &p : {edge, path("five"), path("empty")})
        std::remove(p.c_str());
}

TEST(Files, SaveBmpWritesHeadersPaletteAndRowsAsStored) {
    for (int32_t bc : kBitCounts) {
        Owned im = random_image(3, 2, bc, uint32_t(bc));
        ASSERT_EQ(saveBmp(path("a.bmp").c_str(), im.get()), 1);
        const std::vector<uint8_t> v = file_bytes(path("a.bmp"));
        const uint32_t data = im->pitch * 2, off = bc == 8 ? 1078 : 54;
        ASSERT_EQ(v.size(), off + data) << bc;
        EXPECT_EQ(v[0] | v[1] << 8, 'B' | 'M' << 8);
        const uint32_t fields[] = {off + data, 0, off, 40, 3, 2, 1 | uint32_t(bc) << 16, 0, data, 0, 0, 0, 0};
        for (size_t i = 0; i < 13; ++i)
            EXPECT_EQ(le32(v, 2 + 4 * i), fields[i]) << bc << " at " << 2 + 4 * i;
        for (uint32_t i = 0; off == 1078 && i < 256; ++i)
            EXPECT_EQ(le32(v, 54 + 4 * i), i * 0x010101u) << i;
        EXPECT_EQ(std::memcmp(v.data() + off, im->bits, data), 0) << bc; // padding bytes included
    }
    Owned im = make(2, 2, 32);
    Image hollow = reshaped(im.get(), 2, 2, false), upsideDown = reshaped(im.get(), 2, -2);
    EXPECT_EQ(saveBmp(path("h.bmp").c_str(), &hollow) + saveBmp(path("h.bmp").c_str(), nullptr) +
                  saveBmp(path("h.bmp").c_str(), &upsideDown),
              0);
    EXPECT_TRUE(file_bytes(path("h.bmp")).empty());
    // No rows, or rows of no pixels: the headers and the pitch x height bytes claimed.
    Image noRows = reshaped(im.get(), 2, 0), noColumns = reshaped(im.get(), 0, 2);
    ASSERT_EQ(saveBmp(path("h.bmp").c_str(), &noRows), 1);
    EXPECT_EQ(file_bytes(path("h.bmp")).size(), 54u);
    ASSERT_EQ(saveBmp(path("h.bmp").c_str(), &noColumns), 1);
    EXPECT_EQ(file_bytes(path("h.bmp")).size(), 54u + 16);
    std::remove(path("h.bmp").c_str());
    EXPECT_EQ(saveBmp(path("none/x.bmp").c_str(), im.get()), 0);
    EXPECT_EQ(saveBmp(dir.c_str(), im.get()), 0);                               // a directory
    EXPECT_EQ(saveBmp(("/tmp/" + std::string(251, 'c')).c_str(), im.get()), 0); // 256 bytes
    std::remove(path("a.bmp").c_str());
}

TEST(Files, FilesWithoutPermissionAreRefused) {
    const std::string locked = path("locked");
    std::ofstream(locked) << "secret";
    ASSERT_EQ(chmod(locked.c_str(), 0), 0);
    Owned im = make(2, 2, 24);
    // Root may read and write any file, so the calls run in a child process
    // that first gives up root.
    EXPECT_EXIT(
        {
            if (geteuid() == 0 && setuid(65534) != 0) std::_Exit(2);
            int32_t size = 77;
            const bool unread = PX_ReadMemFile(locked.c_str(), &size) == nullptr && size == 77;
            std::_Exit(unread && saveBmp(locked.c_str(), im.get()) == 0 ? 0 : 1);
        },
        ::testing::ExitedWithCode(0), "");
    std::remove(locked.c_str());
}
