#ifndef NIB_TOOLS_BENCH_HAND_OVER_H
#define NIB_TOOLS_BENCH_HAND_OVER_H

#include "bench/Stopwatch.h"

#include <vector>

/// What it takes to give a worker thread something to do.
struct HandOver
{
    std::vector<float> posts; ///< of a task to a busy worker, nanoseconds; means of many
    std::vector<float> calls; ///< until a synchronous call returns, microseconds; back to back
    std::vector<float> wakes; ///< from a post until a worker that slept runs it, microseconds
};

/// Measures for 0.4 of the time.
HandOver MeasureHandOver(Stopwatch& stopwatch);

#endif
