// The sliding histograms of the rank filters against sorted copies of random
// windows: byte and word samples, counts of several widths, samples entering
// and leaving in random order, ranks drawn anew at every step.
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <random>
#include <vector>

#include "core/internal/rank.hpp"

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
                for (int32_t v : {s[k], s[k] + 1, s[k] - 1, draw<Levels>(rng, few)}) {
                    if (v < 0 || v >= Levels) continue;
                    const auto above = s.end() - std::upper_bound(s.begin(), s.end(), v);
                    EXPECT_EQ(rank::count_above(*grouped, v), static_cast<uint32_t>(above)) << v;
                }
            }
        }
    }
}

// A column and a row sharing their centre: ranks of the two taken as one
// window with the centre once.
template <int32_t Levels> void check_crosses(uint32_t seed) {
    auto colG = std::make_unique<rank::GroupedHistogram<Levels, uint16_t>>();
    auto rowG = std::make_unique<rank::GroupedHistogram<Levels, uint16_t>>();
    auto colF = std::make_unique<rank::Histogram<Levels, uint16_t>>();
    auto rowF = std::make_unique<rank::Histogram<Levels, uint16_t>>();
    std::mt19937 rng(seed);
    for (int trial = 0; trial < 200; ++trial) {
        const bool few = trial % 2 == 1;
        colG->reset(), rowG->reset(), colF->reset(), rowF->reset();
        const int32_t centre = draw<Levels>(rng, few);
        std::vector<int32_t> all = {centre};
        for (auto [g, f] : {std::pair{colG.get(), colF.get()}, std::pair{rowG.get(), rowF.get()}}) {
            g->add(centre), f->add(centre);
            for (uint32_t i = rng() % 15; i > 0; --i) {
                all.push_back(draw<Levels>(rng, few));
                g->add(all.back()), f->add(all.back());
            }
        }
        std::sort(all.begin(), all.end());
        const uint32_t k = rng() % all.size();
        rank::Cursor cursor{};
        EXPECT_EQ(rank::kth_smallest(rank::Cross{*colG, *rowG, centre}, k), all[k]) << trial;
        EXPECT_EQ(cursor.settle(rank::Cross{*colF, *rowF, centre}, static_cast<int32_t>(k)), all[k]) << trial;
    }
}

} // namespace

TEST(Rank, QueriesMatchSortedWindows) {
    check_windows<256, uint8_t>(1);
    check_windows<256, uint32_t>(2);
    check_windows<65536, uint16_t>(3);
    check_windows<65536, uint32_t>(4);
    check_crosses<256>(5);
    check_crosses<65536>(6);
}

// Most frequent level of a range, the lowest on a tie, against a scan of the
// samples; counts drawn from few values so that ties are common.
TEST(Rank, MostFrequentLevelOfARange) {
    std::mt19937 rng(7);
    rank::Histogram<256, uint32_t> h;
    h.reset();
    std::vector<int32_t> samples;
    for (int i = 0; i < 600; ++i) {
        samples.push_back(static_cast<int32_t>(rng() % 40 * 6 + rng() % 2));
        h.add(samples.back());
    }
    for (int trial = 0; trial < 300; ++trial) {
        const int32_t first = static_cast<int32_t>(rng() % 256);
        const int32_t end = first + 1 + static_cast<int32_t>(rng() % static_cast<uint32_t>(256 - first));
        int32_t best = first;
        for (int32_t v = first; v < end; ++v)
            if (std::count(samples.begin(), samples.end(), v) > std::count(samples.begin(), samples.end(), best))
                best = v;
        EXPECT_EQ(rank::most_frequent(h, first, end), best) << first << ".." << end;
    }
}

// Weighted histograms of columns, merged into a window and slid along a row,
// equal the histogram of the window's samples counted afresh; 32-bit sums
// wrap on the way and come back exact.
TEST(Rank, SlidingColumnHistogramsEqualTheWindowsOwn) {
    constexpr uint32_t kLevels = 8, kCols = 40, kRows = 5, kSide = 7;
    using H = rank::Histogram<kLevels, uint32_t>;
    std::mt19937 rng(8);
    int32_t level[kCols][kRows];
    uint32_t weight[kCols][kRows];
    std::vector<H> cols(kCols);
    for (uint32_t x = 0; x < kCols; ++x) {
        cols[x].reset();
        for (uint32_t y = 0; y < kRows; ++y) {
            level[x][y] = static_cast<int32_t>(rng() % kLevels), weight[x][y] = rng() % 2 ? rng() : rng() % 300;
            cols[x].add(level[x][y], weight[x][y]);
        }
    }
    H win;
    win.reset();
    for (uint32_t x = 0; x < kSide; ++x)
        win.merge(cols[x]);
    for (uint32_t x0 = 0; x0 + kSide <= kCols; ++x0) {
        if (x0 > 0) win.slide(cols[x0 + kSide - 1], cols[x0 - 1]);
        H fresh;
        fresh.reset();
        for (uint32_t x = x0; x < x0 + kSide; ++x)
            for (uint32_t y = 0; y < kRows; ++y)
                fresh.add(level[x][y], weight[x][y]);
        for (int32_t v = 0; v < static_cast<int32_t>(kLevels); ++v)
            EXPECT_EQ(win.count(v), fresh.count(v)) << x0 << " " << v;
    }
}
