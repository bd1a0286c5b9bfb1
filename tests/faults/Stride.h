#ifndef NIB_TESTS_FAULTS_STRIDE_H
#define NIB_TESTS_FAULTS_STRIDE_H

#include <algorithm>
#include <cstddef>
#include <cstdlib>

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
#define NIB_SLOW_PROCESSES
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
#define NIB_SLOW_PROCESSES
#endif
#endif

/// Every how many-th fault a sweep tries: NIB_FAULT_STRIDE, else all of them, and under a sanitizer,
/// where a process costs fifty times as much, every 29th.
inline std::size_t Stride()
{
#ifdef NIB_SLOW_PROCESSES
    constexpr std::size_t kUsual = 29;
#else
    constexpr std::size_t kUsual = 1;
#endif
    const char* const text = std::getenv("NIB_FAULT_STRIDE");
    return text ? std::max<std::size_t>(std::strtoul(text, nullptr, 10), 1) : kUsual;
}

#endif
