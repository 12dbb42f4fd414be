// Line-band detection on a binarised plane and its run finder.
#include <pxfx/lines.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "lines/lines_internal.hpp"

using namespace pxfx;

namespace {

// Band codes cycle through labels 1..5.
constexpr int32_t kLabels = 5;

// Labels calm rows (no exclusion, at most t changes) with a counter that
// steps at every other row.
void label_calm_rows(int32_t *a, const int32_t *b, const int32_t *c, int32_t n, int32_t t) {
    int32_t run = 1;
    for (int32_t y = 0; y < n; ++y) {
        if (b[y] == -1 || c[y] > t) {
            a[y] = 0;
            ++run;
        } else {
            a[y] = run;
        }
    }
}

// Rows of a band: 0 where the row belongs to no long enough run, else
// label * 50 - 24 + pixel raised to 255 and kept to its low byte.
void mark_rows(const View &img, const int32_t *a, const int32_t *c, int32_t rows, int32_t cols) {
    for (int32_t y = 0; y < rows; ++y) {
        uint8_t *row = img.row(y);
        if (c[y] == 0) {
            std::memset(row, 0, static_cast<size_t>(cols));
            continue;
        }
        // Labels are 0..5, so the sum stays within 0..481.
        const int32_t base = a[y] * 50 - 24;
        for (int32_t x = 0; x < cols; ++x) {
            const int32_t v = base + row[x];
            row[x] = static_cast<uint8_t>(v < 255 ? 255 : v);
        }
    }
}

} // namespace

extern "C" {

int32_t CheckMaxSame(const int32_t *labels, int32_t n, int32_t *first, int32_t *last) {
    if (labels == nullptr || n <= 1) return 0;
    // The first label's value is the first run's start index; a value that
    // is not an index of the list starts it at index 0.
    int32_t start = labels[0];
    if (start < 0 || start >= n) start = 0;
    int32_t cur = 0, best = 0;
    for (int32_t i = 1; i < n; ++i) {
        if (i == n - 1 || labels[start] != labels[i]) {
            if (cur > best) {
                if (first != nullptr && last != nullptr) {
                    *first = start;
                    *last = i;
                }
                best = cur;
                start = i;
                cur = 0;
            }
        } else if (labels[start] != -1) {
            ++cur;
        }
    }
    return best;
}

} // extern "C"

namespace pxfx::lines {

Buffer<int32_t> line_scratch(const View &img) {
    return alloc_buffer<int32_t>(checked_size(static_cast<uint64_t>(img.height - 1), 3));
}

void mark_line_bands(const View &img, int32_t *scratch) {
    const int32_t height = img.height;
    const int32_t h1 = height - 1, cols = img.width - 10, q = img.width >> 2;
    int32_t *a = scratch, *b = a + h1, *c = b + h1;

    // Vertical changes per row in the central half.
    int32_t maxChanges = 0;
    for (int32_t y = 0; y < h1; ++y) {
        const uint8_t *r0 = img.row(y), *r1 = img.row(y + 1);
        int32_t n = 0;
        for (int32_t x = q; x < cols - q; ++x)
            n += r0[x] != r1[x];
        c[y] = n;
        maxChanges = n > maxChanges ? n : maxChanges;
    }

    // Calm rows labelled by stretch; the longest calm stretch, if long, is
    // excluded.
    int32_t run = 1;
    for (int32_t y = 0; y < h1; ++y) {
        if (c[y] < 4) {
            b[y] = run;
        } else {
            b[y] = 0;
            ++run;
        }
    }
    int32_t first = 0, last = 0;
    // CheckMaxSame reports 0 <= first and last <= h1 - 1.
    if (CheckMaxSame(b, h1, &first, &last) > 18)
        for (int32_t y = first; y < last; ++y)
            b[y] = -1;

    // Smallest change level at which some calm stretch gets long. From the
    // largest count of changes on, every level labels the rows alike, so the
    // search can stop there.
    const int32_t tEnd = cols / 3;
    int32_t t = tEnd;
    for (int32_t k = 4; k < tEnd; ++k) {
        label_calm_rows(a, b, c, h1, k);
        if (CheckMaxSame(a, h1, nullptr, nullptr) > 9) {
            t = k;
            break;
        }
        if (k >= maxChanges) break;
    }

    // Final band labels 1..5; busy rows here are those with at least t changes.
    int32_t label = 1, bands = 0, inBand = 0, total = 0;
    for (int32_t y = 0; y < h1; ++y) {
        if (b[y] == -1 || c[y] >= t) {
            a[y] = 0;
            if (inBand > 0) {
                label = label == kLabels ? 1 : label + 1;
                ++bands;
                inBand = 0;
            }
        } else {
            a[y] = label;
            ++inBand;
            ++total;
        }
    }
    const int32_t minLen = bands > 0 ? total / bands / 2 : total;

    // Lengths of the runs of equal labels that are long enough; the row that
    // ends a run never starts the next one.
    std::memset(c, 0, static_cast<size_t>(h1) * sizeof(int32_t));
    for (int32_t y = 0; y < h1;) {
        int32_t e = y;
        do {
            ++e;
        } while (e < height - 2 && a[e] == a[y]);
        const int32_t len = e - y;
        if (len >= minLen)
            for (int32_t i = y; i < e; ++i)
                c[i] = len;
        y = e + 1;
    }

    mark_rows(img, a, c, h1, cols);
}

} // namespace pxfx::lines

extern "C" {

int32_t DetectLines(Image *img) {
    if (!lines::markable(img)) return 0;
    if (lines::marks_nothing(img)) return 1;
    // Marking a record without pixels would write through its missing block.
    const std::optional<View> v = view_of(img);
    if (!v) return 0;
    Buffer<int32_t> scratch = lines::line_scratch(*v);
    if (!scratch) return 0;
    lines::mark_line_bands(*v, scratch.get());
    return 1;
}

} // extern "C"
