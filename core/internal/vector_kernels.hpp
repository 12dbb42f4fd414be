// The kernels that have vector code, each as its copy for the chosen target
// (core/internal/cpu.hpp); null where the plain loops run. Every copy gives
// the same bytes as the plain loop it stands for.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/internal/byte_map.hpp"

namespace pxfx {
struct ExactDivisor; // core/internal/math.hpp
}

namespace pxfx::vec {

// Median of the 5 x 5 window of byte samples: rows[0..4] are the window's
// padded rows (2 * channels samples readable before and after), out[i] gets
// the median of sample i for i < n.
using Median5Row = void (*)(const uint8_t *const *rows, int32_t channels, size_t n, uint8_t *out);
// Element 9 (from 0) of 19 bytes: for out[i], i < n, the bytes i of rows[0..4]
// (a column of five rows) and the fourteen others of rows[2] from i - 7 to
// i + 7 (rows[2] readable 7 bytes before and after).
using Cross19Row = void (*)(const uint8_t *const *rows, size_t n, uint8_t *out);

// Byte-table maps of core/internal/byte_map.hpp over whole vectors: they map
// the first pixels, a multiple of the vector size, and return how many; the
// caller maps the rest.
using MapBytes = size_t (*)(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *tables);
using ToneBytes = size_t (*)(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t);

// The conversions of a colour mode of color/colorspace.hpp (from_rgb and
// to_rgb) over whole vectors of byte pixels, as the maps above: they convert
// the first pixels, a multiple of the vector size, and return how many.
// Split writes the three component planes and, when alpha is not null, the
// alpha plane (255 for 3-byte pixels); Combine reads the alpha plane for
// 4-byte pixels only.
using SplitPlanes = size_t (*)(const uint8_t *in, size_t pixels, uint8_t *p1, uint8_t *p2, uint8_t *p3, uint8_t *alpha);
using CombinePlanes = size_t (*)(const uint8_t *p1, const uint8_t *p2, const uint8_t *p3, const uint8_t *alpha,
                                 size_t pixels, uint8_t *out);

// Local means of a photocopy row: rows[0..4] are five gray rows of n + 4
// samples; output i (column i + 2) is the 5 x 5 window centred there:
// u[i] = its (1 2 4 2 1)^T (1 2 4 2 1) weighted sum / 100 and ratio[i] =
// 1000 u[i] / (its sum / 25), or kNoRatio where that mean is 0. cols holds
// 2 (n + 4) words of room. Does the first outputs, a multiple of the vector
// size, and returns how many.
inline constexpr int32_t kNoRatio = -1;
using PhotocopyMeans = size_t (*)(const uint8_t *const *rows, size_t n, uint16_t *cols, uint8_t *u, int32_t *ratio);
// The photocopy tone of gray[i] from u[i] and ratio[i] (as photocopy_means
// gives them) under the dark and bright thresholds t1 (0 .. 990) and t2
// (0 .. 1009), into out[i]; the first outputs of n, as above.
using PhotocopyTone = size_t (*)(const uint8_t *gray, const uint8_t *u, const int32_t *ratio, size_t n, int32_t t1,
                                 int32_t t2, uint8_t *out);

// Oil's windows along a row, for windows of at most 257 pixels (16-bit
// sums): win holds kOilBins words, four per intensity class (its count
// times kOilCount, red, green and blue sums), of the window before pixel
// `first`; the column histograms, in the same layout, lie kOilBins words
// apart from cols. For x = first .. end - 1 the window adds column x + r and
// subtracts column x - r - 1, and colours[x - first] gets blue | green << 8 |
// red << 16: the sums of the most populated class (the lowest on a tie)
// divided by its count n through reciprocal[n]. win ends as the window of
// end - 1.
inline constexpr size_t kOilBins = 32;
inline constexpr uint16_t kOilCount = 8;
using OilWindows = void (*)(const uint16_t *cols, size_t r, size_t first, size_t end, uint16_t *win,
                            const ExactDivisor *reciprocal, uint32_t *colours);
// Oil's column histograms (kOilBins words each, in the layout above) moved
// down one row: column x, for x < n, loses pixel x of `leave` and gains
// pixel x of `enter`, pixels of 3 or 4 bytes (blue, green, red, alpha).
// Moves the first columns, a multiple of the vector size, and returns how
// many.
using OilMoves = size_t (*)(const uint8_t *leave, const uint8_t *enter, size_t n, uint16_t *cols);

// Auto levels with a local screen over one row of `pixels` pixels of
// `channels` bytes (1, 3 or 4, the fourth alpha): cur is the row, mUp, mCur
// and mDown the rows above, itself and below through the levels map. For
// byte i of a pixel with both neighbours in the row, n = (mCur[i - channels]
// + mCur[i + channels] + mUp[i] + mDown[i] + 2) / 4, the screen
// s = 255 - (255 - n)(255 - mCur[i]) / 255, and out[i] = (amount s +
// (100 - amount) cur[i]) / 100; alpha bytes are copied. Does pixels 1 .. k
// for k a multiple of the vector size and returns k.
using GradationRow = size_t (*)(const uint8_t *cur, const uint8_t *mUp, const uint8_t *mCur, const uint8_t *mDown,
                                size_t pixels, int channels, int32_t amount, uint8_t *out);

// The drawing gray of the first pixels of 3 or 4 bytes (blue, green, red
// and alpha) into one byte each; does a multiple of the vector size and
// returns how many.
using DrawingGray = size_t (*)(const uint8_t *in, size_t pixels, uint8_t *out);

// Convolution of byte samples with a kernel of size x size weights (size at
// most 7): out[i] = the sum of kernel[ky * size + kx] *
// rows[ky][i + (kx - size / 2) * channels], shifted right by `shift` and
// clamped to 0..255, for i < n; rows are the window's padded rows, out is none
// of them. The sums are held in 16 bits: 255 times the sum of the weights'
// magnitudes must stay below 32768. Rows shorter than a vector are left to
// the plain loop (false, nothing written).
using ConvolveBytes = bool (*)(const uint8_t *const *rows, const int32_t *kernel, int32_t size, int32_t channels,
                               size_t n, int32_t shift, uint8_t *out);

// Box sums of byte samples over a window of size x size (3, 5 or 7; channels
// 1 or 3): box(i) = the sum of rows[ky][i + (kx - size / 2) * channels] over
// the window, rows being the window's padded rows. For i < n, with `centre`
// 0 out[i] = box(i) / size^2, truncated; else out[i] = centre *
// rows[size / 2][i] - box(i) clamped to 0..255 (centre at most 128). out is
// none of the rows. Rows shorter than a vector are left to the plain loop
// (false, nothing written).
using WindowBoxBytes = bool (*)(const uint8_t *const *rows, int32_t size, int32_t channels, size_t n, int32_t centre,
                                uint8_t *out);

// One row of box means of byte samples, for boxes of size x size with size 2
// .. 11 (kMinBoxBytes .. kMaxBoxBytes). cols holds the 16-bit column sums of
// the row's boxes, `channels` interleaved, for the pixels -size / 2 ..
// width - 1 + size - 1 - size / 2; the n = width x channels sums of the
// pixels 0 .. width - 1 start at cols + size / 2 x channels and are the ones
// kept: when `in` is not null they first add the entering row's samples and
// subtract the leaving row `gone`'s, then the others repeat the edge pixels'.
// out[i] = the sum of the box of sample i divided by size^2, truncated, plus
// `offset`, clamped to 0..255. out may be `in` or `gone`.
using BoxBytes = void (*)(const uint8_t *in, const uint8_t *gone, uint16_t *cols, size_t n, int32_t size,
                          int32_t channels, int32_t offset, uint8_t *out);
inline constexpr int32_t kMinBoxBytes = 2, kMaxBoxBytes = 11;

// The horizontal blend of the bilinear resize over one row of n result
// samples: h[k] = omw[k] * row[i0[k]] + w[k] * row[i1[k]], the bytes as
// floats. The samples go in groups of kResizeGroup: group g reads the 16
// bytes at row + from[g], and groups[g] holds the shuffles that put the
// offset of each sample's byte among them into the low byte of its 32-bit
// lane (0x80 in the three others), then the group's weights. A group with
// from[g] < 0 (taps more than 16 bytes apart or a row shorter than 16) and
// the last n % kResizeGroup samples are blended one by one.
inline constexpr size_t kResizeGroup = 4;
struct alignas(16) ResizeGroup {
    uint8_t first[16], second[16]; // for the taps i0 and i1
    float omw[kResizeGroup], w[kResizeGroup];
};
struct ResizeColumns {
    const int32_t *i0, *i1;
    const float *w, *omw;
    const int32_t *from;
    const ResizeGroup *groups;
    size_t n;
};
using ResizeAcross = void (*)(const uint8_t *row, const ResizeColumns &columns, float *h);
// The vertical blend of two blended rows of samples in about 0..255 (as
// blends of bytes under weights in 0..1 give them): out[k] = the low byte of
// max(0, (int32_t)(omw * top[k] + w * bottom[k])), every sum inside int32,
// for the first k < n, a multiple of the vector size; returns how many.
using ResizeDown = size_t (*)(const float *top, const float *bottom, float omw, float w, size_t n, uint8_t *out);

// The 2x zoom of the source rows a and b (the row below a, or a again at the
// bottom) into the result rows even and odd, pixels of `bytes` bytes (1 or 3:
// bytes averaged one by one; 2: little-endian 16-bit words): for source pixel
// x, even gets a[x] then (a[x] + a[x + 1] + 1) >> 1, and odd the rounded
// averages of those two and their counterparts from b. Does pixels 0 .. k - 1
// for a k below `pixels` (the last pixel, whose neighbour is itself, is the
// caller's) and returns k.
using ZoomRows = size_t (*)(const uint8_t *a, const uint8_t *b, size_t pixels, uint8_t *even, uint8_t *odd);

#ifdef PXFX_PORTABLE_ONLY
inline Median5Row median5_row() { return nullptr; }
inline Cross19Row cross19_row() { return nullptr; }
inline MapBytes map_bytes(int) { return nullptr; }
inline ToneBytes tone_bytes(int) { return nullptr; }
inline bool pair_tables_pay(int, bool, bool) { return false; }
inline SplitPlanes split_planes(int, int) { return nullptr; }
inline CombinePlanes combine_planes(int, int) { return nullptr; }
inline PhotocopyMeans photocopy_means() { return nullptr; }
inline PhotocopyTone photocopy_tone() { return nullptr; }
inline OilWindows oil_windows() { return nullptr; }
inline OilMoves oil_moves(int) { return nullptr; }
inline GradationRow gradation_row() { return nullptr; }
inline DrawingGray drawing_gray(int) { return nullptr; }
inline ConvolveBytes convolve_bytes() { return nullptr; }
inline WindowBoxBytes window_box_bytes() { return nullptr; }
inline BoxBytes box_bytes() { return nullptr; }
inline ResizeAcross resize_across() { return nullptr; }
inline ResizeDown resize_down() { return nullptr; }
inline ZoomRows zoom_rows(int) { return nullptr; }
#else
Median5Row median5_row();
Cross19Row cross19_row();
// For pixels of `channels` bytes (1, 3 or 4; 3 or 4 for the tone map).
MapBytes map_bytes(int channels);
ToneBytes tone_bytes(int channels);
// Whether byte maps (tone maps with tone) of large pictures of `channels`
// bytes run faster through pair tables in the plain code (ByteMap) than
// through the vector copies: every map on x86 with 16-byte vectors, whose
// 256-entry lookups take sixteen shuffles and blends, and maps of 3-byte
// pixels in place with 32-byte vectors, which must split and join their
// channels (out of place, both wait on memory and the vectors keep ahead).
bool pair_tables_pay(int channels, bool tone, bool inPlace);
// For a mode number and pixels of `channels` bytes (3 or 4); null for the
// modes without vector code (RGB, XYZ).
SplitPlanes split_planes(int mode, int channels);
CombinePlanes combine_planes(int mode, int channels);
PhotocopyMeans photocopy_means();
PhotocopyTone photocopy_tone();
OilWindows oil_windows();
// For pixels of `channels` bytes, 3 or 4.
OilMoves oil_moves(int channels);
GradationRow gradation_row();
// For pixels of `channels` bytes, 3 or 4.
DrawingGray drawing_gray(int channels);
ConvolveBytes convolve_bytes();
WindowBoxBytes window_box_bytes();
BoxBytes box_bytes();
ResizeAcross resize_across();
ResizeDown resize_down();
// For pixels of `bytes` bytes, 1, 2 or 3.
ZoomRows zoom_rows(int bytes);
#endif

} // namespace pxfx::vec
