#ifndef NIB_TESTS_FAULTS_SLOW_PROCESSES_H
#define NIB_TESTS_FAULTS_SLOW_PROCESSES_H

/// Under a sanitizer a process costs fifty times as much, and its end is a search for leaks.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
inline constexpr bool kProcessesAreSlow = true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
inline constexpr bool kProcessesAreSlow = true;
#else
inline constexpr bool kProcessesAreSlow = false;
#endif
#else
inline constexpr bool kProcessesAreSlow = false;
#endif

#endif
