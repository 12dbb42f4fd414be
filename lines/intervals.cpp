// Interval lists of (start, end) pairs: merging across small gaps and the
// overlap query. Lengths and gaps are formed in 64 bits, so extreme values
// compare exactly.
#include <pxfx/lines.h>

#include <algorithm>
#include <cstddef>

extern "C" {

int32_t CombineMinSpace(int32_t *intervals, int32_t n, int32_t minGap) {
    if (intervals == nullptr || n <= 0) return 0;
    if (minGap < 1) minGap = 2;
    const size_t count = static_cast<size_t>(n);
    size_t k = 0;
    for (size_t i = 0; i < count; ++i) {
        const int32_t s = intervals[2 * i];
        int32_t e = intervals[2 * i + 1];
        if (static_cast<int64_t>(e) - s < minGap) continue;
        // Absorb followers that start less than minGap after the current end;
        // the follower's end is taken as it is, even when it is smaller.
        while (i + 1 < count && static_cast<int64_t>(intervals[2 * (i + 1)]) - e < minGap) {
            ++i;
            e = intervals[2 * i + 1];
        }
        intervals[2 * k] = s;
        intervals[2 * k + 1] = e;
        ++k;
    }
    return static_cast<int32_t>(k);
}

int32_t CheckLapOver(const int32_t *intervals, int32_t n, int32_t *start, int32_t *end) {
    if (start == nullptr || end == nullptr) return 0;
    const int32_t qs = *start, qe = *end;
    // The best candidate is the overlap [bestStart, bestEnd]; a best end of 0
    // or less counts as no best, which is how the search starts.
    int64_t bestStart = 0, bestEnd = 0;
    int32_t chosenStart = 0, chosenEnd = 0;
    for (int32_t i = 0; intervals != nullptr && i < n; ++i) {
        const int32_t s = intervals[2 * static_cast<size_t>(i)], e = intervals[2 * static_cast<size_t>(i) + 1];
        if (e > qe) {
            if (s <= qe) {
                *start = s;
                *end = e;
                return 1;
            }
            const int64_t cs = std::max(s, qs), ce = std::min(e, qe);
            if (bestEnd <= 0 || ce - cs > bestEnd - bestStart) {
                bestStart = cs;
                bestEnd = ce;
                chosenStart = s;
                chosenEnd = e;
            }
        } else if (s >= qe) {
            break;
        }
    }
    if (bestEnd <= 0) {
        *start = 0;
        *end = 0;
        return 0;
    }
    const int64_t half = (static_cast<int64_t>(qe) - qs) >> 1;
    *start = chosenStart;
    *end = chosenEnd;
    return bestEnd - bestStart >= half ? 1 : 0;
}

} // extern "C"
