#include "Figures.h"

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
    return {{"p50", Rounded(Percentile(times, 50), kMicrosecond)},
            {"p95", Rounded(Percentile(times, 95), kMicrosecond)},
            {"p99", Rounded(Percentile(times, 99), kMicrosecond)}};
}

} // namespace

std::optional<float> Percentile(std::vector<float> times, double percent)
{
    if (times.empty())
        return std::nullopt;
    const double rank = std::ceil(percent / 100.0 * static_cast<double>(times.size()));
    const auto index = static_cast<std::ptrdiff_t>(std::max(rank, 1.0)) - 1;
    std::nth_element(times.begin(), times.begin() + index, times.end());
    return times[static_cast<std::size_t>(index)];
}

std::string Summary(const Figures& figures)
{
    std::string line = Formatted("%d strokes, %d samples, %d frames, %lld tasks", figures.strokes,
                                 figures.samples, figures.frames, figures.tasks);
    if (figures.redrawn)
        line += Formatted(", %.2f %% of the pixels redrawn", *figures.redrawn * 100.0);
    if (!figures.frameTimes.empty())
        line += Formatted(", frame time p50 %.2f p95 %.2f p99 %.2f ms",
                          *Percentile(figures.frameTimes, 50), *Percentile(figures.frameTimes, 95),
                          *Percentile(figures.frameTimes, 99));
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
