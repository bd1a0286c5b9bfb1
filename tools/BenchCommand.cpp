#include "BenchCommand.h"

#include "bench/BenchReport.h"
#include "bench/ReplayBench.h"
#include "PostTask.h"
#include "RenderThreads.h"

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <thread>

#include <GLES2/gl2.h>

namespace
{

struct BenchOptions
{
    double seconds = 10.0;
    bool json = false;
};

void ReadNames(Nib::RenderThreadGL& thread, BenchReport& report)
{
    Ink::Post(*thread.GetMsgQueue(),
              [&report]
              {
                  report.renderer = reinterpret_cast<const char*>(glGetString(GL_RENDERER));
                  report.version = reinterpret_cast<const char*>(glGetString(GL_VERSION));
              });
    thread.GetMsgQueue()->waitForCompleting();
}

BenchReport Measure(double seconds)
{
    const BenchCache cache; // before the driver starts, which reads its own folder then
    CheckEgl();
    const std::unique_ptr<Nib::RenderThreadGL> thread = StartSurfaceThread();
    BenchReport report;
    report.seconds = seconds;
    report.processors = std::thread::hardware_concurrency();
    ReadNames(*thread, report);
    Stopwatch stopwatch(seconds);
    report.handOver = MeasureHandOver(stopwatch);
    report.programs = MeasureProgramStart(*thread, cache, stopwatch);
    report.replay = MeasureReplay(*thread, stopwatch);
    return report;
}

void Run(const BenchOptions& options)
{
    setenv("EGL_PLATFORM", "surfaceless", 0); // no display server is needed
    const BenchReport report = Measure(options.seconds);
    std::fputs((options.json ? ToJson(report) : ToText(report)).c_str(), stdout);
}

} // namespace

void AddBenchCommand(CLI::App& app)
{
    CLI::App* const bench = app.add_subcommand(
        "bench", "Measure how fast the library is here: handing work to a thread, having a shader "
                 "program, drawing strokes; a busy machine gives worse figures");
    const auto options = std::make_shared<BenchOptions>();
    bench->add_option("--seconds", options->seconds, "How long to measure, in all")
        ->check(CLI::Range(0.1, 15.0))
        ->capture_default_str();
    bench->add_flag("--json", options->json,
                    "As JSON, in the form that docs/nib-bench.md describes");
    bench->callback([options] { Run(*options); });
}
