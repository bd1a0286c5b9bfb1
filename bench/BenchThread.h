#ifndef NIB_BENCH_BENCHTHREAD_H
#define NIB_BENCH_BENCHTHREAD_H

#include "../tests/Owned.h"

#include <nib/base.h>
#include <nib/msg_queue.h>
#include <nib/render_thread.h>
#include <nib/renderer_factory.h>
#include <nib/task.h>

#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>
#include <stdexcept>
#include <string>

#include <malloc.h>

/// What every benchmark program runs in: a cache folder of its own, which goes with this object, no
/// log output, and without DISPLAY the surfaceless platform.
class BenchEnvironment
{
public:
    BenchEnvironment(int argc, char** argv)
        : m_folder((std::filesystem::temp_directory_path() / "nib-bench-XXXXXX").string())
    {
        if (!mkdtemp(m_folder.data()))
            throw std::runtime_error("no temporary folder");
        m_cache = m_folder + "/sdk";
        Nib::System::SetSDKCacheDirectoryPath(m_cache.c_str());
        setenv("MESA_SHADER_CACHE_DIR", (m_folder + "/driver").c_str(), 1);
        setenv("NIB_LOG", "silent", 0);
        if (!std::getenv("DISPLAY"))
            setenv("EGL_PLATFORM", "surfaceless", 0);
        KeepMemory();
        benchmark::Initialize(&argc, argv);
    }
    ~BenchEnvironment()
    {
        std::error_code ignored;
        std::filesystem::remove_all(m_folder, ignored);
    }
    BenchEnvironment(const BenchEnvironment&) = delete;
    BenchEnvironment& operator=(const BenchEnvironment&) = delete;

private:
    // Whether the memory that a driver frees at the end of a call goes back to the system, to be
    // asked for again in the next, depends on what lies behind it. It would make either side of a
    // comparison four times slower, by chance.
    static void KeepMemory()
    {
        mallopt(M_TRIM_THRESHOLD, 1 << 30);
        mallopt(M_TOP_PAD, 1 << 24);
    }

    std::string m_folder;
    std::string m_cache;
};

/// A render thread that runs, or null after a line on standard error.
inline std::unique_ptr<Nib::RenderThreadGL> StartedBenchThread()
{
    std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::GLES::CreateSurfaceRenderer("bench", Nib::RenderThreadGL::Medium));
    if (thread->Start())
        return thread;
    std::fprintf(stderr, "the driver does not start\n");
    return nullptr;
}

/// Runs all benchmarks of the program on a render thread. The program's exit status.
inline int RunBenchmarksOnRenderThread(int argc, char** argv)
{
    class BenchmarkTask : public Nib::ITask
    {
    public:
        void run() override { benchmark::RunSpecifiedBenchmarks(); }
    };

    const BenchEnvironment environment(argc, argv);
    const std::unique_ptr<Nib::RenderThreadGL> thread = StartedBenchThread();
    if (!thread)
        return 1;
    thread->GetMsgQueue()->enQueueMsg(new BenchmarkTask);
    thread->GetMsgQueue()->waitForCompleting();
    return 0;
}

#endif
