// What the library's hot paths cost beside the same GL calls written out, on a driver whose calls do
// nothing, so that nothing but the library is left. Each iteration does a thing a hundred times.

#include "BenchThread.h"

#include "HotPaths.h"

namespace
{

constexpr int kTimes = 100;

void Measure(benchmark::State& state, HotPath::Function path)
{
    static HotScene& scene = *new HotScene; // its context goes with the process
    for (auto _ : state)
        path(scene, kTimes);
}

void Register()
{
    for (const HotPath& path : kHotPaths)
    {
        const std::string name = path.name;
        if (path.gl)
            benchmark::RegisterBenchmark(("BM_Gl" + name).c_str(), Measure, path.gl);
        benchmark::RegisterBenchmark(("BM_" + name).c_str(), Measure, path.library);
    }
}

} // namespace

int main(int argc, char** argv)
{
    Register();
    return RunBenchmarksOnRenderThread(argc, argv);
}
