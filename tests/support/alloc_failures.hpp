// Exercising every allocation of an operation: the operation is run once per
// allocation it makes, with that allocation (and all later ones) failing.
// Available in builds configured with PXFX_ALLOCATION_HOOK (the sanitizer
// build); elsewhere tests using it are skipped.
#pragma once

#include <gtest/gtest.h>

#include "support/allocation_hook.hpp"

namespace pxtest {

// Calls attempt() with the first n allocations succeeding and the rest
// failing, for n = 0, 1, ... until a run made fewer than n allocations (no
// failure was injected). Returns the number of allocations of that run.
template <class F> int sweep_allocation_failures(F &&attempt) {
    for (int n = 0; n < 100000; ++n) {
        const uint64_t before = pxfx::alloc::stats().calls;
        pxfx::alloc::fail_after(n);
        attempt();
        pxfx::alloc::fail_after(-1);
        const uint64_t made = pxfx::alloc::stats().calls - before;
        if (made < static_cast<uint64_t>(n)) return static_cast<int>(made);
    }
    ADD_FAILURE() << "allocation sweep did not end";
    return -1;
}

#define PXTEST_REQUIRE_ALLOCATION_HOOK()                                                                               \
    if (!pxfx::alloc::injection_available()) GTEST_SKIP() << "build without PXFX_ALLOCATION_HOOK"

} // namespace pxtest
