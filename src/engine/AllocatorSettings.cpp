#include "engine/AllocatorSettings.h"

#include <cstdlib>  // defines __GLIBC__ where the C library is glibc

#if defined(__GLIBC__)
#include <malloc.h>
#endif

namespace vtr {

void SettleAllocator() {
#if defined(__GLIBC__)
    constexpr int kMapApartFrom = 32 << 20;  // larger blocks are mapped on their own
    constexpr int kReturnBeyond = 64 << 20;  // free memory kept at the heap's top
    mallopt(M_MMAP_THRESHOLD, kMapApartFrom);
    mallopt(M_TRIM_THRESHOLD, kReturnBeyond);
    mallopt(M_MXFAST, 0);
#endif
}

}  // namespace vtr
