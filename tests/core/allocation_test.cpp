// Failed allocations: every function returns its failure result, leaves its
// inputs intact and (checked by the leak sanitizer) releases what it made.
#include <memory>

#include "core/internal/memory.hpp"
#include "support/alloc_failures.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

TEST(AllocationFailure, ImagesAndFiles) {
    PXTEST_REQUIRE_ALLOCATION_HOOK();
    EXPECT_EQ(sweep_allocation_failures([] {
                  Image *im = malloc_Image(7, 5, 24);
                  free_Image(&im, 0);
              }),
              2);
    const std::string path = std::string(PXFX_TEST_DATA_DIR) + "/SOURCES.txt";
    sweep_allocation_failures([&] {
        int32_t size = -1;
        unsigned char *block = PX_ReadMemFile(path.c_str(), &size);
        EXPECT_GT(size, 0);
        PX_ReleaseMemFile(block);
    });
}

// Backing a block with pages ahead of its writes keeps what it already holds,
// at its unaligned ends too; null and small blocks are left alone.
TEST(Prefault, KeepsWhatTheBlockHolds) {
    const size_t bytes = pxfx::kPrefaultBytes + 12345;
    const std::unique_ptr<uint8_t[]> block(new uint8_t[bytes + 8]);
    uint8_t *start = block.get() + 3;
    const size_t marks[] = {0, 1, 4095, 4096, bytes / 2, bytes - 4097, bytes - 1};
    for (size_t at : marks)
        start[at] = static_cast<uint8_t>(at * 7 + 1);
    pxfx::prefault(start, bytes);
    pxfx::prefault(nullptr, bytes);
    pxfx::prefault(start, 100);
    for (size_t at : marks)
        EXPECT_EQ(start[at], static_cast<uint8_t>(at * 7 + 1)) << at;
}
