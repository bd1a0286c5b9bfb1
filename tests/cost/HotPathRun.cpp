// Takes every hot path as often as the first argument says, so that a profiler may count what each
// of them costs.

#include "OnRenderThread.h"

int main(int argc, char** argv)
{
    const int times = argc > 1 ? std::atoi(argv[1]) : 1;
    OnRenderThread(
        [times](HotScene& scene)
        {
            for (const HotPath& path : kHotPaths)
            {
                if (path.gl)
                    path.gl(scene, times);
                path.library(scene, times);
            }
        });
    return 0;
}
