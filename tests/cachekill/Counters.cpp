#include "Counters.h"

#include <cerrno>
#include <new>
#include <system_error>

#include <sys/mman.h>

namespace CacheKill
{

Counters& ShareCounters()
{
    void* const memory =
        mmap(nullptr, sizeof(Counters), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    if (memory == MAP_FAILED)
        throw std::system_error(errno, std::generic_category(), "shared memory");
    return *new (memory) Counters;
}

} // namespace CacheKill
