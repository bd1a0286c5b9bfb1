#include "SimEgl.h"

#include <atomic>

namespace Sim
{

namespace
{

/// Takes the current context off a thread that ends, as EGL does.
struct ThreadEnd
{
    unsigned number;

    ~ThreadEnd()
    {
        State& state = GetState();
        const std::lock_guard lock(state.mutex);
        const auto found = state.threads.find(number);
        if (found == state.threads.end())
            return;
        ReleaseCurrent(state, found->second);
        state.threads.erase(found);
    }
};

} // namespace

unsigned ThreadNumber()
{
    static std::atomic<unsigned> last{0};
    // A plain number stays readable while the thread's objects are destroyed; ThreadEnd is one of
    // these.
    thread_local unsigned number = 0;
    if (number == 0)
    {
        number = last.fetch_add(1, std::memory_order_relaxed) + 1;
        thread_local ThreadEnd end{number};
        static_cast<void>(end);
    }
    return number;
}

State& GetState()
{
    static State* const state = new State;
    return *state;
}

void State::Reset(SimGpu device)
{
    static_cast<StateData&>(*this) = StateData{};
    gpu = std::move(device);
    swapChain.ages = gpu.bufferAges;
}

void* State::NewHandle()
{
    nextHandle += 0x10;
    return reinterpret_cast<void*>(nextHandle);
}

Thread& State::CurrentThread()
{
    const unsigned number = ThreadNumber();
    Thread& thread = threads[number];
    thread.number = number;
    return thread;
}

Context* State::FindContext(EGLContext handle) const
{
    const auto found = contexts.find(handle);
    return found == contexts.end() || found->second->destroyed ? nullptr : found->second.get();
}

Surface* State::FindSurface(EGLSurface handle) const
{
    const auto found = surfaces.find(handle);
    return found == surfaces.end() || found->second->destroyed ? nullptr : found->second.get();
}

const char* State::Keep(const std::string& key, const std::string& text)
{
    std::string& kept = strings[key];
    if (kept != text)
        kept = text;
    return kept.c_str();
}

Quiet::Quiet()
{
    State& state = GetState();
    const std::lock_guard lock(state.mutex);
    state.CurrentThread().quiet = true;
}

Quiet::~Quiet()
{
    State& state = GetState();
    const std::lock_guard lock(state.mutex);
    state.CurrentThread().quiet = false;
}

} // namespace Sim
