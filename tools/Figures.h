#ifndef NIB_TOOLS_FIGURES_H
#define NIB_TOOLS_FIGURES_H

#include "Program.h"

#include <optional>
#include <string>
#include <vector>

/// What a run has done, and how long it took.
struct Figures
{
    int strokes = 0;
    int samples = 0;
    int frames = 0;
    long long tasks = 0;           ///< that the render thread ran
    double seconds = 0.0;          ///< from the first sample until all was drawn
    std::vector<float> frameTimes; ///< milliseconds of each frame, until it was presented
    std::optional<double> redrawn; ///< share of all frames' pixels, 0 to 1; none without frames
    Ink::ProgramCounts programs;
};

/// One line for people, without its end.
std::string Summary(const Figures& figures);

/// One JSON object in one line, without its end; what a run without frames has none of is null.
std::string ToJson(const Figures& figures);

#endif
