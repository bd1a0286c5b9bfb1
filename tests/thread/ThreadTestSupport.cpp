#include "thread/ThreadTestSupport.h"

#include "base/HandOver.h"

#include <cstdlib>
#include <new>

#include <dlfcn.h>

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
std::atomic<long> g_frees{0};

} // namespace

void* operator new(std::size_t size)
{
    ++t_allocations;
    if (void* memory = std::malloc(size != 0 ? size : 1))
    {
        g_allocations.fetch_add(1, std::memory_order_relaxed);
        return memory;
    }
    throw std::bad_alloc();
}

void operator delete(void* memory) noexcept
{
    if (memory)
        g_frees.fetch_add(1, std::memory_order_relaxed);
    std::free(memory);
}

void operator delete(void* memory, std::size_t) noexcept
{
    operator delete(memory);
}

long AllocationsSoFar()
{
    return t_allocations;
}

long AllocationsOfAllThreads()
{
    return g_allocations.load();
}

long LiveAllocations()
{
    return g_allocations.load() - g_frees.load();
}
