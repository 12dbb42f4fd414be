// Level histograms of byte samples and the Otsu threshold over one, shared by
// the binarisation, the white balance and the clip's grey stretch.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pxfx::packed {

// hist[v] = the number of i < n with level(i) == v (modulo 2^32). Four
// sub-histograms take turns, so that runs of equal levels do not wait on the
// store of the count before.
template <class Level> void count_levels(size_t n, uint32_t (&hist)[256], Level level) {
    uint32_t sub[4][256] = {};
    size_t i = 0;
    for (; i + 4 <= n; i += 4) {
        ++sub[0][level(i)];
        ++sub[1][level(i + 1)];
        ++sub[2][level(i + 2)];
        ++sub[3][level(i + 3)];
    }
    for (; i < n; ++i)
        ++sub[0][level(i)];
    for (int32_t v = 0; v < 256; ++v)
        hist[v] = sub[0][v] + sub[1][v] + sub[2][v] + sub[3][v];
}

// The Otsu threshold of a histogram, as ProbabilityDensityValue gives it for
// the plane counted (120 when the counts have no two classes).
int32_t otsu_threshold(const uint32_t (&hist)[256]);

} // namespace pxfx::packed
