// Building blocks shared by the line-detection sources and reachable from the
// tests: the boundary search and straightening of RecognizeYUV, and the two
// first steps of BinImg.
#pragma once

#include <pxfx/lines.h>

#include <cstdint>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/view.hpp"

namespace pxfx::lines {

// Smallest plane RecognizeYUV accepts. The boundary's mean level is taken
// over columns 65 .. width - 56, which hold no column below 121 (the mean
// would divide by zero, and at 120 the line's slope too). Below 13 rows the
// sample strips, which start at row 10 and end 3 rows above the bottom, walk
// no row, so both boundary rows are height - 2 and the mean always reads rows
// height .. height + 5, below the picture.
inline constexpr int32_t kMinRecognizeWidth = 121;
inline constexpr int32_t kMinRecognizeHeight = 13;

// Boundary row of every column of a plane of at least kMinRecognizeWidth x
// kMinRecognizeHeight: the line through the two strip boundaries, shifted by
// the edge refinement. `line` holds width entries.
void detect_boundary(const View &img, int32_t *line);

// result(r, c) = img(line[c] + r, c) for the rows that every column can fill;
// rows above the picture read as row 0. The rest of res is left as it is.
// res may be img itself. Returns the number of rows filled (0 or below: none).
int64_t straighten(const View &img, const int32_t *line, const View &res);

// Binarises src into dst (same size, 8 bits) in bands of 37 rows: 1 for levels
// up to the band's threshold, 255 above. src and dst may be the same image.
void band_threshold(const View &src, const View &dst);

// A 1 between two pixels that are not 1 becomes 255.
void remove_isolated_dots(const View &img);

// True for an 8-bit record that the line-band marking can run on: rows its
// block holds, at least one row (its scratch lists have height - 1 entries
// and are cleared; none could be cleared for fewer), and a width from which
// width - 10 can be formed. Such a record without pixels may still be marked
// when marks_nothing holds.
inline bool markable(const Image *img) {
    return img != nullptr && img->bitCount == 8 && rows_inside(img) && img->height > 0 && img->width >= INT32_MIN + 10;
}

// True when the marking of a markable record touches no pixel: one row has no
// pair of rows to compare, and it marks columns 0 .. width - 11 only.
inline bool marks_nothing(const Image *img) { return img->height == 1 || img->width <= 10; }

// Scratch of the line-band marking of a plane with pixels for which
// marks_nothing does not hold (three words per row but one); empty when it
// cannot be had.
Buffer<int32_t> line_scratch(const View &img);

// Marks the line bands of such a binarised plane in place.
void mark_line_bands(const View &img, int32_t *scratch);

} // namespace pxfx::lines
