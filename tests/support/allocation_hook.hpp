// Allocation accounting and failure injection for tests and benchmarks. The
// library keeps no state of its own: these programs are linked with
// --wrap=PX_malloc (the pxfx_allocation_hook target), so every PX_malloc call
// of the library passes through the counters here. Failure injection works in
// builds configured with PXFX_ALLOCATION_HOOK (the sanitizer build), where the
// tests sweep every allocation of an operation.
#pragma once

#include <cstdint>

namespace pxfx::alloc {

// Calls and bytes that PX_malloc has handed out since the last reset.
struct Stats {
    uint64_t calls;
    uint64_t bytes;
};
Stats stats();
void reset_stats();

// True when this build can make allocations fail on purpose.
bool injection_available();

// Lets the next `n` PX_malloc calls succeed and makes every later one fail,
// until called again; a negative n turns failures off. No effect without
// injection_available().
void fail_after(int64_t n);

} // namespace pxfx::alloc
