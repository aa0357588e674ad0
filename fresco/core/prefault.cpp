#include "fresco/core/prefault.h"

#if defined(__linux__)
#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>
#endif

namespace fresco {

#if defined(__linux__) && defined(MADV_POPULATE_WRITE)

void Prefault(void* block, size_t size) {
    // Below this the call is no gain.
    constexpr size_t kFewestPages = 8;
    const auto page = uintptr_t(sysconf(_SC_PAGESIZE));
    const uintptr_t begin = (uintptr_t(block) + page - 1) / page * page;
    const uintptr_t end = (uintptr_t(block) + size) / page * page;
    if (end < begin + kFewestPages * page) return;
    // Older systems do not know it, and the pages come one by one.
    (void)madvise(reinterpret_cast<void*>(begin), end - begin, MADV_POPULATE_WRITE);
}

#else

void Prefault(void*, size_t) {}

#endif

}  // namespace fresco
