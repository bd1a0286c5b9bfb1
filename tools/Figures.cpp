#include "Figures.h"

#include "Percentile.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <nlohmann/json.hpp>

namespace
{

template <typename... Values>
std::string Formatted(const char* format, Values... values)
{
    char text[256];
    std::snprintf(text, sizeof text, format, values...);
    return text;
}

/// To the last digit that means anything: microseconds of a time, millionths of a share.
nlohmann::json Rounded(std::optional<double> value, double unit = 1.0e6)
{
    return value ? nlohmann::json(std::round(*value * unit) / unit) : nlohmann::json();
}

nlohmann::json FrameTimes(const std::vector<float>& times)
{
    if (times.empty())
        return nullptr;
    constexpr double kMicrosecond = 1.0e3; // of a millisecond
    return {{"p50", Rounded(Ink::Percentile(times, 50), kMicrosecond)},
            {"p95", Rounded(Ink::Percentile(times, 95), kMicrosecond)},
            {"p99", Rounded(Ink::Percentile(times, 99), kMicrosecond)}};
}

} // namespace

std::string Summary(const Figures& figures)
{
    std::string line = Formatted("%d strokes, %d samples, %d frames, %lld tasks", figures.strokes,
                                 figures.samples, figures.frames, figures.tasks);
    if (figures.redrawn)
        line += Formatted(", %.2f %% of the pixels redrawn", *figures.redrawn * 100.0);
    if (!figures.frameTimes.empty())
        line += Formatted(
            ", frame time p50 %.2f p95 %.2f p99 %.2f ms", *Ink::Percentile(figures.frameTimes, 50),
            *Ink::Percentile(figures.frameTimes, 95), *Ink::Percentile(figures.frameTimes, 99));
    line += Formatted(", programs %d compiled %d loaded", figures.programs.compiled,
                      figures.programs.loaded);
    return line;
}

std::string ToJson(const Figures& figures)
{
    const nlohmann::ordered_json object = {
        {"schema", 1},
        {"strokes", figures.strokes},
        {"samples", figures.samples},
        {"frames", figures.frames},
        {"tasks", figures.tasks},
        {"seconds", Rounded(figures.seconds)},
        {"redrawnShare", Rounded(figures.redrawn)},
        {"frameMilliseconds", FrameTimes(figures.frameTimes)},
        {"programs",
         {{"compiled", figures.programs.compiled}, {"loaded", figures.programs.loaded}}},
    };
    return object.dump();
}
