// Memory wrappers: every allocation of the library goes through PX_malloc.
#include <pxfx/core.h>

#include <cstdlib>
#include <cstring>

extern "C" {

void *PX_malloc(size_t size) {
    if (size == 0) return nullptr;
    return std::malloc(size);
}

void PX_free(void *block) {
    if (block != nullptr) std::free(block);
}

void *PX_memcpy(void *dst, const void *src, size_t count) { return std::memcpy(dst, src, count); }

void *PX_memset(void *dst, int32_t value, size_t count) { return std::memset(dst, value, count); }

} // extern "C"
