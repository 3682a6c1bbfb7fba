#pragma once

#include <cstddef>

// How the application's heap treats large blocks.
//
// By default the C library maps every block of more than a few megabytes afresh and unmaps it
// when freed, so each new mesh of a million vertices pays a page fault for every 4 KiB it
// touches first (about a third of a round trip with the modeler on a virtual machine). The
// application keeps large freed blocks in its heap instead, up to a bound, so that the arrays
// of the next return, un-weld and morph reuse pages that are already mapped.
//
// Cost: the process keeps up to its high-water mark of heap (at most `kKeptBytes` of it free at
// the top); blocks larger than `kKeptBytes` are still mapped and unmapped on their own.
// Call once at start-up, before the first large allocation; elsewhere than glibc it does nothing.
class SgHeapPolicy {
public:
    static constexpr std::size_t kKeptBytes = std::size_t(512) << 20;

    // Keeps large freed blocks for reuse; true when the C library took the setting.
    static bool keepLargeBlocks();
};
