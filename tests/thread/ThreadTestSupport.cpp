#include "thread/ThreadTestSupport.h"

#include "base/HandOver.h"

#include <cerrno>
#include <cstdlib>
#include <new>

#include <dlfcn.h>
#include <malloc.h>

// ---- counted signals: this definition goes before the base library's, and calls it --------------

namespace
{

std::atomic<int> g_signals{0};
std::atomic<int> g_waits{0};
std::atomic<int> g_spins{0};

constexpr const char* kSignalSymbol = "_ZN3Nib19ConditionalVariable6SignalEv";
constexpr const char* kWaitSymbol = "_ZN3Nib19ConditionalVariable4WaitEPNS_15CriticalSectionEi";

} // namespace

void Nib::ConditionalVariable::Signal() noexcept
{
    using Real = void (*)(ConditionalVariable*);
    static const Real real = reinterpret_cast<Real>(dlsym(RTLD_NEXT, kSignalSymbol));
    real(this);
    g_signals.fetch_add(1);
}

int SignalsSoFar()
{
    return g_signals.load();
}

void WaitForSignals(int before, int more)
{
    while (SignalsSoFar() < before + more)
        std::this_thread::yield();
}

bool Nib::ConditionalVariable::Wait(CriticalSection* section, int milliseconds) noexcept
{
    using Real = bool (*)(ConditionalVariable*, CriticalSection*, int);
    static const Real real = reinterpret_cast<Real>(dlsym(RTLD_NEXT, kWaitSymbol));
    g_waits.fetch_add(1); // under the section, which is left when the wait has begun
    return real(this, section, milliseconds);
}

int WaitsSoFar()
{
    return g_waits.load();
}

void WaitForWaits(int before, int more)
{
    while (WaitsSoFar() < before + more)
        std::this_thread::yield();
}

void Nib::HandOver::SpinInWait() noexcept
{
    using Real = void (*)(HandOver*);
    static const Real real =
        reinterpret_cast<Real>(dlsym(RTLD_NEXT, "_ZN3Nib8HandOver10SpinInWaitEv"));
    g_spins.fetch_add(1);
    real(this);
}

int SpinsSoFar()
{
    return g_spins.load();
}

// ---- counted allocations ------------------------------------------------------------------------

namespace
{

thread_local long t_allocations = 0;
std::atomic<long> g_allocations{0};
std::atomic<bool> g_refusesAligned{false};

void CountAllocation()
{
    ++t_allocations;
    g_allocations.fetch_add(1, std::memory_order_relaxed);
}

} // namespace

void* operator new(std::size_t size)
{
    CountAllocation();
    if (void* memory = std::malloc(size != 0 ? size : 1))
        return memory;
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept
{
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    operator delete(memory);
}

// Also goes before the C library's.
extern "C" int posix_memalign(void** memory, std::size_t alignment, std::size_t size) noexcept
{
    CountAllocation();
    if (g_refusesAligned)
        return ENOMEM;
    *memory = memalign(alignment, size);
    return *memory ? 0 : ENOMEM;
}

void RefuseAlignedMemory(bool refuse)
{
    g_refusesAligned = refuse;
}

long AllocationsSoFar()
{
    return t_allocations;
}

long AllocationsOfAllThreads()
{
    return g_allocations.load();
}

std::size_t MemoryInUse()
{
    const struct mallinfo2 heap = mallinfo2();
    return heap.uordblks + heap.hblkhd;
}
