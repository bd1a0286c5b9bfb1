// Stands in front of operator new for the test program and the library.

#include "drivers/AllocationCount.h"

#include <dlfcn.h>
#include <execinfo.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>

namespace
{

constexpr int kFrames = 12;

thread_local bool t_counting = false;
thread_local std::size_t t_allocations = 0;

/// The file that holds the code at @p address; empty for code that was made at run time.
const char* FileOf(const void* address)
{
    Dl_info found;
    return dladdr(address, &found) != 0 && found.dli_fname ? found.dli_fname : "";
}

/// Whether operator new, which returns to @p caller, was called for code of the library: by itself,
/// or by the standard library on its behalf.
bool IsForLibrary(const void* caller)
{
    void* frames[kFrames];
    const int count = backtrace(frames, kFrames);
    const auto end = frames + count;
    const auto first = std::find(frames, end, caller);
    const auto owner = std::find_if(
        first, end, [](const void* frame) { return !std::strstr(FileOf(frame), "libstdc++"); });
    return owner != end && std::strstr(FileOf(*owner), "libNib");
}

void* Allocate(std::size_t size, const void* caller)
{
    if (t_counting)
    {
        t_counting = false; // what follows may allocate
        t_allocations += IsForLibrary(caller) ? 1 : 0;
        t_counting = true;
    }
    if (void* memory = std::malloc(size == 0 ? 1 : size))
        return memory;
    throw std::bad_alloc();
}

void* AllocateOrNull(std::size_t size, const void* caller) noexcept
{
    try
    {
        return Allocate(size, caller);
    }
    catch (const std::bad_alloc&)
    {
        return nullptr;
    }
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

// All forms but those for aligned types, since each must be freed as it was allocated.
#define NIB_REPLACED __attribute__((visibility("default")))

NIB_REPLACED void* operator new(std::size_t size)
{
    return Allocate(size, __builtin_return_address(0));
}

NIB_REPLACED void* operator new[](std::size_t size)
{
    return Allocate(size, __builtin_return_address(0));
}

NIB_REPLACED void* operator new(std::size_t size, const std::nothrow_t&) noexcept
{
    return AllocateOrNull(size, __builtin_return_address(0));
}

NIB_REPLACED void* operator new[](std::size_t size, const std::nothrow_t&) noexcept
{
    return AllocateOrNull(size, __builtin_return_address(0));
}

NIB_REPLACED void operator delete(void* memory) noexcept
{
    std::free(memory);
}

NIB_REPLACED void operator delete[](void* memory) noexcept
{
    std::free(memory);
}

NIB_REPLACED void operator delete(void* memory, std::size_t) noexcept
{
    std::free(memory);
}

NIB_REPLACED void operator delete[](void* memory, std::size_t) noexcept
{
    std::free(memory);
}

NIB_REPLACED void operator delete(void* memory, const std::nothrow_t&) noexcept
{
    std::free(memory);
}

NIB_REPLACED void operator delete[](void* memory, const std::nothrow_t&) noexcept
{
    std::free(memory);
}
