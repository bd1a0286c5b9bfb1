#ifndef NIB_BENCH_BENCHTHREAD_H
#define NIB_BENCH_BENCHTHREAD_H

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
#include <string>

/// Ends objects of the renderer factory.
struct FactoryRelease
{
    template <typename T>
    void operator()(T* object) const
    {
        object->Release();
    }
};

template <typename T>
using Owned = std::unique_ptr<T, FactoryRelease>;

/// Runs all benchmarks of the program on a render thread, with a cache folder of its own and
/// without log output; without DISPLAY on the surfaceless platform. The program's exit status.
inline int RunBenchmarksOnRenderThread(int argc, char** argv)
{
    namespace fs = std::filesystem;

    class BenchmarkTask : public Nib::ITask
    {
    public:
        void run() override { benchmark::RunSpecifiedBenchmarks(); }
    };

    std::string folder = (fs::temp_directory_path() / "nib-bench-XXXXXX").string();
    if (!mkdtemp(folder.data()))
        return 1;
    Nib::System::SetSDKCacheDirectoryPath((folder + "/sdk").c_str());
    setenv("MESA_SHADER_CACHE_DIR", (folder + "/driver").c_str(), 1);
    setenv("NIB_LOG", "silent", 0);
    if (!std::getenv("DISPLAY"))
        setenv("EGL_PLATFORM", "surfaceless", 0);
    benchmark::Initialize(&argc, argv);

    std::unique_ptr<Nib::RenderThreadGL> thread(
        Nib::GLES::CreateSurfaceRenderer("bench", Nib::RenderThreadGL::Medium));
    const bool started = thread->Start();
    if (started)
    {
        thread->GetMsgQueue()->enQueueMsg(new BenchmarkTask);
        thread->GetMsgQueue()->waitForCompleting();
    }
    else
    {
        std::fprintf(stderr, "the driver does not start\n");
    }
    thread.reset();
    fs::remove_all(folder);
    return started ? 0 : 1;
}

#endif
