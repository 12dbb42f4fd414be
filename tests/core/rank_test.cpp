// The sliding histograms of the rank filters against sorted copies of random
// windows: byte and word samples, counts of several widths, samples entering
// and leaving in random order, ranks drawn anew at every step, also through
// a cross window that adds a centre and leaves it out again. Merged and slid
// column histograms and the most frequent level are checked through their
// users: oil painting and level compression.
#include "core/internal/rank.hpp"
#include "support/test_images.hpp"

using namespace pxfx;

namespace {

// A sample from the whole range, or from a few levels at both ends and in the
// middle, so that windows hold ties and long runs of empty groups.
template <int32_t Levels> int32_t draw(std::mt19937 &rng, bool few) {
    const int32_t some[] = {0, 1, 2, Levels / 2 - 1, Levels / 2, Levels - 2, Levels - 1};
    return few ? some[rng() % 7] : static_cast<int32_t>(rng() % Levels);
}

template <int32_t Levels, class Count> void check_windows(uint32_t seed) {
    auto grouped = std::make_unique<rank::GroupedHistogram<Levels, Count>>();
    auto flat = std::make_unique<rank::Histogram<Levels, Count>>();
    // The other arm of a cross window: its centre alone, left out once.
    auto arm = std::make_unique<rank::GroupedHistogram<Levels, Count>>();
    arm->reset();
    std::mt19937 rng(seed);
    for (size_t size : {1, 2, 9, 49, 250}) {
        for (bool few : {false, true}) {
            grouped->reset();
            flat->reset();
            rank::Cursor cursor{};
            std::vector<int32_t> win;
            for (size_t step = 0; step < 3 * size + 40; ++step) {
                if (win.empty() || (win.size() < size && rng() % 3 != 0)) {
                    win.push_back(draw<Levels>(rng, few));
                    grouped->add(win.back());
                    flat->add(win.back());
                    cursor.added(win.back());
                } else {
                    std::swap(win[rng() % win.size()], win.back());
                    grouped->remove(win.back());
                    flat->remove(win.back());
                    cursor.removed(win.back());
                    win.pop_back();
                    if (win.empty()) continue;
                }
                std::vector<int32_t> s = win;
                std::sort(s.begin(), s.end());
                const uint32_t n = static_cast<uint32_t>(s.size()), k = rng() % n;
                SCOPED_TRACE(testing::Message() << Levels << " levels, window " << size << ", step " << step);
                EXPECT_EQ(rank::kth_smallest(*grouped, k), s[k]);
                EXPECT_EQ(rank::kth_largest(*grouped, k), s[n - 1 - k]);
                EXPECT_EQ(cursor.settle(*flat, static_cast<int32_t>(k)), s[k]);
                const int32_t centre = s[rng() % n];
                arm->add(centre);
                EXPECT_EQ(rank::kth_smallest(rank::Cross(*grouped, *arm, centre), k), s[k]) << centre;
                EXPECT_EQ(rank::kth_largest(rank::Cross(*grouped, *arm, centre), k), s[n - 1 - k]) << centre;
                arm->remove(centre);
                for (int32_t v : {s[k], s[k] + 1, s[k] - 1, draw<Levels>(rng, few)}) {
                    if (v < 0 || v >= Levels) continue;
                    const auto above = s.end() - std::upper_bound(s.begin(), s.end(), v);
                    EXPECT_EQ(rank::count_above(*grouped, v), static_cast<uint32_t>(above)) << v;
                }
            }
        }
    }
}

} // namespace

TEST(Rank, QueriesMatchSortedWindows) {
    check_windows<256, uint8_t>(1);
    check_windows<256, uint32_t>(2);
    check_windows<65536, uint16_t>(3);
    check_windows<65536, uint32_t>(4);
}
