// What a process pays when it loads the library: its symbols are bound, and whatever it does before
// the first call is done. What it needs itself (EGL, GLES, zlib, the C++ library) is there already.

#include <benchmark/benchmark.h>

#include <chrono>
#include <cstdlib>

#include <dlfcn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace
{

using Clock = std::chrono::steady_clock;

/// Seconds for the load, told through a pipe by a child: a library is loaded once in a process.
double LoadInChild(const char* path)
{
    int ends[2];
    if (pipe(ends) != 0)
        return -1;
    const pid_t child = fork();
    if (child == 0)
    {
        const Clock::time_point start = Clock::now();
        void* const library = dlopen(path, RTLD_NOW | RTLD_LOCAL);
        const double time =
            library ? std::chrono::duration<double>(Clock::now() - start).count() : -1;
        _exit(write(ends[1], &time, sizeof time) == sizeof time ? 0 : 1);
    }
    double time = -1;
    if (read(ends[0], &time, sizeof time) != sizeof time)
        time = -1;
    close(ends[0]);
    close(ends[1]);
    waitpid(child, nullptr, 0);
    return time;
}

void Load(benchmark::State& state, const char* path)
{
    for (auto _ : state)
    {
        const double time = LoadInChild(path);
        if (time < 0)
            return state.SkipWithError("the library does not load");
        state.SetIterationTime(time);
    }
}

void BM_Load(benchmark::State& state)
{
    Load(state, NIB_LIBRARY);
}

void BM_LoadEmpty(benchmark::State& state)
{
    Load(state, NIB_EMPTY_LIBRARY);
}

// A library that needs another one, both empty.
void BM_LoadEmptyPair(benchmark::State& state)
{
    Load(state, NIB_EMPTY_PAIR);
}

BENCHMARK(BM_Load)->UseManualTime()->Iterations(200);
BENCHMARK(BM_LoadEmpty)->UseManualTime()->Iterations(200);
BENCHMARK(BM_LoadEmptyPair)->UseManualTime()->Iterations(200);

} // namespace

BENCHMARK_MAIN();
