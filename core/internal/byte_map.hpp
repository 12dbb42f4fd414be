// Byte tables over rows of interleaved channels: byte k of every pixel goes
// through tables[k]. The per-channel table maps of pictures (map_channels in
// core/internal/channel_map.hpp) and of packed sample blocks end here, so the
// one routine that does the lookups can run them in vectors (the chosen
// target's copy, core/internal/cpu.hpp). Every path gives the same bytes as
// the plain loop.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pxfx {

// table[v] = v: the channel a map leaves alone (alpha).
extern const uint8_t kIdentityMap[256];

// Maps `pixels` pixels of `channels` bytes (1, 3 or 4) from in to out; in may
// equal out. tables holds `channels` pointers to 256-entry tables.
void map_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const uint8_t *const *tables);

// A tone map of 3- and 4-byte pixels (blue, green, red, alpha): blue and red
// through their tables, green raised (or, with lower, lowered) by q[red],
// saturating at 255 (or 0); alpha kept.
struct ToneTables {
    const uint8_t *b, *r, *q;
    bool lower;
};
void tone_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const ToneTables &t);

} // namespace pxfx
