/*
 * The operation registry for callers outside C++ (the Python package): the
 * rows described as JSON, and each operation run exactly as the pxfx tool
 * runs it (same parameter checks, same conversion to the formats it takes).
 * Built as libpxfx_operations.so, which uses libpxfx.so for the pictures: an
 * Image made by one is released by the other's free_Image.
 */
#ifndef PXFX_OPERATIONS_CAPI_H
#define PXFX_OPERATIONS_CAPI_H

#include <pxfx/core.h>

#include <stddef.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Results of pxop_apply. */
enum {
    PXOP_OK = 0,        /* *out holds the result */
    PXOP_INVALID = 1,   /* unknown operation, wrong value count, value or picture refused */
    PXOP_FAILED = 2,    /* the operation gave no result on this picture */
    PXOP_NO_MEMORY = 3, /* working memory ran out */
};

/* Every operation of the tool as a JSON array, in the tool's order: objects
 * with name, function, group, summary, bits (the bit counts taken), same_size
 * and params (objects with name, integer, min, max, default, help). The text
 * is the library's and lives as long as the process. */
PXFX_API const char *pxop_describe(void);

/* Runs operation `name` on `in` with `count` parameter values in the order of
 * its params; the values are checked as the tool checks its options. On
 * PXOP_OK *out is a new image the caller releases with free_Image; otherwise
 * *out is null and `error` (when errorSize > 0) holds the message. `in` is
 * only read. */
PXFX_API int pxop_apply(const char *name, const Image *in, const double *values, int count, Image **out, char *error,
                        size_t errorSize);

#ifdef __cplusplus
}
#endif

#endif
