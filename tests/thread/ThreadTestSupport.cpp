#include "thread/ThreadTestSupport.h"

#include <cstdlib>
#include <new>

#include <dlfcn.h>

// ---- counted signals: this definition goes before the base library's, and calls it --------------

namespace
{

std::atomic<int> g_signals{0};

constexpr const char* kSignalSymbol = "_ZN3Nib19ConditionalVariable6SignalEv";

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

// ---- counted allocations ------------------------------------------------------------------------

namespace
{

thread_local long t_allocations = 0;

} // namespace

void* operator new(std::size_t size)
{
    ++t_allocations;
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
    std::free(memory);
}

long AllocationsSoFar()
{
    return t_allocations;
}
