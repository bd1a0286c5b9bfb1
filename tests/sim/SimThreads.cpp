#include "SimState.h"

#include <dlfcn.h>
#include <pthread.h>

#include <algorithm>

// Threads of the process are real ones; the driver only makes their creation fail when a test wants
// it.

extern "C" int __interceptor_pthread_create(pthread_t*, const pthread_attr_t*, void* (*)(void*),
                                            void*) __attribute__((weak));

namespace
{

using Create = int (*)(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);

/// A sanitizer's function where one watches over the process, else the C library's.
Create RealCreate()
{
    if (__interceptor_pthread_create)
        return &__interceptor_pthread_create;
    static const auto real = reinterpret_cast<Create>(dlsym(RTLD_NEXT, "pthread_create"));
    return real;
}

/// The error of a failure that waits for this call; 0 without one.
int TakeFailure()
{
    Sim::State& state = Sim::GetState();
    const std::lock_guard lock(state.mutex);
    const auto failure =
        std::find_if(state.failures.begin(), state.failures.end(),
                     [](const Sim::Failure& one) { return one.name == "pthread_create"; });
    if (failure == state.failures.end())
        return 0;
    const int error = static_cast<int>(failure->error);
    if (failure->times > 0 && --failure->times == 0)
        state.failures.erase(failure);
    return error;
}

} // namespace

extern "C" __attribute__((visibility("default"))) int
pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*run)(void*),
               void* argument) noexcept
{
    const int error = TakeFailure();
    return error != 0 ? error : RealCreate()(thread, attributes, run, argument);
}
