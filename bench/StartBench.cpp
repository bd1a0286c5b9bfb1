// What it costs to begin: a second render thread up to its first task, beside the raw context that
// it needs, and what a worker holds while it does nothing.

#include "BenchThread.h"

#include <nib/egl.h>
#include <nib/worker_thread.h>

#include <EGL/egl.h>

#include <atomic>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <thread>
#include <vector>

#include <unistd.h>

using namespace Nib;

namespace
{

using Clock = std::chrono::steady_clock;

constexpr int kIdleWorkers = 64;

double SecondsSince(Clock::time_point start)
{
    return std::chrono::duration<double>(Clock::now() - start).count();
}

/// Tells when it runs.
class TellTask : public ITask
{
public:
    explicit TellTask(Clock::time_point& when) : m_when(when) {}
    void run() override { m_when = Clock::now(); }

private:
    Clock::time_point& m_when;
};

std::unique_ptr<RenderThreadGL> NewThread()
{
    return std::unique_ptr<RenderThreadGL>(
        RendererFactory::CreateSurfaceRenderer("start", RenderThreadGL::Medium));
}

/// From Start() to the run of the first task.
void BM_StartToFirstTask(benchmark::State& state)
{
    const std::unique_ptr<RenderThreadGL> first = NewThread();
    first->Start();
    first->GetMsgQueue()->waitForCompleting();
    for (auto _ : state)
    {
        const std::unique_ptr<RenderThreadGL> second = NewThread();
        Clock::time_point end;
        const Clock::time_point start = Clock::now();
        second->Start();
        second->GetMsgQueue()->enQueueMsg(new TellTask(end));
        second->GetMsgQueue()->waitForCompleting();
        state.SetIterationTime(std::chrono::duration<double>(end - start).count());
    }
}

/// A context, a surface of a pixel and both made current, on a thread that is there already.
void BM_RawContext(benchmark::State& state)
{
    const Egl* egl = Egl::GetInstance();
    const EGLDisplay display = egl->GetDisplay();
    const EGLConfig config = egl->GetConfig(false);
    const EGLint version[] = {EGL_CONTEXT_CLIENT_VERSION, 3, EGL_NONE};
    const EGLint size[] = {EGL_WIDTH, 1, EGL_HEIGHT, 1, EGL_NONE};
    for (auto _ : state)
    {
        const Clock::time_point start = Clock::now();
        const EGLContext context = eglCreateContext(display, config, EGL_NO_CONTEXT, version);
        const EGLSurface surface = eglCreatePbufferSurface(display, config, size);
        if (!eglMakeCurrent(display, surface, surface, context))
            state.SkipWithError("no context");
        state.SetIterationTime(SecondsSince(start));
        eglMakeCurrent(display, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
        eglDestroySurface(display, surface);
        eglDestroyContext(display, context);
    }
}

long ResidentBytes()
{
    long size = 0, resident = 0;
    std::FILE* file = std::fopen("/proc/self/statm", "r");
    if (file)
    {
        if (std::fscanf(file, "%ld %ld", &size, &resident) != 2)
            resident = 0;
        std::fclose(file);
    }
    return resident * sysconf(_SC_PAGESIZE);
}

/// Resident memory of a worker that has run a task and sleeps: the stack of its thread included.
void BM_IdleWorkerMemory(benchmark::State& state)
{
    for (auto _ : state)
    {
        std::vector<std::unique_ptr<IWorkerThread>> workers;
        workers.reserve(kIdleWorkers);
        const long before = ResidentBytes();
        for (int number = 0; number < kIdleWorkers; ++number)
        {
            workers.emplace_back(IWorkerThread::CreateInstance_NoLock("idle", 0));
            workers.back()->Start(false);
            Clock::time_point when;
            TellTask task(when);
            workers.back()->RunSyncTask(&task, false, false);
        }
        state.counters["kib"] =
            static_cast<double>(ResidentBytes() - before) / (1024.0 * kIdleWorkers);
        for (const auto& worker : workers)
            worker->Terminate();
    }
}

BENCHMARK(BM_StartToFirstTask)->UseManualTime()->Iterations(100);
BENCHMARK(BM_RawContext)->UseManualTime()->Iterations(100);
BENCHMARK(BM_IdleWorkerMemory)->Iterations(1);

} // namespace

int main(int argc, char** argv)
{
    const BenchEnvironment environment(argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
