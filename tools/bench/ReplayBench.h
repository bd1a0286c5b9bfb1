#ifndef NIB_TOOLS_BENCH_REPLAY_BENCH_H
#define NIB_TOOLS_BENCH_REPLAY_BENCH_H

#include "bench/Stopwatch.h"
#include "Figures.h"

#include <nib/render_thread.h>

/// Draws made-up strokes with the pen on an offscreen page of 1280 x 800, a frame for each sample,
/// again and again for 0.35 of the time. Throws UserError.
Figures MeasureReplay(Nib::RenderThreadGL& thread, Stopwatch& stopwatch);

#endif
