// The reuse-the-slot rule on sources of an empty size. The registry's
// contracts state it for the typical call of each function (checked with
// the contract); family tests run it on calls whose parameter takes another
// branch.
#pragma once

#include "support/test_images.hpp"

namespace pxtest {

using SlotCall = std::function<uint32_t(Image *, Image **)>;

// fn(src, slot, args...) as a SlotCall.
template <class Fn, class... Args> SlotCall bind_slot(Fn fn, Args... args) {
    return [=](Image *s, Image **d) { return uint32_t(fn(s, d, args...)); };
}

struct SlotRuleCase {
    const char *name;
    SlotCall call;
    const char *want;      // as pxop::Contract::empty_sources
    bool readsSlot = true; // false: it overwrites the slot without looking at it
};

// Sources of an empty size with a matching record in the slot: the call
// returns what its steps give and leaves the record as `want` says. A reused
// record without pixels is drawn into by nothing (1).
inline void expect_slot_rule(const SlotRuleCase &c) {
    const int32_t shapes[][4] = {{0, 7, 12, 84}, {INT32_MIN, 7, 12, 84}, {9, -7, 28, 64}, {-9, -7, 28, 64}};
    // A caller's record allocated as the library allocates (so that a call
    // may release it), its block filled with 0x5A.
    auto held = [](int32_t w, int32_t h, uint32_t pitch, size_t bytes) {
        Image *im = static_cast<Image *>(PX_malloc(sizeof(Image)));
        *im = Image{w, h, 24, bytes ? static_cast<uint8_t *>(PX_malloc(bytes)) : nullptr, pitch, 0};
        if (bytes) std::memset(im->bits, 0x5A, bytes);
        return im;
    };
    for (int i = 0; i < 4; ++i) {
        const auto [w, h, pitch, bytes] = shapes[i];
        std::vector<uint8_t> block(static_cast<size_t>(bytes));
        for (size_t j = 0; j < block.size(); ++j)
            block[j] = uint8_t(j * 7 + 1);
        Image src{w, h, 24, block.data(), uint32_t(pitch), 0};
        Image *kept = held(w, h, uint32_t(pitch), size_t(bytes)), *slot = kept;
        const char what = c.want[3 * i + 1];
        EXPECT_EQ(c.call(&src, &slot), uint32_t(c.want[3 * i] - '0')) << c.name << " " << i;
        if (what == 'r') {
            EXPECT_EQ(slot, nullptr) << c.name << " " << i;
            continue;
        }
        ASSERT_EQ(slot, kept) << c.name << " " << i;
        const std::vector<uint8_t> got(slot->bits, slot->bits + bytes), fill(size_t(bytes), what == 'z' ? 0 : 0x5A);
        EXPECT_TRUE(got == (what == 'c' ? block : fill)) << c.name << " " << i;
        free_Image(&slot, 0);
    }
    if (!c.readsSlot) return;
    Owned src = random_image(9, 7, 24, 5);
    Image *hollow = held(9, 7, 28, 0), *slot = hollow;
    EXPECT_EQ(c.call(src.get(), &slot), 1u) << c.name;
    EXPECT_TRUE(slot == hollow && slot->bits == nullptr) << c.name;
    free_Image(&slot, 0);
}

} // namespace pxtest
