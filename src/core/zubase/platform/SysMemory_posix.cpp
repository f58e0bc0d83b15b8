#include "zubase/platform/SysMemory.h"

#include <sys/mman.h>
#include <unistd.h>

namespace ZuPlatform {

void* memoryReserveWithGuard(std::size_t inBytes)
{
    const std::size_t page = std::size_t(sysconf(_SC_PAGESIZE));
    void* memory = mmap(nullptr, inBytes + page, PROT_READ | PROT_WRITE,
                        MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    if (memory == MAP_FAILED)
        return nullptr;
    // Without its guard the reservation could be overrun silently.
    if (mprotect(static_cast<char*>(memory) + inBytes, page, PROT_NONE) != 0) {
        munmap(memory, inBytes + page);
        return nullptr;
    }
    return memory;
}

} // namespace ZuPlatform
