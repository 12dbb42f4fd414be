// Owners for library allocations: working buffers from PX_malloc and
// temporary Image records, released on every path.
#pragma once

#include <pxfx/core.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <memory>
#include <type_traits>

#include "image_check.hpp"

namespace pxfx {

struct PxFree {
    void operator()(void *p) const { PX_free(p); }
};

template <class T> using Buffer = std::unique_ptr<T[], PxFree>;

// `count` elements from PX_malloc, or null when the byte count is 0 or too large.
template <class T> Buffer<T> alloc_buffer(size_t count) {
    static_assert(std::is_trivial_v<T>);
    const size_t bytes = checked_size(count, sizeof(T));
    if (bytes == 0) return Buffer<T>();
    return Buffer<T>(static_cast<T *>(PX_malloc(bytes)));
}

// As alloc_buffer, with every byte cleared.
template <class T> Buffer<T> alloc_zeroed(size_t count) {
    Buffer<T> b = alloc_buffer<T>(count);
    if (b) std::memset(b.get(), 0, count * sizeof(T));
    return b;
}

// Backs a block that is about to be written whole with pages at once, in
// one call to the kernel instead of one page fault per page (Linux 5.14 and
// later). The contents stay as they are; where the kernel refuses, or off
// Linux, the pages come on first write as before. Only blocks of at least
// kPrefaultBytes ask: smaller ones are mostly reused from the allocator's
// free lists, where there is nothing to gain.
inline constexpr size_t kPrefaultBytes = size_t{16} << 20;
void prefault(void *block, size_t bytes);

struct ImageFree {
    void operator()(Image *im) const { free_Image(&im, 0); }
};

// A temporary Image released when it goes out of scope.
using ImagePtr = std::unique_ptr<Image, ImageFree>;

inline ImagePtr make_image(int32_t width, int32_t height, int32_t bitCount) {
    return ImagePtr(malloc_Image(width, height, bitCount));
}

} // namespace pxfx
