#ifndef NIB_TESTS_FAULTS_STRIDE_H
#define NIB_TESTS_FAULTS_STRIDE_H

#include "faults/SlowProcesses.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <string>

/// Every how many-th fault a sweep tries: NIB_FAULT_STRIDE, else all of them, and under a sanitizer,
/// every 29th.
inline std::size_t Stride()
{
    constexpr std::size_t kUsual = kProcessesAreSlow ? 29 : 1;
    const char* const text = std::getenv("NIB_FAULT_STRIDE");
    return text ? std::max<std::size_t>(std::strtoul(text, nullptr, 10), 1) : kUsual;
}

/// What a row of results says of that: nothing where all were tried.
inline std::string StrideText()
{
    return Stride() == 1 ? "" : ", every " + std::to_string(Stride()) + "th of them";
}

#endif
