// Building blocks shared by the line-detection sources and reachable from the
// tests: result delivery, the boundary search and straightening of
// RecognizeYUV, and the two first steps of BinImg.
#pragma once

#include <pxfx/lines.h>

#include <cstdint>

#include "core/internal/memory.hpp"

namespace pxfx::lines {

// Smallest plane RecognizeYUV accepts. Its sample strips read columns 50..79
// and width - 70 .. width - 41 from row 10 on, and its boundary line runs from
// column 65 to column width - 55, so at least one column must lie between them.
inline constexpr int32_t kMinRecognizeWidth = 121;
inline constexpr int32_t kMinRecognizeHeight = 13;

// Hands a finished result to the caller: with out null it replaces the pixels
// of img, with *out null the image itself is handed over, otherwise it is
// copied into *out. Always 1.
int32_t deliver(Image *img, Image **out, ImagePtr result);

// Boundary row of every column of a plane of at least kMinRecognizeWidth x
// kMinRecognizeHeight: the line through the two strip boundaries, shifted by
// the edge refinement. `line` holds width entries.
void detect_boundary(const Image *img, int32_t *line);

// result(r, c) = img(line[c] + r, c) for the rows that every column can fill;
// rows above the picture read as row 0. The rest of res is left as it is.
void straighten(const Image *img, const int32_t *line, Image *res);

// Binarises src into dst (same size, 8 bits) in bands of 37 rows: 1 for levels
// up to the band's threshold, 255 above. src and dst may be the same image.
void band_threshold(const Image *src, Image *dst);

// A 1 between two pixels that are not 1 becomes 255.
void remove_isolated_dots(Image *img);

// Scratch of the line-band marking of a plane of two rows or more (three
// words per row but one); empty when it cannot be had.
Buffer<int32_t> line_scratch(const Image *img);

// Marks the line bands of a binarised plane of two rows or more in place.
void mark_line_bands(Image *img, int32_t *scratch);

} // namespace pxfx::lines
