#include "engine/AllocatorSettings.h"

#include <cstdint>
#include <cstdlib>  // defines __GLIBC__ where the C library is glibc

#if defined(__GLIBC__)
#include <malloc.h>
#include <sys/mman.h>
#include <unistd.h>
#endif

namespace vtr {

#if defined(__GLIBC__)
namespace {

// Grows the heap by `growBy` now and asks the system to back that room with huge pages.
void GrowHeapInHugePages(std::size_t growBy) {
    constexpr std::uintptr_t kHugePage = std::uintptr_t{2} << 20;
    const auto address = [](const char* p) { return reinterpret_cast<std::uintptr_t>(p); };
    char* const before = static_cast<char*>(sbrk(0));
    // A block larger than what is left at the heap's top makes the heap grow, by the block
    // and the top pad; freed, it stays at the top for later requests. (Held in a volatile,
    // so that the compiler cannot leave out an allocation nobody uses.)
    void* volatile block = std::malloc(std::size_t{1} << 20);
    std::free(block);
    char* const after = static_cast<char*>(sbrk(0));
    if (after < before || static_cast<std::size_t>(after - before) < growBy)
        return;  // the heap did not grow here (it lives elsewhere, or had the room)
    // The whole huge pages between the two.
    char* const begin = before + ((kHugePage - address(before) % kHugePage) % kHugePage);
    char* const end = after - address(after) % kHugePage;
    if (end > begin) {
        // Advice only: where huge pages are off, nothing changes.
        madvise(begin, static_cast<std::size_t>(end - begin), MADV_HUGEPAGE);
    }
}

}  // namespace
#endif

void SettleAllocator() {
#if defined(__GLIBC__)
    constexpr int kMapApartFrom = 32 << 20;   // larger blocks are mapped on their own
    constexpr int kGrowBy = 64 << 20;         // the heap grows this much at a time
    constexpr int kReturnBeyond = 128 << 20;  // free memory kept at the heap's top
    mallopt(M_MMAP_THRESHOLD, kMapApartFrom);
    mallopt(M_TRIM_THRESHOLD, kReturnBeyond);
    mallopt(M_TOP_PAD, kGrowBy);
    mallopt(M_MXFAST, 0);
    GrowHeapInHugePages(kGrowBy);
#endif
}

}  // namespace vtr
