#include "LatencyCommand.h"

#include "DrawOptions.h"
#include "latency/Histogram.h"
#include "latency/HistogramPicture.h"
#include "latency/LatencyProbe.h"
#include "latency/PenProcess.h"
#include "Percentile.h"
#include "UserError.h"

#include <algorithm>
#include <cstdio>
#include <memory>
#include <nlohmann/json.hpp>

namespace
{

constexpr int kWarmUps = 10; // taps for which programs are built and caches filled

struct LatencyOptions
{
    std::string size = "1280x800";
    std::string histogram;
    int taps = 300;
    bool json = false;
};

struct Measured
{
    std::vector<LatencySeries> series;
    float readTime = 0.0f; ///< milliseconds
};

void Measure(PenPath path, const char* name, PageSize size, int taps, Measured& measured)
{
    LatencySeries& series = measured.series.emplace_back();
    series.name = name;
    PenProcess pen(path, size);
    series.obstacle = pen.Obstacle();
    if (!series.obstacle.empty())
        return;
    LatencyProbe probe(pen.Window(), size);
    if (taps + kWarmUps > probe.MostTaps())
        throw UserError("--taps: a window of this size has room for " +
                        std::to_string(std::max(probe.MostTaps() - kWarmUps, 0)));
    for (int i = 0; i < kWarmUps; ++i)
        probe.Tap();
    for (int i = 0; i < taps; ++i)
        series.times.push_back(probe.Tap());
    measured.readTime = probe.ReadTime();
    probe.AskToClose();
    series.redrawnShare = pen.Finish();
}

void PrintText(const Measured& measured, PageSize size, int taps)
{
    std::printf("event to pixel, %d taps each in %dx%d; reading a pixel takes %.3f ms\n", taps,
                size.width, size.height, measured.readTime);
    for (const LatencySeries& series : measured.series)
        if (series.times.empty())
            std::printf("%-14s not granted: %s\n", series.name.c_str(), series.obstacle.c_str());
        else
            std::printf("%-14s p50 %.2f ms, p99 %.2f ms, %.2f %% of the pixels redrawn a frame\n",
                        series.name.c_str(), *Ink::Percentile(series.times, 50),
                        *Ink::Percentile(series.times, 99), series.redrawnShare * 100.0);
}

void PrintJson(const Measured& measured, PageSize size, int taps)
{
    nlohmann::ordered_json paths = nlohmann::ordered_json::array();
    for (const LatencySeries& series : measured.series)
        if (series.times.empty())
            paths.push_back({{"name", series.name}, {"obstacle", series.obstacle}});
        else
            paths.push_back({{"name", series.name},
                             {"p50_ms", *Ink::Percentile(series.times, 50)},
                             {"p99_ms", *Ink::Percentile(series.times, 99)},
                             {"redrawn_share", series.redrawnShare}});
    const nlohmann::ordered_json all = {{"taps", taps},
                                        {"width", size.width},
                                        {"height", size.height},
                                        {"read_ms", measured.readTime},
                                        {"paths", paths}};
    std::printf("%s\n", all.dump(2).c_str());
}

void Run(const LatencyOptions& options)
{
    const PageSize size = ParseSize(options.size);
    Measured measured;
    Measure(PenPath::PlainSwap, "plain swap", size, options.taps, measured);
    Measure(PenPath::PartialUpdate, "partial update", size, options.taps, measured);
    Measure(PenPath::FrontBuffer, "front buffer", size, options.taps, measured);
    options.json ? PrintJson(measured, size, options.taps)
                 : PrintText(measured, size, options.taps);
    if (!options.histogram.empty())
        WriteHistogram(options.histogram, measured.series);
}

} // namespace

void AddLatencyCommand(CLI::App& app)
{
    CLI::App* const latency = app.add_subcommand(
        "latency", "Measure from outside how long a pen's event takes to become ink on the X "
                   "server's screen; meanwhile the pointer is not yours");
    const auto options = std::make_shared<LatencyOptions>();
    latency->add_option("--taps", options->taps, "Taps to measure, on each way to the screen")
        ->check(CLI::Range(1, 10000))
        ->capture_default_str();
    latency->add_option("--size", options->size, "Window size in pixels, WIDTHxHEIGHT")
        ->capture_default_str();
    latency->add_option("-o,--output", options->histogram, "Write a histogram as PNG");
    latency->add_flag("--json", options->json, "Print the figures as JSON");
    latency->callback([options] { Run(*options); });
}
