// Failed allocations: every function returns its failure result, leaves its
// inputs intact and (checked by the leak sanitizer) releases what it made.
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
