#include "sgcore/app/sgheappolicy.h"

#if defined(__GLIBC__)
#include <malloc.h>
#endif

bool SgHeapPolicy::keepLargeBlocks() {
#if defined(__GLIBC__)
    // Blocks below the bound come from the heap, and free memory at its top stays up to the
    // bound instead of going back to the system at once.
    const int kept = int(kKeptBytes);
    return mallopt(M_MMAP_THRESHOLD, kept) == 1 && mallopt(M_TRIM_THRESHOLD, kept) == 1;
#else
    return false;
#endif
}
