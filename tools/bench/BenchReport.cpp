#include "bench/BenchReport.h"

#include "Percentile.h"

#include <cstdio>
#include <nlohmann/json.hpp>

namespace
{

constexpr double kMiddle = 50.0;
constexpr double kWorstHundredth = 99.0;

std::string Number(const std::optional<float>& value)
{
    char text[32];
    if (!value)
        return "-";
    std::snprintf(text, sizeof text, "%.*f", *value < 10.0f ? 3 : 1, static_cast<double>(*value));
    return text;
}

std::string Row(const char* what, const std::vector<float>& times, const char* unit)
{
    char line[128];
    std::snprintf(line, sizeof line, "  %-44s %10s %10s  %s\n", what,
                  Number(Ink::Percentile(times, kMiddle)).c_str(),
                  Number(Ink::Percentile(times, kWorstHundredth)).c_str(), unit);
    return line;
}

std::string Heading(const char* what)
{
    char line[128];
    std::snprintf(line, sizeof line, "%-46s %10s %10s\n", what, "p50", "p99");
    return line;
}

nlohmann::ordered_json Times(const std::vector<float>& times)
{
    if (times.empty())
        return nullptr;
    return {{"p50", *Ink::Percentile(times, kMiddle)},
            {"p99", *Ink::Percentile(times, kWorstHundredth)},
            {"count", times.size()}};
}

double SamplesPerSecond(const Figures& replay)
{
    return replay.seconds > 0.0 ? replay.samples / replay.seconds : 0.0;
}

} // namespace

std::string ToText(const BenchReport& report)
{
    std::string text = report.renderer + ", " + report.version + ", " +
                       std::to_string(report.processors) + " processors\n\n";
    text += Heading("Handing work to another thread");
    text += Row("post to a busy worker", report.handOver.posts, "ns");
    text += Row("synchronous call", report.handOver.calls, "us");
    text += Row("post until the task runs, worker asleep", report.handOver.wakes, "us");
    text += '\n' + Heading("Having a shader program");
    text += Row("compiled and linked", report.programs.fromSource, "us");
    if (report.programs.fromFile.empty())
        text += "  (this driver gives no program to be kept)\n";
    else
    {
        text += Row("from its file", report.programs.fromFile, "us");
        text += Row("from memory", report.programs.fromMemory, "us");
    }
    text += '\n' + Heading("Drawing strokes, a frame for each sample");
    text += Row("frame, until it is presented", report.replay.frameTimes, "ms");
    char rate[96];
    std::snprintf(rate, sizeof rate, "  %-44s %10.0f\n", "samples a second",
                  SamplesPerSecond(report.replay));
    return text + rate;
}

std::string ToJson(const BenchReport& report)
{
    const nlohmann::ordered_json all = {
        {"schema", 1},
        {"seconds", report.seconds},
        {"processors", report.processors},
        {"gl", {{"renderer", report.renderer}, {"version", report.version}}},
        {"handOver",
         {{"postNanoseconds", Times(report.handOver.posts)},
          {"callMicroseconds", Times(report.handOver.calls)},
          {"wakeMicroseconds", Times(report.handOver.wakes)}}},
        {"programStart",
         {{"sourceMicroseconds", Times(report.programs.fromSource)},
          {"fileMicroseconds", Times(report.programs.fromFile)},
          {"memoryMicroseconds", Times(report.programs.fromMemory)}}},
        {"replay",
         {{"frameMilliseconds", Times(report.replay.frameTimes)},
          {"samples", report.replay.samples},
          {"samplesPerSecond", SamplesPerSecond(report.replay)}}},
    };
    return all.dump(2) + '\n';
}
