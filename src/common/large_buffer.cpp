#include "common/large_buffer.h"

#include <cstdint>

#if defined(__linux__)
#include <sys/mman.h>
#include <unistd.h>
#endif

namespace Orvalis_NR {

void adviseHugePages(void* data, std::size_t bytes) {
#if defined(__linux__) && defined(MADV_HUGEPAGE)
    if (data == nullptr || bytes < kLargeBufferBytes) return;
    // madvise takes whole pages: advise the pages that lie entirely inside the range.
    static const auto kPage = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
    if (kPage == 0 || (kPage & (kPage - 1)) != 0) return;
    const auto begin = (reinterpret_cast<std::uintptr_t>(data) + kPage - 1) & ~(kPage - 1);
    const auto end = (reinterpret_cast<std::uintptr_t>(data) + bytes) & ~(kPage - 1);
    // A refusal (no transparent huge pages in this kernel) leaves ordinary pages: nothing to do.
    if (end > begin) (void)madvise(reinterpret_cast<void*>(begin), end - begin, MADV_HUGEPAGE);
#else
    (void)data;
    (void)bytes;
#endif
}

}  // namespace Orvalis_NR
