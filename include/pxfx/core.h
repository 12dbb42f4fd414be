/*
 * pxfx image core: the padded-row Image record, pixel access, memory and file
 * services, BMP output and the shared integer math.
 *
 * Ownership: every Image* returned by the library belongs to the caller and is
 * released with free_Image(&img, 0). Functions report failure by their result
 * only (0 or null); nothing is logged.
 *
 * Safety decisions of this implementation:
 *  - malloc_Image refuses negative sizes and sizes whose pixel block (pitch x
 *    height) would not fit in 2^31 - 1 bytes, returning null.
 *  - Every function of the library treats a record whose width or height is not
 *    positive, whose pitch is smaller than one row of pixels, or whose block
 *    exceeds 2^31 - 1 bytes, like a record without pixels: readers return 0,
 *    writers do nothing, operations fail.
 *  - PX_fopen refuses (returns null) names of 256 bytes or more.
 *  - PX_rand draws from the process-wide lrand48 stream; the library never
 *    seeds it (call srand48 to make a run repeatable).
 *
 * Threads: the library keeps no changing state of its own (the code path is
 * chosen once per process), so any function may run on several threads at
 * once on pictures and slots of their own. The exceptions
 * are PX_rand and PX_IMG_Aquarelle (the only function that calls it): they
 * draw from libc's lrand48 stream, which is shared by the whole process and
 * not safe to draw from on several threads at once. Callers that need them
 * on several threads either run them one at a time (a lock around each call,
 * which also keeps a seeded run repeatable) or accept a stream that is no
 * longer reproducible and, with some C libraries, draws that race.
 */
#ifndef PXFX_CORE_H
#define PXFX_CORE_H

#include <stddef.h>
#include <stdint.h>
#include <stdio.h>

#if defined(__GNUC__) || defined(__clang__)
#define PXFX_API __attribute__((visibility("default")))
#else
#define PXFX_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* Padded-row picture: rows of `pitch` bytes (a multiple of 4), row y at
 * bits + y * pitch. Pixels are stored blue first: 32 bits B,G,R,A; 24 bits
 * B,G,R; 16 bits one little-endian word with blue in bits 11-15, green in 5-10
 * and red in 0-4; 8 bits one index; 4 and 1 bits packed, leftmost pixel in the
 * high bits. `tag` is the caller's (a cache key for the brush tools). */
typedef struct Image {
    int32_t width;
    int32_t height;
    uint32_t bitCount;
    uint8_t *bits;
    uint32_t pitch;
    uint32_t tag;
} Image;

/* A point of two signed integers, shared by the toolkit and the retouch tools. */
typedef struct PXPoint {
    int32_t x;
    int32_t y;
} PXPoint;

/* ---- Image record and pixel access ------------------------------------- */

/* New image filled with 255; bit counts other than 16, 24 and 32 become 8.
 * Returns null for a zero, negative or oversized request. Caller owns it. */
PXFX_API Image *malloc_Image(int32_t width, int32_t height, int32_t bitCount);
/* Releases the pixels (bits = null); with keepRecord 0 also the record, and
 * sets *image to null. Null arguments are ignored. */
PXFX_API void free_Image(Image **image, int32_t keepRecord);
/* Index (0-255) at (x, y) of a 1-, 4- or 8-bit image, coordinates clamped; 0 otherwise. */
PXFX_API uint8_t GetPixelIndex(const Image *image, int32_t x, int32_t y);
/* Packed colour (B bits 0-7, G 8-15, R 16-23, A 24-31) at (x, y), clamped; 0 for no pixels. */
PXFX_API uint32_t GetPixelColor(const Image *image, int32_t x, int32_t y);
/* Gray level (306 R + 601 G + 117 B) >> 10 of GetPixelColor at (x, y). */
PXFX_API uint8_t GetPixelGray(const Image *image, int32_t x, int32_t y);
/* Stores an index into a 1-, 4- or 8-bit image; outside coordinates are ignored. */
PXFX_API void SetPixelIndex(Image *image, int32_t x, int32_t y, int32_t index);
/* Stores a packed colour in the image's own format (8 bits: the green byte);
 * outside coordinates are ignored. */
PXFX_API void SetPixelColor(Image *image, int32_t x, int32_t y, uint32_t colour);
/* Copies src into dst: one block move when pitch, height and bit count agree,
 * else a converting walk over dst (32-bit dst keeps its alpha). 1, or 0 when
 * either record is null or claims a block over 2^31 - 1 bytes. A missing pixel
 * block reads as zeros (the whole-block copy from it clears the destination's
 * block) and takes no writes; the walk writes nothing into a destination whose
 * rows its block cannot hold. */
PXFX_API int32_t PX_Img_Copy(Image *dst, const Image *src);
/* Copies the alpha bytes of one 32-bit image into another of the same size; 1,
 * or 0 for other records. An empty size copies nothing (1); a missing source
 * block reads as alpha 0, a missing destination block takes nothing (1); a
 * record whose rows its block cannot hold is refused (0). */
PXFX_API int32_t PX_Img_CopyAlpha(Image *dst, const Image *src);

/* ---- Memory and files ------------------------------------------------------ */

/* malloc; null for a size of 0. */
PXFX_API void *PX_malloc(size_t size);
/* free; null is ignored. */
PXFX_API void PX_free(void *block);
/* memcpy; copies nothing when count is 0 or either pointer is null. Returns dst. */
PXFX_API void *PX_memcpy(void *dst, const void *src, size_t count);
/* memset; writes nothing when count is 0 or dst is null. Returns dst. */
PXFX_API void *PX_memset(void *dst, int32_t value, size_t count);
/* fopen of a copy of the name; null for a null name or one of 256 bytes or more. */
PXFX_API FILE *PX_fopen(const char *fileName, const char *mode);
/* fclose. */
PXFX_API int32_t PX_fclose(FILE *file);
/* fread. */
PXFX_API size_t PX_fread(void *buffer, size_t size, size_t count, FILE *file);
/* fwrite. */
PXFX_API size_t PX_fwrite(const void *buffer, size_t size, size_t count, FILE *file);
/* fseek. */
PXFX_API int32_t PX_fseek(FILE *file, long offset, int32_t origin);
/* ftell. */
PXFX_API long PX_ftell(FILE *file);
/* Copies the whole name, terminator included, into dst; always 1. */
PXFX_API int32_t PX_GetFileName(char *dst, const char *src);
/* Reads a whole file into a new block followed by three zero bytes; *size gets
 * the length (left alone when the file cannot be opened). Null on failure.
 * Release with PX_ReleaseMemFile. */
PXFX_API unsigned char *PX_ReadMemFile(const char *fileName, int32_t *size);
/* Releases a block of PX_ReadMemFile; null is ignored. */
PXFX_API void PX_ReleaseMemFile(void *block);
/* Writes the image as an uncompressed BMP (8-bit images with a gray palette),
 * rows as stored, row 0 at the bottom: the pitch x height bytes the record
 * claims, whatever its width (a height of 0 writes the headers alone). 1, or 0
 * for a null record or block, a negative height, a block over 2^31 - 1 bytes
 * or an open failure. */
PXFX_API int32_t saveBmp(const char *path, const Image *image);

/* ---- Integer math ------------------------------------------------------------ */

/* sqrt(x) rounded to the nearest integer, by integer arithmetic only. */
PXFX_API uint32_t xxgluSqrtFx(uint32_t x);
/* xxgluSqrtFx(dx * dx + dy * dy), the sum formed modulo 2^32. */
PXFX_API uint32_t Distance2D(int32_t dx, int32_t dy);
/* Approximate distance a + b - 11 min(a, b) / 16 of a = |dx|, b = |dy|. */
PXFX_API int32_t FastDistance2D(int32_t dx, int32_t dy);
/* sin of a whole-degree angle times 100000, from a 91-entry table. */
PXFX_API int32_t tsin(int32_t angle);
/* cos of a whole-degree angle times 100000, from the same table. */
PXFX_API int32_t tcos(int32_t angle);
/* Angle of (x, y) in whole degrees 0..360 by table search (vertical first);
 * |y| <= 21474 and x^2 + y^2 < 2^32 are the caller's duty. */
PXFX_API int32_t tatan2(int32_t y, int32_t x);
/* Random integer r with |r| < n (n > 0) over lrand48, with a random sign. */
PXFX_API int32_t PX_rand(int32_t n);
/* v clamped to 0..255. */
PXFX_API uint8_t ltouc(int32_t v);

#ifdef __cplusplus
}
#endif

#endif /* PXFX_CORE_H */
