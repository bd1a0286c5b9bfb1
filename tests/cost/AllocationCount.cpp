#include "AllocationCount.h"

#include <cstdlib>
#include <new>

// Alone in its file, so that no compiler sees a free() of its own allocation.

namespace
{

thread_local long t_allocations = 0;

}

void* operator new(std::size_t size)
{
    ++t_allocations;
    if (void* const memory = std::malloc(size != 0 ? size : 1))
        return memory;
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}

long AllocationsSoFar()
{
    return t_allocations;
}
