// Byte-table maps over interleaved rows: through pair tables, or whole
// vectors through the vector copy of the chosen target
// (core/byte_map_vector.cpp), where one runs, and the rest in the plain loop.
#include "core/internal/byte_map.hpp"

#include <bit>
#include <cstring>

#include "core/internal/vector_kernels.hpp"

namespace pxfx {

namespace {

// The table pointers are copied first: byte stores may alias them, and the
// copies stay in registers.
template <int C> void plain(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *tables) {
    const uint8_t *t[C];
    for (int k = 0; k < C; ++k)
        t[k] = tables[k];
    for (size_t i = 0; i < pixels; ++i)
        for (int k = 0; k < C; ++k)
            out[C * i + k] = t[k][in[C * i + k]];
}

uint8_t tone_green(uint32_t g, uint32_t d, bool lower) {
    return static_cast<uint8_t>(lower ? (g > d ? g - d : 0) : (g + d > 255 ? 255 : g + d));
}

template <int C> void plain_tone(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &tables) {
    const ToneTables t = tables;
    for (size_t i = 0; i < pixels; ++i) {
        const uint8_t *p = in + C * i;
        uint8_t *q = out + C * i;
        const uint8_t g = tone_green(p[1], t.q[p[2]], t.lower);
        q[0] = t.b[p[0]];
        q[1] = g;
        q[2] = t.r[p[2]];
        if constexpr (C == 4) q[3] = p[3];
    }
}

// ---- Pair tables ----------------------------------------------------------
// A pair table is indexed by two neighbouring bytes read as one 16-bit word
// and holds the word of their two mapped bytes; the words are the machine's
// own, so the tables and the lookups agree on either byte order.

constexpr size_t kPairEntries = 65536;
// Bytes to map per pair table for building it to pay (it costs about what
// mapping a few hundred thousand bytes saves).
constexpr size_t kBytesPerPairTable = size_t{1} << 19;

constexpr bool kLittle = std::endian::native == std::endian::little;

constexpr uint16_t pair_word(uint32_t first, uint32_t second) {
    return static_cast<uint16_t>(kLittle ? first | second << 8 : first << 8 | second);
}

// Shift of the word of bytes pos and pos + 1 (pos even) in an 8-byte word.
constexpr int pair_shift(int pos) { return kLittle ? 8 * pos : 8 * (6 - pos); }

void build_pairs(uint16_t *pairs, const uint8_t *first, const uint8_t *second) {
    for (uint32_t s = 0; s < 256; ++s)
        for (uint32_t f = 0; f < 256; ++f)
            pairs[pair_word(f, s)] = pair_word(first[f], second[s]);
}

void build_tone_pairs(uint16_t *pairs, const ToneTables &t) {
    for (uint32_t r = 0; r < 256; ++r)
        for (uint32_t g = 0; g < 256; ++g)
            pairs[pair_word(g, r)] = pair_word(tone_green(g, t.q[r], t.lower), t.r[r]);
}

// Pair j of a 24-byte block (bytes 2j and 2j + 1; 24 bytes hold whole
// pixels of 1, 3 and 4 bytes) goes through pattern j % kPatterns.
constexpr size_t kBlock = 24;
template <int C> constexpr int kPatterns = C == 1 ? 1 : (C == 3 ? 3 : 2);

// Word k of a block: its four pairs through patterns 4k .. 4k + 3. Words
// are loaded and stored one by one, so that no load spans two stores.
template <int P, int K> void pair_word_map(const uint8_t *in, uint8_t *out, const uint16_t *const *p) {
    uint64_t w, o = 0;
    std::memcpy(&w, in + 8 * K, 8);
    for (int j = 0; j < 4; ++j)
        o |= uint64_t{p[(4 * K + j) % P][(w >> pair_shift(2 * j)) & 0xFFFF]} << pair_shift(2 * j);
    std::memcpy(out + 8 * K, &o, 8);
}

template <int C> void pair_map(const uint8_t *in, uint8_t *out, size_t blocks, const uint16_t *const *patterns) {
    constexpr int P = kPatterns<C>;
    const uint16_t *p[P];
    for (int k = 0; k < P; ++k)
        p[k] = patterns[k];
    for (size_t i = 0; i < blocks; ++i, in += kBlock, out += kBlock) {
        pair_word_map<P, 0>(in, out, p);
        pair_word_map<P, 1>(in, out, p);
        pair_word_map<P, 2>(in, out, p);
    }
}

// Blue through its table, green and red as one pair, alpha kept. Two 4-byte
// pixels make one 8-byte word; eight 3-byte pixels three words, where the
// pair of the third pixel straddles the first two words. Little-endian
// words: the caller takes this route only there. Returns the pixels mapped.
template <int C>
size_t pair_tone(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *b, const uint16_t *gr) {
    auto blue = [b](uint64_t w, int pos) { return uint64_t{b[(w >> 8 * pos) & 255]} << 8 * pos; };
    auto pair = [gr](uint64_t w, int pos) { return uint64_t{gr[(w >> 8 * pos) & 0xFFFF]} << 8 * pos; };
    if constexpr (C == 4) {
        const size_t n = pixels / 2 * 2;
        for (size_t i = 0; i < n; i += 2, in += 8, out += 8) {
            uint64_t w;
            std::memcpy(&w, in, 8);
            const uint64_t o = blue(w, 0) | pair(w, 1) | blue(w, 4) | pair(w, 5) | (w & 0xFF000000FF000000u);
            std::memcpy(out, &o, 8);
        }
        return n;
    } else {
        const size_t n = pixels / 8 * 8;
        for (size_t i = 0; i < n; i += 8, in += 24, out += 24) {
            uint64_t w0, w1, w2;
            std::memcpy(&w0, in, 8);
            std::memcpy(&w1, in + 8, 8);
            std::memcpy(&w2, in + 16, 8);
            const uint32_t straddle = gr[(w0 >> 56 | w1 << 8) & 0xFFFF];
            const uint64_t o0 =
                blue(w0, 0) | pair(w0, 1) | blue(w0, 3) | pair(w0, 4) | blue(w0, 6) | uint64_t{straddle & 255} << 56;
            const uint64_t o1 = (straddle >> 8) | blue(w1, 1) | pair(w1, 2) | blue(w1, 4) | pair(w1, 5) | blue(w1, 7);
            const uint64_t o2 = pair(w2, 0) | blue(w2, 2) | pair(w2, 3) | blue(w2, 5) | pair(w2, 6);
            std::memcpy(out, &o0, 8);
            std::memcpy(out + 8, &o1, 8);
            std::memcpy(out + 16, &o2, 8);
        }
        return n;
    }
}

} // namespace

const uint8_t kIdentityMap[256] = {
#define PXFX_ROW(n)                                                                                                    \
    n, n + 1, n + 2, n + 3, n + 4, n + 5, n + 6, n + 7, n + 8, n + 9, n + 10, n + 11, n + 12, n + 13, n + 14, n + 15
    PXFX_ROW(0),   PXFX_ROW(16),  PXFX_ROW(32),  PXFX_ROW(48),  PXFX_ROW(64),  PXFX_ROW(80),
    PXFX_ROW(96),  PXFX_ROW(112), PXFX_ROW(128), PXFX_ROW(144), PXFX_ROW(160), PXFX_ROW(176),
    PXFX_ROW(192), PXFX_ROW(208), PXFX_ROW(224), PXFX_ROW(240),
#undef PXFX_ROW
};

ByteMap::ByteMap(int channels, const uint8_t *const *tables, size_t pixels, bool inPlace)
    : channels_(channels), tone_(false) {
    const int c = channels == 1 || channels == 3 ? channels : 4;
    for (int k = 0; k < c; ++k)
        tables_[k] = tables[k];
    if (pixels * static_cast<size_t>(c) < kBytesPerPairTable || !vec::pair_tables_pay(c, false, inPlace)) return;
    // Pattern k maps the bytes of channels 2k and 2k + 1 (modulo the pixel);
    // patterns of the same two tables share one pair table.
    const int patterns = c == 1 ? kPatterns<1> : (c == 3 ? kPatterns<3> : kPatterns<4>);
    const uint8_t *first[3], *second[3];
    int source[3], distinct = 0;
    for (int k = 0; k < patterns; ++k) {
        first[k] = tables_[2 * k % c], second[k] = tables_[(2 * k + 1) % c];
        source[k] = k;
        for (int j = 0; j < k && source[k] == k; ++j)
            if (std::memcmp(first[j], first[k], 256) == 0 && std::memcmp(second[j], second[k], 256) == 0)
                source[k] = source[j];
        distinct += source[k] == k;
    }
    if (pixels * static_cast<size_t>(c) < kBytesPerPairTable * static_cast<size_t>(distinct)) return;
    pairs_ = alloc_buffer<uint16_t>(kPairEntries * static_cast<size_t>(distinct));
    if (!pairs_) return;
    uint16_t *next = pairs_.get();
    for (int k = 0; k < patterns; ++k) {
        if (source[k] == k) {
            build_pairs(next, first[k], second[k]);
            patterns_[k] = next;
            next += kPairEntries;
        } else {
            patterns_[k] = patterns_[source[k]];
        }
    }
}

ByteMap::ByteMap(int channels, const ToneTables &tone, size_t pixels)
    : channels_(channels == 3 ? 3 : 4), tone_(true), toneTables_(tone) {
    if (!kLittle || !vec::pair_tables_pay(channels_, true, false) ||
        pixels * static_cast<size_t>(channels_) < kBytesPerPairTable)
        return;
    pairs_ = alloc_buffer<uint16_t>(kPairEntries);
    if (pairs_) build_tone_pairs(pairs_.get(), tone);
}

void ByteMap::operator()(const uint8_t *in, uint8_t *out, size_t pixels) const {
    const int c = channels_ == 1 || channels_ == 3 ? channels_ : 4;
    const auto bytes = static_cast<size_t>(c);
    if (tone_) {
        size_t done = 0;
        if (pairs_)
            done = c == 3 ? pair_tone<3>(in, out, pixels, toneTables_.b, pairs_.get())
                          : pair_tone<4>(in, out, pixels, toneTables_.b, pairs_.get());
        else if (const vec::ToneBytes vector = vec::tone_bytes(c))
            done = vector(in, out, pixels, toneTables_);
        in += done * bytes, out += done * bytes, pixels -= done;
        if (c == 3)
            plain_tone<3>(in, out, pixels, toneTables_);
        else
            plain_tone<4>(in, out, pixels, toneTables_);
        return;
    }
    if (pairs_) {
        const size_t blocks = pixels * bytes / kBlock;
        switch (c) {
        case 1: pair_map<1>(in, out, blocks, patterns_); break;
        case 3: pair_map<3>(in, out, blocks, patterns_); break;
        default: pair_map<4>(in, out, blocks, patterns_); break;
        }
        in += blocks * kBlock, out += blocks * kBlock, pixels -= blocks * kBlock / bytes;
    } else if (const vec::MapBytes vector = vec::map_bytes(c)) {
        const size_t done = vector(in, out, pixels, tables_);
        in += done * bytes, out += done * bytes, pixels -= done;
    }
    switch (c) {
    case 1: plain<1>(in, out, pixels, tables_); break;
    case 3: plain<3>(in, out, pixels, tables_); break;
    default: plain<4>(in, out, pixels, tables_); break;
    }
}

void map_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const uint8_t *const *tables) {
    ByteMap(channels, tables, pixels, in == out)(in, out, pixels);
}

void tone_bytes(const uint8_t *in, uint8_t *out, size_t pixels, int channels, const ToneTables &t) {
    ByteMap(channels, t, pixels)(in, out, pixels);
}

} // namespace pxfx
