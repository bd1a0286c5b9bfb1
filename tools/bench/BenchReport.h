#ifndef NIB_TOOLS_BENCH_BENCH_REPORT_H
#define NIB_TOOLS_BENCH_BENCH_REPORT_H

#include "bench/HandOver.h"
#include "bench/ProgramStart.h"
#include "Figures.h"

#include <string>

/// What a run of `nib bench` has found.
struct BenchReport
{
    double seconds = 0.0;    ///< that it was given
    unsigned processors = 0; ///< of the machine
    std::string renderer;    ///< GL_RENDERER
    std::string version;     ///< GL_VERSION
    HandOver handOver;
    ProgramStart programs;
    Figures replay;
};

/// A table for people.
std::string ToText(const BenchReport& report);

/// One JSON object, as docs/nib-bench.md describes it.
std::string ToJson(const BenchReport& report);

#endif
