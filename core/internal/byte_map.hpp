// Byte tables over rows of interleaved channels: byte k of every pixel goes
// through tables[k]. The per-channel table maps of pictures (map_channels in
// core/internal/channel_map.hpp) and of packed sample blocks end here, so the
// one routine that does the lookups can run them in vectors (the chosen
// target's copy, core/internal/cpu.hpp) or through pair tables. Every path
// gives the same bytes as the plain loop.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/internal/memory.hpp"

namespace pxfx {

// table[v] = v: the channel a map leaves alone (alpha).
extern const uint8_t kIdentityMap[256];

// A tone map of 3- and 4-byte pixels (blue, green, red, alpha): blue and red
// through their tables, green raised (or, with lower, lowered) by q[red],
// saturating at 255 (or 0); alpha kept.
struct ToneTables {
    const uint8_t *b, *r, *q;
    bool lower;
};

// A byte map set up once for the rows of a picture. Where the chosen target
// looks bytes up faster in pair tables than in its vectors
// (vec::pair_tables_pay), and the pixels to map are enough to pay for
// building them, two neighbouring bytes go through one lookup in a table of
// 65536 two-byte entries, one such table per pattern of channels. Otherwise
// the rows go through the target's vector copy and the plain loop.
class ByteMap {
  public:
    // Pixels of `channels` bytes (1, 3 or 4) through tables[0 .. channels - 1],
    // about `pixels` pixels in all, mapped in place or not as inPlace says
    // (a choice of route: either way gives the same bytes).
    ByteMap(int channels, const uint8_t *const *tables, size_t pixels, bool inPlace);
    // The tone map of 3- or 4-byte pixels.
    ByteMap(int channels, const ToneTables &tone, size_t pixels);

    // Maps `pixels` pixels from in to out; in may equal out.
    void operator()(const uint8_t *in, uint8_t *out, size_t pixels) const;

  private:
    int channels_;
    bool tone_;
    const uint8_t *tables_[4] = {};
    ToneTables toneTables_ = {};
    Buffer<uint16_t> pairs_;
    const uint16_t *patterns_[3] = {};
};

// One map over a single run of pixels.
void map_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const uint8_t *const *tables);
void tone_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const ToneTables &t);

} // namespace pxfx
