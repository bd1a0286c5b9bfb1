// Stands in front of operator new for the test program and the library.

#include "drivers/AllocationCount.h"

#include <dlfcn.h>
#include <execinfo.h>

#include <cstdlib>
#include <cstring>
#include <new>

namespace
{

constexpr int kFrames = 12;

thread_local bool t_counting = false;
thread_local std::size_t t_allocations = 0;

/// Whether the nearest caller outside the standard library and this file is the library's code.
bool IsCalledByLibrary()
{
    void* frames[kFrames];
    const int count = backtrace(frames, kFrames);
    for (int i = 0; i < count; ++i)
    {
        Dl_info caller;
        if (dladdr(frames[i], &caller) == 0 || caller.dli_fname == nullptr)
            return false; // made at run time, by the driver
        if (std::strstr(caller.dli_fname, "libNib"))
            return true;
        if (!std::strstr(caller.dli_fname, "libstdc++") && i > 2)
            return false;
    }
    return false;
}

void* Allocate(std::size_t size)
{
    if (t_counting)
    {
        t_counting = false; // what follows may allocate
        t_allocations += IsCalledByLibrary() ? 1 : 0;
        t_counting = true;
    }
    if (void* memory = std::malloc(size == 0 ? 1 : size))
        return memory;
    throw std::bad_alloc();
}

} // namespace

LibraryAllocations::LibraryAllocations()
{
    t_allocations = 0;
    t_counting = true;
}

LibraryAllocations::~LibraryAllocations()
{
    t_counting = false;
}

std::size_t LibraryAllocations::Count() const
{
    return t_allocations;
}

__attribute__((visibility("default"))) void* operator new(std::size_t size)
{
    return Allocate(size);
}

__attribute__((visibility("default"))) void* operator new[](std::size_t size)
{
    return Allocate(size);
}

__attribute__((visibility("default"))) void operator delete(void* memory) noexcept
{
    std::free(memory);
}

__attribute__((visibility("default"))) void operator delete[](void* memory) noexcept
{
    std::free(memory);
}

__attribute__((visibility("default"))) void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}

__attribute__((visibility("default"))) void operator delete[](void* memory, std::size_t) noexcept
{
    std::free(memory);
}
