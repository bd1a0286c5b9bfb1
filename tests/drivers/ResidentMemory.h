#ifndef NIB_TESTS_DRIVERS_RESIDENT_MEMORY_H
#define NIB_TESTS_DRIVERS_RESIDENT_MEMORY_H

#include "drivers/Driver.h"

#include <fstream>
#include <string>

/// The sanitizers keep freed memory and notes about every access: their figures say nothing.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
inline constexpr bool kMemoryCanBeMeasured = false;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
inline constexpr bool kMemoryCanBeMeasured = false;
#else
inline constexpr bool kMemoryCanBeMeasured = true;
#endif
#else
inline constexpr bool kMemoryCanBeMeasured = true;
#endif

/// Whether the driver's own memory stays where it was when contexts come and go.
inline bool DriverKeepsMemory()
{
    return !DriverIs({"softpipe", "zink", "angle", "angle-lavapipe", "swiftshader"});
}

/// The process's resident memory; always 0 where it cannot be measured, or says nothing.
inline long ResidentKiB()
{
    if (!kMemoryCanBeMeasured || !DriverKeepsMemory())
        return 0;
    std::ifstream status("/proc/self/status");
    std::string word;
    while (status >> word && word != "VmRSS:")
    {
    }
    long size = 0;
    status >> size;
    return size;
}

#endif
