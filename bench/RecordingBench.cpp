// Reading recordings of growing size: read the last row of each format, its order of growth, which is
// N, and compare the formats by their bytes a second.

#include "InkJson.h"
#include "InkMl.h"
#include "PenLog.h"
#include "StrokeList.h"
#include "SvcFile.h"

#include <benchmark/benchmark.h>

#include <string>

namespace
{

using Reader = Ink::Recording (*)(const std::string& path, const std::string& text);

/// @p samples times @p sample, between @p head and @p tail.
std::string FileOf(const std::string& head, std::int64_t samples, const std::string& sample,
                   const std::string& tail)
{
    std::string text = head;
    for (std::int64_t i = 0; i < samples; ++i)
        text += sample;
    return text + tail;
}

void Read(benchmark::State& state, Reader reader, const std::string& text)
{
    for (auto _ : state)
        benchmark::DoNotOptimize(reader("file", text));
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(text.size()));
    state.SetComplexityN(state.range(0));
}

void BM_ReadPenLog(benchmark::State& state)
{
    Read(state, Ink::ReadPenLog, FileOf("", state.range(0), "1.25 310.5 207.25 0.5\n", ""));
}

void BM_ReadStrokeList(benchmark::State& state)
{
    Read(state, Ink::ReadStrokeList,
         FileOf("START\n", state.range(0), "310.5,-207.25,1250\n", "BREAK\n"));
}

void BM_ReadSvcFile(benchmark::State& state)
{
    Read(state, Ink::ReadSvcFile,
         FileOf("1\n", state.range(0), "310.5 207.25 1.25 1 900 450 0.5\n", ""));
}

void BM_ReadInkMl(benchmark::State& state)
{
    Read(state, Ink::ReadInkMl,
         FileOf("<ink><trace>", state.range(0), "310.5 207.25,", "1 1</trace></ink>"));
}

void BM_ReadInkJson(benchmark::State& state)
{
    Read(state, Ink::ReadInkJson,
         FileOf("{\"stroke\":[", state.range(0), "[310.5,207.25,0.5,1250],", "[1,1]]}"));
}

} // namespace

#define NIB_SIZES RangeMultiplier(8)->Range(1 << 9, 1 << 18)->Complexity(benchmark::oN)

BENCHMARK(BM_ReadPenLog)->NIB_SIZES;
BENCHMARK(BM_ReadStrokeList)->NIB_SIZES;
BENCHMARK(BM_ReadSvcFile)->NIB_SIZES;
BENCHMARK(BM_ReadInkMl)->NIB_SIZES;
BENCHMARK(BM_ReadInkJson)->NIB_SIZES;

BENCHMARK_MAIN();
