// File services: thin stream wrappers and whole-file reading.
#include <pxfx/core.h>

#include <climits>
#include <cstdio>
#include <cstring>

namespace {
constexpr size_t kNameBuffer = 256;
} // namespace

extern "C" {

int32_t PX_GetFileName(char *dst, const char *src) {
    if (dst == nullptr || src == nullptr) return 1;
    dst[0] = '\0';
    std::memcpy(dst, src, std::strlen(src) + 1);
    return 1;
}

FILE *PX_fopen(const char *fileName, const char *mode) {
    if (fileName == nullptr || mode == nullptr) return nullptr;
    // The name is copied into a fixed buffer: longer names are refused.
    if (std::strlen(fileName) >= kNameBuffer) return nullptr;
    char name[kNameBuffer];
    PX_GetFileName(name, fileName);
    return std::fopen(name, mode);
}

int32_t PX_fclose(FILE *file) { return std::fclose(file); }

size_t PX_fread(void *buffer, size_t size, size_t count, FILE *file) { return std::fread(buffer, size, count, file); }

size_t PX_fwrite(const void *buffer, size_t size, size_t count, FILE *file) {
    return std::fwrite(buffer, size, count, file);
}

int32_t PX_fseek(FILE *file, long offset, int32_t origin) { return std::fseek(file, offset, origin); }

long PX_ftell(FILE *file) { return std::ftell(file); }

unsigned char *PX_ReadMemFile(const char *fileName, int32_t *size) {
    if (fileName == nullptr || size == nullptr) return nullptr;
    FILE *f = std::fopen(fileName, "rb");
    if (f == nullptr) return nullptr;
    long length = -1;
    if (std::fseek(f, 0, SEEK_END) == 0) length = std::ftell(f);
    // Lengths that do not fit the 32-bit size output count as unreadable.
    if (length <= 0 || length > INT32_MAX - 5 || std::fseek(f, 0, SEEK_SET) != 0) {
        std::fclose(f);
        *size = 0;
        return nullptr;
    }
    auto *block = static_cast<unsigned char *>(PX_malloc(static_cast<size_t>(length) + 5));
    if (block == nullptr) {
        std::fclose(f);
        *size = static_cast<int32_t>(length);
        return nullptr;
    }
    if (std::fread(block, 1, static_cast<size_t>(length), f) != static_cast<size_t>(length)) {
        PX_free(block);
        std::fclose(f);
        *size = static_cast<int32_t>(length);
        return nullptr;
    }
    block[length] = 0;
    block[length + 1] = 0;
    block[length + 2] = 0;
    std::fclose(f);
    *size = static_cast<int32_t>(length);
    return block;
}

void PX_ReleaseMemFile(void *block) {
    if (block != nullptr) PX_free(block);
}

} // extern "C"
